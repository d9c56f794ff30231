#include "assertions.h"

#include <cstdio>
#include <exception>

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
    const char* reason = "an exception of unknown type";
    try {
        throw;
    } catch (const ExBase& exception) {
        reason = exception.what();
        std::fprintf(stderr, "Error while %s: %s\n", where, reason);
    } catch (const std::exception& exception) {
        reason = exception.what();
        std::fprintf(stderr, "Error while %s: %s\n", where, reason);
    } catch (...) {
        std::fprintf(stderr, "Error while %s: %s\n", where, reason);
    }
}

}  // namespace Orv
