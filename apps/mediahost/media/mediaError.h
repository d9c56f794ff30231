#pragma once

#include <stdexcept>
#include <string>

namespace MediaHost {

/// What went wrong, in the words of who was asked; the reason is nested in it.
class MediaError : public std::runtime_error {
public:
    using std::runtime_error::runtime_error;
};

/// Called in a handler: throws a MediaError in which the exception being handled is nested.
[[noreturn]] void throwBecause(const std::string& what);

/// The exception and all that are nested in it, outermost first, one to a line.
std::string describeChain(const std::exception& error);

}  // namespace MediaHost
