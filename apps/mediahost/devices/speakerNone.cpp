#include "mediaError.h"
#include "speaker.h"

namespace MediaHost {

std::unique_ptr<Speaker> Speaker::create(const SoundFormat&) {
    throw MediaError("sound cannot be heard: this program was built without SDL");
}

}  // namespace MediaHost
