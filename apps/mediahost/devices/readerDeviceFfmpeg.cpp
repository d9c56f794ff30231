#include <algorithm>

#include "ffmpegPictures.h"
#include "ffmpegSound.h"
#include "readerDevice.h"

namespace MediaHost {

bool ReaderDevice::isAvailable() {
    return true;
}

void ReaderDevice::openFile() {
    auto pictures = FfmpegInput::tryOpen(_file, AVMEDIA_TYPE_VIDEO, static_cast<int>(_nbThreads));
    auto sound = FfmpegInput::tryOpen(_file, AVMEDIA_TYPE_AUDIO, 1);
    if (!pictures && !sound) {
        throw MediaError('"' + _file + "\" has neither pictures nor sound");
    }
    if (pictures) {
        auto decoder = std::make_unique<FfmpegPictures>(std::move(pictures));
        const PictureFormat format = decoder->getFormat();
        _seconds = decoder->getSeconds();
        _codecs = decoder->getCodecName();
        addPictures(std::move(decoder), format);
    }
    if (sound) {
        auto decoder = std::make_unique<FfmpegSound>(std::move(sound));
        const SoundFormat format = decoder->getFormat();
        _seconds = std::max(_seconds, decoder->getSeconds());
        _codecs += (_codecs.empty() ? "" : ", ") + decoder->getCodecName();
        addSound(std::move(decoder), format);
    }
}

}  // namespace MediaHost
