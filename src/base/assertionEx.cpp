#include "assertionEx.h"

#include "formatText.h"
#include "osError.h"

namespace Orv {

AssertionEx::AssertionEx(const char* file, int line, const char* expression, int osError)
    : ExBase(file, line),
      std::logic_error(""),
      _expression(std::make_shared<const std::string>(expression == nullptr ? "" : expression)),
      _osError(osError) {}

const char* AssertionEx::what() const noexcept {
    return getReason();
}

const char* AssertionEx::getExpression() const noexcept {
    return _expression->c_str();
}

AssertionFailed::AssertionFailed(const char* file, int line, const char* expression)
    : ExConcrete(file, line, expression, 0) {
    setReason(formatText("%s:%d: assertion \"%s\" failed", file, line, getExpression()));
}

SysAssertionFailed::SysAssertionFailed(const char* file, int line, const char* expression,
                                       int osError)
    : ExConcrete(file, line, expression, osError) {
    setReason(formatText("%s:%d: assertion \"%s\" failed: %s", file, line, getExpression(),
                         OsError::describe(osError).c_str()));
}

ProgramAborted::ProgramAborted(const char* file, int line, const char* explanation)
    : ExConcrete(file, line, explanation, 0) {
    setReason(formatText("%s:%d: program aborted: %s", file, line, getExpression()));
}

}  // namespace Orv
