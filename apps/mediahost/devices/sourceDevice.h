#pragma once

#include <atomic>
#include <memory>
#include <optional>

#include "mediaDevice.h"
#include "track.h"

namespace MediaHost {

/// A device whose pictures and sound come from tracks: streams "video" and "audio", each pushed by
/// a thread of its own when it is due, forwards or backwards, once or over and over.
class SourceDevice : public MediaDevice {
public:
    ~SourceDevice() noexcept(false) override;

    const PictureFormat* getPictureFormat() const { return _pictureFormat.get(); }  ///< Or null.
    const SoundFormat* getSoundFormat() const { return _soundFormat ? &*_soundFormat : nullptr; }

protected:
    SourceDevice(const Orv::LiString& name, HostContext& context);

    // In the constructor, each at most once:
    void addPictures(std::unique_ptr<UnitDecoder> decoder, const PictureFormat& format);
    void addSound(std::unique_ptr<UnitDecoder> decoder, const SoundFormat& format);
    void setDuration(double seconds) { _duration = seconds; }

    void start(const Orv::DevMDSyncSeqSignals& signals) override;
    void stop(Orv::DevMDSyncSeqRequest& request) override;
    void abort(Orv::DevMDSyncSeqRequest& request) override;
    void close() override;

private:
    using Loop = Orv::DevMDStdStreamLoopSource;
    using Push = std::function<bool(Loop&, Orv::MbBufferRdGuardImp, std::int64_t unit)>;

    std::shared_ptr<const PictureFormat> _pictureFormat;
    std::optional<SoundFormat> _soundFormat;
    double _duration = 0;  // seconds; 0: unknown
    std::unique_ptr<Track> _pictures, _sound;
    Orv::RCShdPtr<Loop> _pictureLoop, _soundLoop;
    Orv::RCShdPtr<Orv::DevMDStdProperty<std::int64_t>> _positionProperty;

    std::atomic<bool> _isStopped{false};
    std::atomic<std::int64_t> _position{0};
    std::atomic<std::int64_t> _jump{-1};  // the picture that is to come next
    std::atomic<std::int64_t> _nbShown{0}, _nbDropped{0};

    Orv::LkMutex _mutex{"SourceDevice"};
    // Guarded by _mutex:
    Orv::DevMDSyncSeqSignals _signals;
    int _nbPrepared = 0;   // loops that have got their first unit
    int _nbExpected = -1;  // loops that are connected; -1 before the start

    void halt();
    void addPictureProperties();
    void addSoundProperties();
    void notePrepared();
    void play(Loop& loop, Track& track, std::int64_t nbAhead, bool mayDrop, const Push& push);
    bool playOnce(Loop& loop, Track& track, std::int64_t nbAhead, bool mayDrop, const Push& push,
                  double& base);
    void loadAhead(Track& track, std::int64_t unit, std::int64_t nbAhead);
    bool pushPicture(Loop& loop, Orv::MbBufferRdGuardImp guard, std::int64_t unit);
    bool pushSound(Loop& loop, const Orv::MbBufferRdGuardImp& guard);
};

}  // namespace MediaHost
