#include "hostContext.h"

#include <orv/lkGuard.h>
#include <orv/mbArenaManager.h>
#include <orv/mbHeapManager.h>
#include <orv/mbUnloadLRU.h>
#include <orv/mbUnloadRandom.h>

#include "mediaError.h"
#include "process.h"

namespace MediaHost {

namespace {

constexpr std::uint64_t SOUND_BYTES = 4 << 20;

Orv::ObjPtr<Orv::MbUnloadStrategy> createStrategy(bool isRandom) {
    if (isRandom) return Orv::ObjPtr<Orv::MbUnloadStrategy>(new Orv::MbUnloadRandom(256));
    return Orv::ObjPtr<Orv::MbUnloadStrategy>(new Orv::MbUnloadLRU(256));
}

}  // namespace

Orv::RCShdPtr<Orv::MbManager> HostContext::getPictures(std::uint64_t unitBytes) {
    const Orv::LkGuard guard(_mutex);
    if (_pictures.isNull()) {
        if (cachePictures > 0) {
            cacheBytes = static_cast<std::uint64_t>(cachePictures) * (unitBytes + MOST_PADDING);
        }
        if (unitBytes + MOST_PADDING > cacheBytes) {
            throw MediaError("one picture takes " + std::to_string(unitBytes + MOST_PADDING) +
                             " bytes, the cache has only " + std::to_string(cacheBytes) +
                             "; give it more with --cache");
        }
        // One block whose pages stay: pictures come and go all the time, and are of one size.
        try {
            _pictures.reset(new Orv::MbArenaManager(
                "pictures", Orv::DaArenaPool::create(cacheBytes, Orv::DaPages::HUGE_IF_OFFERED),
                createStrategy(isCacheRandom)));
        } catch (...) {
            throwBecause("there is no memory for a cache of " + std::to_string(cacheBytes) +
                         " bytes; give it less with --cache");
        }
    }
    return _pictures;
}

Orv::RCShdPtr<Orv::MbManager> HostContext::getSounds() {
    const Orv::LkGuard guard(_mutex);
    if (_sounds.isNull()) {
        _sounds.reset(new Orv::MbHeapManager("sounds", SOUND_BYTES, createStrategy(false)));
    }
    return _sounds;
}

Orv::MbManagerStatistics HostContext::getCacheStatistics() const {
    Orv::RCShdPtr<Orv::MbManager> pictures;
    {
        const Orv::LkGuard guard(_mutex);
        pictures = _pictures;
    }
    return pictures.isNull() ? Orv::MbManagerStatistics() : pictures->getStatistics();
}

void HostContext::notePicture() {
    if (_firstPictureSeconds.load() == 0) _firstPictureSeconds = Process::getSecondsSinceStart();
}

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

bool HostContext::isEndExpected() const {
    const Orv::LkGuard guard(_mutex);
    return _isAnyAwaited;
}

bool HostContext::hasFailed() const {
    const Orv::LkGuard guard(_mutex);
    return _failure != nullptr;
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
