#include "devMDStdStreamNewsPrivate.h"

namespace Orv {

ObjPtr<DevMDStreamElem> DevMDStdStreamNews::create(DevMDStreamElem::Ev ev) {
    return ObjPtr<DevMDStreamElem>(new DevMDStreamElem(nullptr, ev));
}

DevMDStream::State DevMDStdStreamNews::stateAfter(DevMDStreamElem::Ev ev) {
    switch (ev) {
        case DevMDStreamElem::END:
            return DevMDStream::State::ENDED;
        case DevMDStreamElem::FAILED:
            return DevMDStream::State::FAILED;
        case DevMDStreamElem::STOPPED:
            return DevMDStream::State::FREE;
        default:
            return DevMDStream::State::RUNNING;
    }
}

std::string DevMDStdStreamNews::describe(const char* doing, const LiString& stream) {
    return std::string(doing) + " the stream \"" + std::string(stream.getText()) + '"';
}

}  // namespace Orv
