#include "track.h"

#include <algorithm>
#include <orv/lkGuard.h>
#include <orv/lkSema.h>
#include <orv/mbProtocol.h>
#include <orv/mtThreadFactory.h>
#include <orv/mtThreadProtocol.h>
#include <string>
#include <vector>

#include "mediaError.h"

namespace MediaHost {

namespace {

constexpr unsigned STACK_BYTES = 1 << 20;  // decoders want more than the standard

/// The unit does not exist, or the track was stopped.
class NoSuchUnit : public MediaError {
public:
    NoSuchUnit() : MediaError("there is no such unit") {}
};

}  // namespace

/// Loads one unit's buffer. The buffer is gone before its track is.
class Track::Protocol : public Orv::MbProtocol {
public:
    Protocol(Track& track, std::int64_t unit) : _track(track), _unit(unit) {}
    void reload(void* data, std::uint64_t size) override;
    void asyncReload(void* data, std::uint64_t, Orv::LkAsyncHandle* handle) override {
        _track.request(_unit, {data, handle, false});
    }
    void unload(void*, std::uint64_t) override {}  // decoded again when it is wanted

private:
    Track& _track;
    const std::int64_t _unit;
};

/// The report to a thread that waits for it.
class Track::Waiting : public Orv::LkAsyncHandle {
public:
    void reportSucceeded() override { report(true); }
    void reportFailed() override { report(false); }
    bool wait() {
        _reported.wait();
        return _hasSucceeded;
    }

private:
    Orv::LkSema _reported{"Track::Waiting"};
    bool _hasSucceeded = false;

