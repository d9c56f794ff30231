#include "seEx.h"

#include <utility>

#include "currentException.h"

namespace Orv {

namespace {

std::string describe(const std::exception_ptr& thrown) {
    try {
        std::rethrow_exception(thrown);
    } catch (...) {
        return describeCurrentException();
    }
}

}  // namespace

SeEx::SeEx(const char* file, int line) : ExBase(file, line), std::runtime_error("") {}

const char* SeEx::what() const noexcept {
    return getReason();
}

SeEx::ExSourceFailed::ExSourceFailed(const char* file, int line, const std::string& source,
                                     std::exception_ptr thrown)
    : ExConcrete(file, line), _thrown(std::move(thrown)) {
    setReason("Source \"" + source + "\" failed: " + describe(_thrown));
}

SeEx::ExSourceStopped::ExSourceStopped(const char* file, int line, const std::string& source)
    : ExConcrete(file, line) {
    setReason("Source \"" + source + "\" was stopped.");
}

}  // namespace Orv
