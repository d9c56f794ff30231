#include "currentException.h"

#include <cxxabi.h>
#include <exception>

#include "demangle.h"
#include "exBase.h"

namespace Orv {

namespace {

/// The reason, and those of the exceptions that led to this one.
template <class Exception>
std::string describeChain(const Exception& exception) {
    std::string text = exception.what();
    try {
        std::rethrow_if_nested(exception);
    } catch (...) {
        text += "; because: " + describeCurrentException();
    }
    return text;
}

}  // namespace

std::string describeCurrentException() {
    try {
        throw;
    } catch (const ExBase& exception) {
        return describeChain(exception);
    } catch (const std::exception& exception) {
        return describeChain(exception);
    } catch (...) {
        const std::type_info* const type = abi::__cxa_current_exception_type();
        return "an exception of type " + (type != nullptr ? demangle(*type) : "unknown");
    }
}

}  // namespace Orv
