#pragma once

#include "mbDualBuffer.h"

namespace Orv {

/// Creates views of two buffers.
class ORV_RESMGT_API MbDualBufferFactory {
public:
    MbDualBufferFactory() = delete;

    /// Offsets and sizes are in bytes. Asserts "offset1 >= 0", "size1 > 0",
    /// "( offset1 + size1 ) <= buf1.getSize()", and the same for the second.
    /// @throws RCEx::ExNullPtr if a buffer is null.
    static MbDualBuffer create(const MbBuffer& buf1, int offset1, int size1, const MbBuffer& buf2,
                               int offset2, int size2);
};

}  // namespace Orv
