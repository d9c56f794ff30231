#pragma once

#include <atomic>
#include <cstdint>
#include <orv/lkCondVar.h>
#include <orv/lkMutex.h>
#include <vector>

namespace MediaHost {

/// Where all devices of a host learn what time it is in the show: sources wait here until a unit is
/// due. A clock moves it on, beat by beat; without a clock everything is due at once.
///
/// - Threads: any.
class Pacer {
public:
    struct Lateness {
        std::uint64_t nbBeats = 0;
        double p50Seconds = 0, p99Seconds = 0, maxSeconds = 0;
    };

    void startUnpaced();  ///< Everything is due from now on.
    /// The first beat is the start of the show.
    /// @param beatsPerSecond  of the show, which runs @p speed times as fast as time does.
    void startPaced(double beatsPerSecond, double speed);
    void setBeat(std::uint64_t beat);  ///< By the clock, which takes the time, too.
    void stop();                       ///< Nothing more is waited for.
    void wakeAll();                    ///< Those that wait look whether they are stopped.

    /// Waits until what lies @p seconds into the show is due.
    /// @param isStopped  ends the wait, after a wakeAll().
    /// @return false if it was stopped.
    bool waitFor(double seconds, const std::atomic<bool>& isStopped);

    /// Whether that was due more than one whole beat ago.
    bool isOverdue(double seconds) const;

    double getSecondsSinceStart() const;  ///< As time went by; 0 before the start.
    double getSeconds() const;            ///< The beats until now, as time.
    Lateness getLateness() const;  ///< Of the latest beats, measured against the steadiest of them.

private:
    enum class State { HELD, UNPACED, PACED, STOPPED };
    static constexpr std::size_t NB_KEPT = 1 << 16;

    mutable Orv::LkMutex _mutex{"Pacer"};
    Orv::LkCondVar _changed{"Pacer changed"};
    State _state = State::HELD;
    double _startSeconds = 0;  // by the clock that does not jump
    double _beatsPerSecond = 1;
    double _speed = 1;
    bool _hasBeaten = false;
    std::uint64_t _beat = 0;
    std::uint64_t _nbBeats = 0;
    std::vector<double> _offsets;  // when beats came, from when they would have, in seconds

    std::uint64_t findBeat(double seconds) const;
};

}  // namespace MediaHost
