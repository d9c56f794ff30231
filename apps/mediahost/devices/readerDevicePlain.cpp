#include "readerDevice.h"

namespace MediaHost {

bool ReaderDevice::isAvailable() {
    return false;
}

void ReaderDevice::openFile() {
    throw MediaError("cannot read \"" + _file +
                     "\": this program was built without FFmpeg; simulated sources work");
}

}  // namespace MediaHost
