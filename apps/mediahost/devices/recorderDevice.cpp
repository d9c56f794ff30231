#include "recorderDevice.h"

#include <cstdio>

#include "pngFile.h"

namespace MediaHost {

RecorderDevice::RecorderDevice(const Orv::LiString& name, HostContext& context, Settings settings)
    : MediaDevice(name, context),
      _hasFrames(settings.getNumber("frames", 0, 0, 1) == 1),
      _hasChecksums(settings.getNumber("checksums", 0, 0, 1) == 1) {
    settings.check();
    addInput<SoundBuf>("audio", "sound/*",
                       [this](const Orv::RCShdPtr<SoundBuf>& buf) { takeSound(buf); });
    addInput<PictureBuf>("video", "picture/*",
                         [this](const Orv::RCShdPtr<PictureBuf>& buf) { takePicture(buf); });
    addProperty<std::int64_t>("samples", "written until now, per channel",
                              [this] { return _nbSamples; });
    addProperty<std::int64_t>("pictures", "that came in until now", [this] { return _nbPictures; });
}

void RecorderDevice::takeSound(const Orv::RCShdPtr<SoundBuf>& buf) {
    if (getContext().folder.empty()) return;
    if (!_sound) {
        _sound = std::make_unique<WaveFile>(getContext().folder / "sound.wav", buf->getFormat());
    }
    if (buf->getFormat().nbChannels != _sound->getFormat().nbChannels) {
        throw MediaError("the sound has become stereo on the way");
    }
    _sound->write(buf->getSamples());
    _nbSamples += static_cast<std::int64_t>(buf->getNbSamples());
}

void RecorderDevice::takePicture(const Orv::RCShdPtr<PictureBuf>& buf) {
    if (!getContext().folder.empty()) {
        if (_hasFrames) writePicture(*buf);
        if (_hasChecksums) writeChecksum(*buf);
    }
    ++_nbPictures;
}

void RecorderDevice::writePicture(const PictureBuf& buf) {
    const std::filesystem::path folder = getContext().folder / "frames";
    if (_nbPictures == 0) std::filesystem::create_directories(folder);
    char name[32];
    std::snprintf(name, sizeof name, "%06lld.png", static_cast<long long>(_nbPictures));
    const PictureFormat& format = buf.getFormat();
    _scaler.scale(format, buf.getData(), format.width, format.height, _pixels);
    writePng(folder / name, {_pixels.data(), format.width, format.height});
}

void RecorderDevice::writeChecksum(const PictureBuf& buf) {
    if (!_checksums) _checksums = std::make_unique<OutputFile>(getContext().folder / "frames.txt");
    const Orv::LiString timecode = getContext().timecode->getTimecode(buf.getNumber());
    _checksums->write(std::to_string(_nbPictures) + ' ' + std::to_string(buf.getNumber()) + ' ' +
                      timecode.getChars() + ' ' +
                      getChecksum(buf.getData(), buf.getFormat().nbBytes) + '\n');
}

void RecorderDevice::finish(bool isWhole) {
    if (!isWhole) {
        _sound.reset();
        _checksums.reset();
        return;
    }
    if (_sound) _sound->commit();
    if (_checksums) _checksums->commit();
}

void RecorderDevice::close() {
    _sound.reset();
    _checksums.reset();
    MediaDevice::close();
}

}  // namespace MediaHost
