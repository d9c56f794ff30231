#include "liUuidEx.h"

#include "formatText.h"

namespace Orv {

LiUuidEx::ExInternalError::ExInternalError(const char* file, int line, const char* function)
    : ExConcrete(file, line) {
    setReason(formatText("Call to function %s() failed.", function));
}

LiUuidEx::ExInvalidUuidString::ExInvalidUuidString(const char* file, int line, const LiString& text)
    : ExConcrete(file, line) {
    setReason(formatText("\"%s\" is not a valid uuid representation.", text.getChars()));
}

}  // namespace Orv
