#include "mbEx.h"

#include "formatText.h"

namespace Orv {

MbEx::ExIllegalTransition::ExIllegalTransition(const char* file, int line, const char* buffer,
                                               const char* event, const char* state)
    : ExConcrete(file, line) {
    setReason(formatText("Illegal transition: buffer %s received event %s from state %s.", buffer,
                         event, state));
}

MbEx::ExInvalidArgument::ExInvalidArgument(const char* file, int line, const char* detail)
    : ExConcrete(file, line) {
    setReason(formatText("Invalid argument: %s.", detail));
}

MbEx::ExOutOfRange::ExOutOfRange(const char* file, int line, const char* detail)
    : ExConcrete(file, line) {
    setReason(formatText("Out of range: %s.", detail));
}

MbEx::ExNotEnoughMemory::ExNotEnoughMemory(const char* file, int line, const char* detail)
    : ExConcrete(file, line) {
    setReason(formatText("Not enough memory: %s.", detail));
}

}  // namespace Orv
