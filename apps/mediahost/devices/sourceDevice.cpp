#include "sourceDevice.h"

#include <algorithm>
#include <cmath>
#include <orv/lkGuard.h>

namespace MediaHost {

namespace {

constexpr std::int64_t NB_SOUND_AHEAD = 16;  // blocks
constexpr std::int64_t MOST_PICTURES_AHEAD = 16;

// Backwards each span costs a way through all that it depends on, so it is as long as fits.
constexpr std::int64_t MOST_PICTURES_AHEAD_REVERSE = 256;

// Locked in queues and hands of the devices behind, where these are slower than the source. What
// was loaded ahead must not give way to them.
constexpr std::int64_t NB_PICTURES_ON_THEIR_WAY = 10;
constexpr std::int64_t NB_PICTURES_ON_THEIR_WAY_REVERSE = 4;

}  // namespace

SourceDevice::SourceDevice(const Orv::LiString& name, HostContext& context)
    : MediaDevice(name, context) {
    addPictureProperties();
    addSoundProperties();
}

SourceDevice::~SourceDevice() noexcept(false) = default;

void SourceDevice::addPictureProperties() {
    using Descriptor = Orv::DevMDPropertyDescriptor<std::int64_t>;
    const auto number = Descriptor::create();
    number->setUnit("pictures").setRange(0, INT64_MAX);
    _positionProperty = addProperty<std::int64_t>(
        "position", "number of the picture shown last; set: the one to go on with",
        [this] { return _position.load(); },
        [this](const std::int64_t& unit) {
            if (!_pictures) throw MediaError("there are no pictures to go to");
            _jump = unit;
        },
        number);
    const auto seconds = Orv::DevMDPropertyDescriptor<double>::create();
    seconds->setUnit("s");
    addProperty<double>(
        "duration", "of all of it, as far as that is known beforehand; else 0",
        [this] { return _duration; }, nullptr, seconds);
    addProperty<std::int64_t>("video:shown", "pictures that were handed on",
                              [this] { return _nbShown.load(); });
    addProperty<std::int64_t>("video:dropped", "pictures that came too late to be handed on",
                              [this] { return _nbDropped.load(); });
    addProperty<std::int64_t>(
        "video:decoded", "pictures decoded, those decoded again included",
        [this] { return static_cast<std::int64_t>(_pictures ? _pictures->getNbDecoded() : 0); });
    addProperty<std::int64_t>("video:faults", "damaged pieces left out", [this] {
        return static_cast<std::int64_t>(_pictures ? _pictures->getNbFaults() : 0);
    });
    addProperty<int>("video:width", "of the pictures; 0: there are none",
                     [this] { return _pictureFormat ? _pictureFormat->width : 0; });
    addProperty<int>("video:height", "of the pictures; 0: there are none",
                     [this] { return _pictureFormat ? _pictureFormat->height : 0; });
    const auto rate = Orv::DevMDPropertyDescriptor<double>::create();
    rate->setUnit("pictures per second");
    addProperty<double>(
        "rate", "of the pictures, on average",
        [this] { return _pictureFormat ? _pictureFormat->rate.toDouble() : 0; }, nullptr, rate);
    addProperty<TextValue>("format", "how the pictures lie in memory", [this] {
        return toTextValue(_pictureFormat ? _pictureFormat->pixelName : "none");
    });
}

void SourceDevice::addSoundProperties() {
    addProperty<std::int64_t>("audio:faults", "damaged pieces left out", [this] {
        return static_cast<std::int64_t>(_sound ? _sound->getNbFaults() : 0);
    });
    const auto hertz = Orv::DevMDPropertyDescriptor<int>::create();
    hertz->setUnit("Hz");
    addProperty<int>(
        "audio:rate", "of the sound; 0: there is none",
        [this] { return _soundFormat ? _soundFormat->rate : 0; }, nullptr, hertz);
    addProperty<int>("audio:channels", "of the sound",
                     [this] { return _soundFormat ? _soundFormat->nbChannels : 0; });
}

void SourceDevice::addPictures(std::unique_ptr<UnitDecoder> decoder, const PictureFormat& format) {
    const std::uint64_t unitBytes = decoder->getUnitBytes();
    const Orv::RCShdPtr<Orv::MbManager> manager = getContext().getPictures(unitBytes);
    _pictureFormat = std::make_shared<const PictureFormat>(format);
    _pictures = std::make_unique<Track>(getName() + " pictures", std::move(decoder), manager);
    const auto nbFit = static_cast<std::int64_t>(getContext().cacheBytes / unitBytes);
    const std::int64_t nbAhead =
        getContext().isReverse
            ? std::clamp<std::int64_t>((nbFit - NB_PICTURES_ON_THEIR_WAY_REVERSE) / 2, 0,
                                       MOST_PICTURES_AHEAD_REVERSE)
            : std::clamp<std::int64_t>((nbFit - std::min(NB_PICTURES_ON_THEIR_WAY, nbFit / 2)) / 2,
                                       0, MOST_PICTURES_AHEAD);
    const std::string description = "picture/" + format.pixelName +
                                    ";width=" + std::to_string(format.width) +
                                    ";height=" + std::to_string(format.height);
    _pictureLoop = addLoopSource("video", description.c_str(), [this, nbAhead](Loop& loop) {
        play(loop, *_pictures, nbAhead, true,
             [this](Loop& to, Orv::MbBufferRdGuardImp guard, std::int64_t unit) {
                 return pushPicture(to, std::move(guard), unit);
             });
    });
}

void SourceDevice::addSound(std::unique_ptr<UnitDecoder> decoder, const SoundFormat& format) {
    _soundFormat = format;
    _sound =
        std::make_unique<Track>(getName() + " sound", std::move(decoder), getContext().getSounds());
    const std::string description = "sound/float;rate=" + std::to_string(format.rate) +
                                    ";channels=" + std::to_string(format.nbChannels);
    _soundLoop = addLoopSource("audio", description.c_str(), [this](Loop& loop) {
        play(loop, *_sound, NB_SOUND_AHEAD, false,
             [this](Loop& to, Orv::MbBufferRdGuardImp guard, std::int64_t) {
                 return pushSound(to, guard);
             });
    });
}

void SourceDevice::notePrepared() {
    const Orv::LkGuard guard(_mutex);
    if (++_nbPrepared == _nbExpected) _signals.ready();
}

// Runs on the stream's own thread, from its connection on.
void SourceDevice::play(Loop& loop, Track& track, std::int64_t nbAhead, bool mayDrop,
                        const Push& push) {
    double base = 0;  // seconds into the show
    try {
        for (std::int64_t i = 0; getContext().nbLoops == 0 || i < getContext().nbLoops; ++i) {
            if (!playOnce(loop, track, nbAhead, mayDrop, push, base)) break;
        }
    } catch (...) {
        getContext().reportFailure(getName().getChars(), std::current_exception());
        throw;
    }
}

// Returns whether the show goes on.
bool SourceDevice::playOnce(Loop& loop, Track& track, std::int64_t nbAhead, bool mayDrop,
                            const Push& push, double& base) {
    const bool isReverse = getContext().isReverse;
    std::int64_t unit = isReverse ? track.findNbUnits() - 1 : 0;
    const bool isFirst = base == 0;
    bool isPrepared = !isFirst;
    std::optional<double> origin;
    double due = 0;
    for (; !_isStopped.load(); unit += isReverse ? -1 : 1) {
        if (mayDrop) {
            if (const std::int64_t jump = _jump.exchange(-1); jump >= 0) unit = jump;
        }
        loadAhead(track, unit, nbAhead);
        Orv::MbBufferRdGuardImp guard = track.fetch(unit);
        if (!isPrepared) {
            isPrepared = true;
            notePrepared();
        }
        if (guard.isNull()) break;
        const double seconds = static_cast<const UnitHeader*>(guard.getMemory())->seconds;
        if (!origin) origin = seconds;
        due = base + std::abs(seconds - *origin);
        if (!getContext().pacer.waitFor(due, _isStopped)) return false;
        const bool isDropped = mayDrop && getContext().pacer.isOverdue(due);
        if (isDropped) ++_nbDropped;
        if (!isDropped && !push(loop, std::move(guard), unit)) return false;
        // What is shown once keeps no memory; what comes again stays as long as there is room.
        if (getContext().nbLoops == 1) track.letGo(unit);
    }
    if (!origin) return false;  // nothing there at all
    base = due + (mayDrop ? 1 / _pictureFormat->rate.toDouble()
                          : static_cast<double>(BLOCK_SAMPLES) / _soundFormat->rate);
    return !_isStopped.load();
}

// In spans of nbAhead units: on entering one, the next is loaded, and what is left of this one
// becomes what was used last, so that the span that was played makes room.
void SourceDevice::loadAhead(Track& track, std::int64_t unit, std::int64_t nbAhead) {
    if (nbAhead == 0) return;
    const bool isReverse = getContext().isReverse;
    const std::int64_t inSpan = unit % nbAhead;
    const std::int64_t span = unit - inSpan;
    if (isReverse) {
        if (inSpan != nbAhead - 1 && unit + 1 != track.findNbUnits()) return;
        track.prefetch(span, inSpan + 1);
        track.prefetch(span - nbAhead, nbAhead);
    } else {
        if (inSpan != 0) return;
        track.prefetch(span, 2 * nbAhead);
    }
}

bool SourceDevice::pushPicture(Loop& loop, Orv::MbBufferRdGuardImp guard, std::int64_t unit) {
    _position = unit;
    ++_nbShown;
    getContext().notePicture();
    _positionProperty->notify(1);
    return loop.push(createElem(Orv::RCShdPtr<Orv::DevMDStreamBuf>(
        new PictureBuf(std::move(guard), _pictureFormat, unit))));
}

bool SourceDevice::pushSound(Loop& loop, const Orv::MbBufferRdGuardImp& guard) {
    const auto* header = static_cast<const UnitHeader*>(guard.getMemory());
    const auto* samples = reinterpret_cast<const float*>(getUnitData(guard.getMemory()));
    const int nbChannels = _soundFormat->nbChannels;
    std::vector<float> values(samples, samples + std::ptrdiff_t{header->nbSamples} * nbChannels);
    if (getContext().isReverse) {
        std::reverse(values.begin(), values.end());
        for (std::size_t i = 0; nbChannels == 2 && i + 1 < values.size(); i += 2) {
            std::swap(values[i], values[i + 1]);
        }
    }
    return loop.push(createElem(
        Orv::RCShdPtr<Orv::DevMDStreamBuf>(new SoundBuf(*_soundFormat, std::move(values)))));
}

void SourceDevice::start(const Orv::DevMDSyncSeqSignals& signals) {
    const Orv::LkGuard guard(_mutex);
    _signals = signals;
    const auto isConnected = [](const Orv::RCShdPtr<Loop>& loop) {
        return !loop.isNull() && loop->getState() != Orv::DevMDStream::State::FREE;
    };
    _nbExpected = isConnected(_pictureLoop) + isConnected(_soundLoop);
    if (_nbPrepared >= _nbExpected) _signals.ready();
}

void SourceDevice::halt() {
    _isStopped = true;
    getContext().pacer.wakeAll();
}

void SourceDevice::stop(Orv::DevMDSyncSeqRequest&) {
    halt();
}

void SourceDevice::abort(Orv::DevMDSyncSeqRequest&) {
    close();
}

void SourceDevice::close() {
    halt();
    if (_pictures) _pictures->stop();
    if (_sound) _sound->stop();
}

}  // namespace MediaHost
