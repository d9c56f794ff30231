#include "mediaError.h"

#include <exception>

namespace MediaHost {

void throwBecause(const std::string& what) {
    std::throw_with_nested(MediaError(what));
}

std::string describeChain(const std::exception& error) {
    std::string text = error.what();
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
