#include "mediaError.h"

#include <exception>
#include <orv/devMgrEx.h>
#include <orv/devPrtclEx.h>

namespace MediaHost {

namespace {

/// What the library's errors are about, where their words do not say.
template <class Ex>
std::string getSubject(const std::exception& error) {
    const auto* ours = dynamic_cast<const Ex*>(&error);
    if (ours == nullptr || ours->getSubject().isEmpty()) return {};
    return std::string(" (") + ours->getSubject().getChars() + ')';
}

}  // namespace

void throwBecause(const std::string& what) {
    std::throw_with_nested(MediaError(what));
}

std::string describeChain(const std::exception& error) {
    std::string text =
        error.what() + getSubject<Orv::DevMgrEx>(error) + getSubject<Orv::DevPrtclEx>(error);
    try {
        std::rethrow_if_nested(error);
    } catch (const std::exception& reason) {
        text += "\n  because: " + describeChain(reason);
    } catch (...) {
        text += "\n  because of an exception of an unknown kind";
    }
    return text;
}

}  // namespace MediaHost
