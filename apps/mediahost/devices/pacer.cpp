#include "pacer.h"

#include <algorithm>
#include <chrono>
#include <cmath>
#include <orv/lkGuard.h>

namespace MediaHost {

namespace {

double getNow() {
    return std::chrono::duration<double>(std::chrono::steady_clock::now().time_since_epoch())
        .count();
}

}  // namespace

void Pacer::startUnpaced() {
    const Orv::LkGuard guard(_mutex);
    _state = State::UNPACED;
    _startSeconds = getNow();
    _changed.broadcast();
}

void Pacer::startPaced(double beatsPerSecond, double speed) {
    const Orv::LkGuard guard(_mutex);
    _state = State::PACED;
    _startSeconds = getNow();
    _beatsPerSecond = beatsPerSecond;
    _speed = speed;
    _offsets.reserve(NB_KEPT);
    _changed.broadcast();
}

void Pacer::stop() {
    const Orv::LkGuard guard(_mutex);
    _state = State::STOPPED;
    _changed.broadcast();
}

void Pacer::wakeAll() {
    const Orv::LkGuard guard(_mutex);
    _changed.broadcast();
}

void Pacer::setBeat(std::uint64_t beat) {
    const double now = getNow();
    const Orv::LkGuard guard(_mutex);
    _beat = beat;
    const double offset = now - static_cast<double>(beat) / (_beatsPerSecond * _speed);
    _hasBeaten = true;
    if (_offsets.size() < NB_KEPT) {
        _offsets.push_back(offset);
    } else {
        _offsets[_nbBeats % NB_KEPT] = offset;
    }
    ++_nbBeats;
    _changed.broadcast();
}

// A hair early is in time: the times of pictures are rounded, some of them downwards.
std::uint64_t Pacer::findBeat(double seconds) const {
    return static_cast<std::uint64_t>(std::max(0.0, std::ceil(seconds * _beatsPerSecond - 0.25)));
}

bool Pacer::waitFor(double seconds, const std::atomic<bool>& isStopped) {
    const Orv::LkGuard guard(_mutex);
    for (;;) {
        if (isStopped.load() || _state == State::STOPPED) return false;
        if (_state == State::UNPACED) return true;
        if (_state == State::PACED && _hasBeaten && findBeat(seconds) <= _beat) return true;
        _changed.wait(guard);
    }
}

bool Pacer::isOverdue(double seconds) const {
    const Orv::LkGuard guard(_mutex);
    return _state == State::PACED && _beat > findBeat(seconds) + 1;
}

double Pacer::getSecondsSinceStart() const {
    const Orv::LkGuard guard(_mutex);
    return _startSeconds > 0 ? getNow() - _startSeconds : 0;
}

double Pacer::getSeconds() const {
    const Orv::LkGuard guard(_mutex);
    return static_cast<double>(_beat) / _beatsPerSecond;
}

Pacer::Lateness Pacer::getLateness() const {
    std::vector<double> offsets;
    Lateness lateness;
    {
        const Orv::LkGuard guard(_mutex);
        offsets = _offsets;
        lateness.nbBeats = _nbBeats;
    }
    if (offsets.empty()) return lateness;
    std::sort(offsets.begin(), offsets.end());
    const auto at = [&offsets](double share) {
        const double place = share * static_cast<double>(offsets.size() - 1);
        return offsets[static_cast<std::size_t>(place)] - offsets.front();
    };
    lateness.p50Seconds = at(0.5);
    lateness.p99Seconds = at(0.99);
    lateness.maxSeconds = at(1);
    return lateness;
}

}  // namespace MediaHost
