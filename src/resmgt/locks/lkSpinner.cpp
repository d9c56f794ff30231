#include "lkSpinner.h"

namespace Orv {

namespace {

// Lengths count the processor's pause instruction, which takes 15 to 50 nanoseconds.
constexpr unsigned maxLength = 128;

}  // namespace

bool LkSpinner::pause() noexcept {
    if (_length > maxLength || !hasSeveralProcessors()) return false;
    for (unsigned i = 0; i < _length; ++i) __builtin_ia32_pause();
    _length *= 2;
    return true;
}

}  // namespace Orv
