#include "assertions.h"

#include <exception>

#include "currentException.h"
#include "trace.h"

namespace Orv {

void Assertions::throwAssertionFailed(const char* file, int line, const char* expression) {
    throw AssertionFailed(file, line, expression);
}

void Assertions::throwSysAssertionFailed(const char* file, int line, const char* expression,
                                         int osError) {
    throw SysAssertionFailed(file, line, expression, osError);
}

void Assertions::throwProgramAborted(const char* file, int line, const char* explanation) {
    throw ProgramAborted(file, line, explanation);
}

namespace {

template <class Throw>
void throwUnlessUnwinding(Throw raise) {
    if (std::uncaught_exceptions() == 0) raise();
    try {
        raise();
    } catch (...) {
        Assertions::traceCurrentException("destroying an object while the stack unwinds");
    }
}

}  // namespace

void Assertions::reportAssertionFailed(const char* file, int line, const char* expression) {
    throwUnlessUnwinding([=] { throwAssertionFailed(file, line, expression); });
}

void Assertions::reportSysAssertionFailed(const char* file, int line, const char* expression,
                                          int osError) {
    throwUnlessUnwinding([=] { throwSysAssertionFailed(file, line, expression, osError); });
}

void Assertions::traceCurrentException(const char* where) noexcept {
    const TraceLevel& level = TraceLevel::getMain();
    try {
        ORV_TRACE(level) << "Error while " << where << ": " << describeCurrentException();
    } catch (...) {
        ORV_TRACE(level) << "Error while " << where << ", and no memory to describe it";
    }
}

}  // namespace Orv
