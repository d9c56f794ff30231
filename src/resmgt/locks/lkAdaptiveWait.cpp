#include "lkAdaptiveWait.h"

#include <algorithm>

namespace Orv {

namespace {

// A failed look costs about as much as four successful ones bring.
constexpr int SUCCESS_GAIN = 1;
constexpr int FAILURE_LOSS = 4;
constexpr int INITIAL_SCORE = 8;
constexpr int HIGHEST_SCORE = 16;

constexpr std::uint8_t FIRST_PROBE_SHIFT = 6;  // 64 waits
constexpr std::uint8_t LAST_PROBE_SHIFT = 12;  // 4096 waits

constexpr std::uint32_t ROUNDS_PER_CLOCK_READING = 16;
constexpr std::uint32_t USES_PER_QUESTION = 256;

std::atomic<std::uint32_t> placementEpoch{1};

/// What a thread last learned about its placement.
struct Placement {
    std::uint32_t epoch = 0;
    std::uint32_t nbUsesLeft = 0;
    bool mayLook = false;
};
constinit thread_local Placement placement;

}  // namespace

bool LkAdaptiveWait::Look::goesOn() noexcept {
    if (_nbRounds % ROUNDS_PER_CLOCK_READING == 0) {
        const auto now = std::chrono::steady_clock::now();
        if (_nbRounds == 0) {
            _start = now;
        } else if (now - _start >= LONGEST_LOOK) {
            return false;
        }
    }
    ++_nbRounds;
    __builtin_ia32_pause();
    return true;
}

bool LkAdaptiveWait::mayLook() noexcept {
    const std::uint32_t epoch = placementEpoch.load(std::memory_order_relaxed);
    if (placement.epoch != epoch || placement.nbUsesLeft == 0) {
        placement = {epoch, USES_PER_QUESTION, canCurrentThreadGain()};
    }
    --placement.nbUsesLeft;
    return placement.mayLook;
}

void LkAdaptiveWait::forgetPlacement() noexcept {
    placementEpoch.fetch_add(1, std::memory_order_relaxed);
}

LkAdaptiveWait::Experience& LkAdaptiveWait::ofThread() noexcept {
    static constinit thread_local Experience experience{INITIAL_SCORE, FIRST_PROBE_SHIFT, 0};
    return experience;
}

bool LkAdaptiveWait::Experience::isWorthLooking() noexcept {
    if (score.load(std::memory_order_relaxed) > 0) return true;
    const auto nbNow = static_cast<std::uint16_t>(nbSkipped.load(std::memory_order_relaxed) + 1);
    const bool isProbe = nbNow >> probeShift.load(std::memory_order_relaxed) != 0;
    nbSkipped.store(isProbe ? std::uint16_t{0} : nbNow, std::memory_order_relaxed);
    return isProbe;
}

void LkAdaptiveWait::Experience::add(bool hasPaidOff) noexcept {
    const int old = score.load(std::memory_order_relaxed);
    const int now = std::clamp(old + (hasPaidOff ? SUCCESS_GAIN : -FAILURE_LOSS), 0, HIGHEST_SCORE);
    if (now != old) score.store(static_cast<std::uint8_t>(now), std::memory_order_relaxed);
    // Probes that fail become rarer; the first pace returns with lasting success.
    const std::uint8_t shift = probeShift.load(std::memory_order_relaxed);
    if (!hasPaidOff && old == 0 && shift < LAST_PROBE_SHIFT) {
        probeShift.store(static_cast<std::uint8_t>(shift + 1), std::memory_order_relaxed);
    } else if (now == HIGHEST_SCORE && shift != FIRST_PROBE_SHIFT) {
        probeShift.store(FIRST_PROBE_SHIFT, std::memory_order_relaxed);
    }
}

bool LkAdaptiveWait::isWorthLooking() noexcept {
    const bool isNew = _experience.score.load(std::memory_order_relaxed) == UNKNOWN;
    return (isNew ? ofThread() : _experience).isWorthLooking() && mayLook();
}

void LkAdaptiveWait::record(bool hasPaidOff) noexcept {
    if (_experience.score.load(std::memory_order_relaxed) == UNKNOWN) {
        ofThread().add(hasPaidOff);
        _experience.probeShift.store(FIRST_PROBE_SHIFT, std::memory_order_relaxed);
        _experience.score.store(INITIAL_SCORE, std::memory_order_relaxed);
    }
    _experience.add(hasPaidOff);
}

void LkAdaptiveWait::recordFailure() noexcept {
    placement.nbUsesLeft = 0;  // perhaps the partner has to share this processor now
    record(false);
}

}  // namespace Orv
