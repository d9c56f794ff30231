#include "devMDStream.h"

#include <algorithm>
#include <string_view>

#include "devMDStreamPrtcl.h"
#include "devMDStreamSink.h"
#include "devMDStreamSource.h"

namespace Orv {

DevMDStreamBuf::~DevMDStreamBuf() noexcept(false) = default;
DevMDStream::~DevMDStream() noexcept(false) = default;
DevMDStreamSource::~DevMDStreamSource() noexcept(false) = default;
DevMDStreamActiveSource::~DevMDStreamActiveSource() noexcept(false) = default;
DevMDStreamPassiveSource::~DevMDStreamPassiveSource() noexcept(false) = default;
DevMDStreamSink::~DevMDStreamSink() noexcept(false) = default;
DevMDStreamActiveSink::~DevMDStreamActiveSink() noexcept(false) = default;
DevMDStreamPassiveSink::~DevMDStreamPassiveSink() noexcept(false) = default;
DevMDStreamPrtcl::~DevMDStreamPrtcl() noexcept(false) = default;

namespace {

/// A description, taken apart front to back.
class Description {
public:
    explicit Description(std::string_view text) : _rest(text) {
        const std::string_view whole = next(';');
        const std::size_t slash = whole.find('/');
        hasTypes = slash != std::string_view::npos;
        type = whole.substr(0, slash);
        if (hasTypes) subtype = whole.substr(slash + 1);
    }

    bool hasTypes;
    std::string_view type, subtype;

    /// The value that a key has; null if the key is not named.
    const std::string_view* find(std::string_view key) {
        for (std::string_view rest = _rest; !rest.empty();) {
            const std::string_view pair = cut(rest, ';');
            const std::size_t equals = pair.find('=');
            if (pair.substr(0, equals) != key) continue;
            _found =
                equals == std::string_view::npos ? std::string_view() : pair.substr(equals + 1);
            return &_found;
        }
        return nullptr;
    }

    /// Whether all keys that @p other names too have the same values there.
    bool agreesWith(Description& other) const {
        for (std::string_view rest = _rest; !rest.empty();) {
            const std::string_view pair = cut(rest, ';');
            const std::size_t equals = pair.find('=');
            const std::string_view value =
                equals == std::string_view::npos ? std::string_view() : pair.substr(equals + 1);
            const std::string_view* const theirs = other.find(pair.substr(0, equals));
            if (!pair.empty() && theirs != nullptr && *theirs != value) return false;
        }
        return true;
    }

private:
    std::string_view _rest;  // key=value;...
    std::string_view _found;

    static std::string_view cut(std::string_view& text, char separator) {
        const std::size_t end = text.find(separator);
        const std::string_view front = text.substr(0, end);
        text.remove_prefix(end == std::string_view::npos ? text.size() : end + 1);
        return front;
    }
    std::string_view next(char separator) { return cut(_rest, separator); }
};

}  // namespace

bool DevMDStream::isCompatible(const LiString& description) {
    return areCompatible(getDescription(), description);
}

std::exception_ptr DevMDStream::getFailure() {
    return nullptr;
}

void DevMDStream::setEndAEO(ObjPtr<DevAEO>) {}

bool DevMDStream::areCompatible(const LiString& sink, const LiString& source) {
    if (sink.isEmpty()) return true;
    Description taken(sink.getText());
    Description given(source.getText());
    if (!taken.hasTypes || !given.hasTypes) return sink == source;
    const auto matches = [](std::string_view wanted, std::string_view is) {
        return wanted == "*" || wanted == is;
    };
    return matches(taken.type, given.type) && matches(taken.subtype, given.subtype) &&
           taken.agreesWith(given);
}

}  // namespace Orv
