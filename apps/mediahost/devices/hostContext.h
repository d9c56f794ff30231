#pragma once

#include <atomic>
#include <cstdint>
#include <exception>
#include <filesystem>
#include <orv/liTimeCode.h>
#include <orv/lkMutex.h>
#include <orv/lkSema.h>
#include <orv/mbManager.h>
#include <orv/rcShdPtr.h>
#include <set>
#include <string>

#include "pacer.h"

namespace MediaHost {

/// What the devices of one host share.
///
/// - Threads: the settings are only read once there are devices; all else by any thread.
struct HostContext {
    std::uint64_t cacheBytes = 0;    ///< The budget of pictures.
    std::int64_t cachePictures = 0;  ///< If not 0: the budget is so many of the first source's.
    bool isCacheRandom = false;      ///< Which ones give way: any, or those used longest ago.
    Orv::RCShdPtr<Orv::LiTimeCode> timecode;
    std::filesystem::path folder;  ///< Where files go; empty: none are written.
    bool isPaced = false;
    double speed = 1;           ///< Against real time, if paced.
    double beatsPerSecond = 0;  ///< Of the clock; 0: as many as the sources have pictures.
    bool isReverse = false;
    std::int64_t nbLoops = 1;  ///< 0: for ever.

    Pacer pacer;

    // Memory, made for the first source that asks:
    /// @throws MediaError if not even one unit of that size fits into the budget.
    Orv::RCShdPtr<Orv::MbManager> getPictures(std::uint64_t unitBytes);
    Orv::RCShdPtr<Orv::MbManager> getSounds();
    Orv::MbManagerStatistics getCacheStatistics() const;

    void notePicture();  ///< One was handed on.
    double getFirstPictureSeconds() const { return _firstPictureSeconds.load(); }  ///< 0: none yet.

    /// The devices at the ends of streams, which have to end before the show is over.
    void expectEnd(const std::string& device);
    void reportEnd(const std::string& device);
    bool hasEnded() const;
    bool isEndExpected() const;  ///< Of any device.

    /// The first failure counts; the show is over with it.
    void reportFailure(const std::string& device, std::exception_ptr error);
    bool hasFailed() const;
    void rethrowFailure() const;

    /// Waits until something is reported, or the time is over.
    void waitForNews(double seconds);

private:
    static constexpr std::uint64_t MOST_PADDING = 72;  // of a buffer, for its alignment

    mutable Orv::LkMutex _mutex{"HostContext"};
    Orv::RCShdPtr<Orv::MbManager> _pictures, _sounds;
    std::atomic<double> _firstPictureSeconds{0};  // since the program's start
    Orv::LkSema _news{"HostContext news", 0};
    std::set<std::string> _awaited;
    bool _isAnyAwaited = false;
    std::exception_ptr _failure;
};

}  // namespace MediaHost
