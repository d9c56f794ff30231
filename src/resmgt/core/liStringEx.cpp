#include "liStringEx.h"

#include "formatText.h"

namespace Orv {

LiStringEx::ExOutOfBounds::ExOutOfBounds(const char* file, int line, int index, int low, int high)
    : ExConcrete(file, line) {
    setReason(formatText("Index (%d) is not in the proper range (%d-%d).", index, low, high));
}

LiStringEx::ExTooLong::ExTooLong(const char* file, int line, std::size_t length)
    : ExConcrete(file, line) {
    setReason(formatText("A string of %zu characters is too long.", length));
}

}  // namespace Orv
