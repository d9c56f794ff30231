#pragma once

#include <memory>
#include <optional>

#include "encodedFile.h"
#include "mediaDevice.h"
#include "pictureTools.h"
#include "settings.h"
#include "waveFile.h"

namespace MediaHost {

/// Writes what comes in by "audio" and "video" into the host's folder: "sound.wav"; with the setting
/// frames=1 each picture as "frames/000000.png"; with encode=NAME the pictures as a film of the kind
/// that the name tells; with checksums=1 "frames.txt", a line for each picture: its number in the
/// show, its number in its track, its timecode, and the checksum of its bytes as they were decoded.
///
/// A file gets its name when it is whole.
class RecorderDevice : public MediaDevice {
public:
    RecorderDevice(const Orv::LiString& name, HostContext& context, Settings settings);

protected:
    void finish(bool isWhole) override;
    void close() override;

private:
    const bool _hasFrames;
    const bool _hasChecksums;
    const std::string _filmName;             // empty: none
    std::unique_ptr<WaveFile> _sound;        // null: none yet
    std::unique_ptr<OutputFile> _checksums;  // null: none yet
    std::unique_ptr<EncodedFile> _film;      // null: none yet
    PictureScaler _scaler;
    std::vector<std::uint8_t> _pixels;
    std::int64_t _nbPictures = 0;
    std::int64_t _nbSamples = 0;

    void takeSound(const Orv::RCShdPtr<SoundBuf>& buf);
    void takePicture(const Orv::RCShdPtr<PictureBuf>& buf);
    void writePicture(const PictureBuf& buf);
    void writeChecksum(const PictureBuf& buf);
    void encode(const PictureBuf& buf);
    void dropFiles();
};

}  // namespace MediaHost
