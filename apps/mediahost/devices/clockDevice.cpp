#include "clockDevice.h"

#include <orv/seClientThread.h>

namespace MediaHost {

/// Tells the pacer of each beat.
class ClockDevice::Client : public Orv::SeClientThread {
public:
    explicit Client(Pacer& pacer) : _pacer(pacer) {}

protected:
    bool performBeat(std::uint32_t tick, std::uint32_t) override {
        // The first tick is the start of the show; the count of ticks may go past 2^32.
        if (_hasFirst) _beat += static_cast<std::uint32_t>(tick - _last);
        _hasFirst = true;
        _last = tick;
        _pacer.setBeat(_beat);
        return false;
    }

private:
    Pacer& _pacer;
    bool _hasFirst = false;
    std::uint32_t _last = 0;
    std::uint64_t _beat = 0;
};

ClockDevice::ClockDevice(const Orv::LiString& name, HostContext& context, Settings settings)
    : MediaDevice(name, context), _beatsPerSecond(settings.getReal("rate", 0, 0, 100000)) {
    settings.check();
    const auto rate = Orv::DevMDPropertyDescriptor<double>::create();
    rate->setUnit("beats per second of the show");
    addProperty<double>(
        "rate", "of the beats; 0: it follows the pictures", [this] { return _beatsPerSecond; },
        nullptr, rate);
    const auto seconds = Orv::DevMDPropertyDescriptor<double>::create();
    seconds->setUnit("s");
    addProperty<double>(
        "time", "into the show", [this] { return getContext().pacer.getSeconds(); }, nullptr,
        seconds);
    addProperty<std::uint64_t>("beats", "until now",
                               [this] { return getContext().pacer.getLateness().nbBeats; });
    addProperty<double>(
        "lateness:p99", "of the latest beats, against the steadiest of them",
        [this] { return getContext().pacer.getLateness().p99Seconds; }, nullptr, seconds);
    addProperty<double>(
        "lateness:max", "of the latest beats, against the steadiest of them",
        [this] { return getContext().pacer.getLateness().maxSeconds; }, nullptr, seconds);
}

ClockDevice::~ClockDevice() noexcept(false) = default;

void ClockDevice::syncTo(const Orv::DtTime&, Orv::DevMDSyncSeqRequest&) {
    if (getContext().isPaced) {
        beginBeating();
    } else {
        getContext().pacer.startUnpaced();
    }
}

void ClockDevice::beginBeating() {
    if (_source) return;
    const HostContext& context = getContext();
    const double rate = _beatsPerSecond > 0          ? _beatsPerSecond
                        : context.beatsPerSecond > 0 ? context.beatsPerSecond
                                                     : 100;
    _source =
        std::make_unique<Orv::SeSourceClock>(getName() + " source", 1 / (rate * context.speed));
    getContext().pacer.startPaced(rate, context.speed);
    Orv::ObjPtr<Orv::SeClientThread> client(new Client(getContext().pacer));
    _engine.addClient(getName() + " beat", client, *_source, 1);
}

void ClockDevice::endBeating() {
    getContext().pacer.stop();
    if (!_source) return;
    _engine.stop();
    _source.reset();
}

void ClockDevice::stop(Orv::DevMDSyncSeqRequest& request) {
    endBeating();
    MediaDevice::stop(request);
}

void ClockDevice::abort(Orv::DevMDSyncSeqRequest& request) {
    endBeating();
    MediaDevice::abort(request);
}

void ClockDevice::close() {
    endBeating();
}

}  // namespace MediaHost
