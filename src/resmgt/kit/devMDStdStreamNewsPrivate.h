#pragma once

#include <string>

#include "devMDStream.h"

namespace Orv {

/// What the standard ends of streams share about elements without a buffer.
struct DevMDStdStreamNews {
    static ObjPtr<DevMDStreamElem> create(DevMDStreamElem::Ev ev);

    /// In which an end is after an element.
    static DevMDStream::State stateAfter(DevMDStreamElem::Ev ev);

    /// For the log: "pushing into the stream "video"".
    static std::string describe(const char* doing, const LiString& stream);
};

}  // namespace Orv
