#include <algorithm>

#include "ffmpegPictures.h"
#include "ffmpegSound.h"
#include "readerDevice.h"

namespace MediaHost {

bool ReaderDevice::isAvailable() {
    return true;
}

void ReaderDevice::openFile() {
    const bool hasPictures = FfmpegInput::hasStream(_file, AVMEDIA_TYPE_VIDEO);
    const bool hasSound = FfmpegInput::hasStream(_file, AVMEDIA_TYPE_AUDIO);
    if (!hasPictures && !hasSound) {
        throw MediaError('"' + _file + "\" has neither pictures nor sound");
    }
    if (hasPictures) {
        auto decoder = std::make_unique<FfmpegPictures>(_file, static_cast<int>(_nbThreads));
        const PictureFormat format = decoder->getFormat();
        _seconds = decoder->getSeconds();
        _codecs = decoder->getCodecName();
        addPictures(std::move(decoder), format);
    }
    if (hasSound) {
        auto decoder = std::make_unique<FfmpegSound>(_file);
        const SoundFormat format = decoder->getFormat();
        _seconds = std::max(_seconds, decoder->getSeconds());
        _codecs += (_codecs.empty() ? "" : ", ") + decoder->getCodecName();
        addSound(std::move(decoder), format);
    }
}

}  // namespace MediaHost
