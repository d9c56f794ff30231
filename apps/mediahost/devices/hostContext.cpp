#include "hostContext.h"

#include <orv/lkGuard.h>

#include "mediaError.h"

namespace MediaHost {

void HostContext::expectEnd(const std::string& device) {
    const Orv::LkGuard guard(_mutex);
    _isAnyAwaited = true;
    _awaited.insert(device);
}

void HostContext::reportEnd(const std::string& device) {
    const Orv::LkGuard guard(_mutex);
    if (_awaited.erase(device) > 0) _news.post();
}

bool HostContext::hasEnded() const {
    const Orv::LkGuard guard(_mutex);
    return _failure || (_isAnyAwaited && _awaited.empty());
}

void HostContext::reportFailure(const std::string& device, std::exception_ptr error) {
    try {
        try {
            std::rethrow_exception(std::move(error));
        } catch (...) {
            throwBecause("device \"" + device + "\" has failed");
        }
    } catch (...) {
        const Orv::LkGuard guard(_mutex);
        if (_failure) return;
        _failure = std::current_exception();
        _news.post();
    }
}

void HostContext::rethrowFailure() const {
    const Orv::LkGuard guard(_mutex);
    if (_failure) std::rethrow_exception(_failure);
}

void HostContext::waitForNews(double seconds) {
    if (!hasEnded()) (void)_news.timedWait(seconds);
}

}  // namespace MediaHost