    void report(bool hasSucceeded) {
        _hasSucceeded = hasSucceeded;
        _reported.post();
    }
};

void Track::Protocol::reload(void* data, std::uint64_t) {
    Waiting waiting;
    _track.request(_unit, {data, &waiting, true});
    if (waiting.wait()) return;
    const Orv::LkGuard guard(_track._mutex);
    if (_track._error) std::rethrow_exception(_track._error);
    throw NoSuchUnit();
}

Track::Track(const Orv::LiString& name, std::unique_ptr<UnitDecoder> decoder,
             const Orv::RCShdPtr<Orv::MbManager>& manager)
    : _decoder(std::move(decoder)),
      _unitBytes(_decoder->getUnitBytes()),
      _factory(manager, nullptr, Orv::MbInitialState::UNLOADED,
               Orv::MbAlignment(alignof(UnitHeader) - 1, 0, 0)),
      _nbUnits(_decoder->getNbUnits().value_or(UNKNOWN)),
      _thread(Orv::MtThreadFactory::getInstance().create(
          name, Orv::MtThreadFunction::create([this] { run(); }), false, STACK_BYTES)) {
    _thread->start();
}

Track::~Track() {
    stop();
    _thread.reset();
    _buffers.clear();
}

void Track::stop() {
    const Orv::LkGuard guard(_mutex);
    _isStopped = true;
    _changed.broadcast();
}

Orv::MbBuffer Track::getBuffer(std::int64_t unit) {
    const Orv::LkGuard guard(_mutex);
    Orv::MbBuffer& buffer = _buffers[unit];
    if (buffer.isNull()) {
        const std::string name = "unit " + std::to_string(unit);
        buffer = _factory.create(name.c_str(), static_cast<int>(_unitBytes),
                                 Orv::RCShdPtr<Orv::MbProtocol>(new Protocol(*this, unit)));
        if (_buffers.size() >= _nbBuffersToPrune) {
            const Orv::MbBuffer held = buffer;
            prune();
            return held;
        }
    }
    return buffer;
}

// Forgets buffers that have given way and that nobody holds: a long track has many.
void Track::prune() {
    std::erase_if(_buffers, [](const auto& entry) {
        return entry.second.isUniqueOwner() && !entry.second.isLoaded();
    });
    _nbBuffersToPrune = std::max<std::size_t>(256, _buffers.size() * 2);
}

Orv::MbBufferRdGuardImp Track::fetch(std::int64_t unit) {
    if (unit < 0 || unit >= _nbUnits.load()) return {};
    try {
        return Orv::MbBufferRdGuardImp(getBuffer(unit));
    } catch (const NoSuchUnit&) {
        return {};
    }
}

void Track::prefetch(std::int64_t first, std::int64_t nbUnits) {
    const std::int64_t end = std::min(first + nbUnits, _nbUnits.load());
    for (std::int64_t unit = std::max<std::int64_t>(first, 0); unit < end; ++unit) {
        getBuffer(unit).prefetch();
    }
}

void Track::letGo(std::int64_t unit) {
    Orv::MbBuffer last;  // goes without the mutex
    const Orv::LkGuard guard(_mutex);
    const auto found = _buffers.find(unit);
    if (found == _buffers.end()) return;
    last = found->second;
    _buffers.erase(found);
}

std::int64_t Track::findNbUnits() {
    const Orv::LkGuard guard(_mutex);
    _isEndWanted = true;
    _changed.broadcast();
    while (_nbUnits.load() == UNKNOWN && !_error && !_isStopped) _changed.wait(guard);
    if (_error) std::rethrow_exception(_error);
    return _nbUnits.load() == UNKNOWN ? 0 : _nbUnits.load();
}

void Track::request(std::int64_t unit, const Request& request) {
    {
        const Orv::LkGuard guard(_mutex);
        if (!_isStopped && !_error && unit < _nbUnits.load()) {
            _requests[unit] = request;
            _changed.broadcast();
            return;
        }
    }
    request.handle->reportFailed();
}

void Track::run() {
    try {
        while (serve()) {
        }
        finishAll(nullptr);
    } catch (...) {
        finishAll(std::current_exception());
    }
}

// Waits for something to do, and decodes one unit. Returns false when there is nothing more to come.
bool Track::serve() {
    std::optional<std::int64_t> place;
    {
        const Orv::LkGuard guard(_mutex);
        const auto mustRead = [this] { return _isEndWanted && _nbUnits.load() == UNKNOWN; };
        while (_requests.empty() && !_isStopped && !mustRead()) _changed.wait(guard);
        if (_isStopped) return false;
        if (!_requests.empty()) place = choosePlace();
    }
    if (place) _decoder->seek(*place);
    const bool hasUnit = _decoder->next();
    noteProgress();
    if (!hasUnit) {
        finishBehind(_decoder->getNbUnits().value_or(_decoder->getNextUnit()));
        return true;
    }
    Request request{};
    {
        const Orv::LkGuard guard(_mutex);
        const auto found = _requests.find(_decoder->getUnit());
        if (found == _requests.end()) return true;
        request = found->second;
        _requests.erase(found);
    }
    try {
        _decoder->copy(request.data);
    } catch (...) {
        request.handle->reportFailed();
        throw;
    }
    request.handle->reportSucceeded();
    return true;
}

// Where to decode from, if not from where the decoder stands. Called with the mutex held.
std::optional<std::int64_t> Track::choosePlace() {
    const std::int64_t here = _decoder->getNextUnit();
    auto wanted = std::find_if(_requests.begin(), _requests.end(),
                               [](const auto& entry) { return entry.second.isUrgent; });
    if (wanted == _requests.end()) wanted = _requests.lower_bound(here);
    if (wanted == _requests.end()) wanted = _requests.begin();
    const auto isAhead = [&] {
        return wanted->first >= here && !_decoder->isSeekQuicker(wanted->first);
    };
    if (isAhead()) return std::nullopt;
    // Neighbours before it are taken on the way, which may be the way that it is on already.
    while (wanted != _requests.begin() && wanted->first - std::prev(wanted)->first <= NEAR) {
        --wanted;
        if (isAhead()) return std::nullopt;
    }
    return wanted->first;
}

void Track::finishBehind(std::int64_t end) {
    std::vector<Request> failed;
    {
        const Orv::LkGuard guard(_mutex);
        _nbUnits = end;
        const auto behind = _requests.lower_bound(end);
        for (auto at = behind; at != _requests.end(); ++at) failed.push_back(at->second);
        _requests.erase(behind, _requests.end());
        _changed.broadcast();
    }
    for (const Request& request : failed) request.handle->reportFailed();
}

void Track::finishAll(std::exception_ptr error) {
    std::vector<Request> failed;
    {
        const Orv::LkGuard guard(_mutex);
        _error = std::move(error);
        _isStopped = true;
        for (const auto& entry : _requests) failed.push_back(entry.second);
        _requests.clear();
        _changed.broadcast();
    }
    for (const Request& request : failed) request.handle->reportFailed();
}

void Track::noteProgress() {
    _nbDecoded = _decoder->getNbDecoded();
    // Once all of it was seen, faults come again.
    if (_nbUnits.load() == UNKNOWN) _nbFaults = _decoder->getNbFaults();
}

}  // namespace MediaHost
