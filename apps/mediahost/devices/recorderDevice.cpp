#include "recorderDevice.h"

#include <cstdio>

#include "pngFile.h"

namespace MediaHost {

RecorderDevice::RecorderDevice(const Orv::LiString& name, HostContext& context, Settings settings)
    : MediaDevice(name, context),
      _hasFrames(settings.getNumber("frames", 0, 0, 1) == 1),
      _hasChecksums(settings.getNumber("checksums", 0, 0, 1) == 1),
      _filmName(settings.getText("encode", "")) {
    settings.check();
    if (!_filmName.empty() && context.folder.empty()) {
        throw MediaError("there is no folder for the film \"" + _filmName +
                         "\"; give one with --out");
    }
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
        if (!_filmName.empty()) encode(*buf);
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

void RecorderDevice::encode(const PictureBuf& buf) {
    if (!_film) {
        _film = std::make_unique<EncodedFile>(getContext().folder / _filmName, buf.getFormat());
    }
    _film->write(buf.getFormat(), buf.getData());
}

void RecorderDevice::finish(bool isWhole) {
    if (!isWhole) {
        dropFiles();
        return;
    }
    if (_sound) _sound->commit();
    if (_checksums) _checksums->commit();
    if (_film) _film->commit();
}

void RecorderDevice::close() {
    dropFiles();
}

// Those that are whole have their names already and stay.
void RecorderDevice::dropFiles() {
    _sound.reset();
    _checksums.reset();
    _film.reset();
}

}  // namespace MediaHost
