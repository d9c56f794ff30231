#include "mbDualBufferFactory.h"

#include "assertions.h"

namespace Orv {

MbDualBuffer MbDualBufferFactory::create(const MbBuffer& buf1, int offset1, int size1,
                                         const MbBuffer& buf2, int offset2, int size2) {
    ORV_ASSERT(offset1 >= 0);
    ORV_ASSERT(offset2 >= 0);
    ORV_ASSERT(size1 > 0);
    ORV_ASSERT(size2 > 0);
    // Written so that no sum overflows.
    ORV_ASSERT_TEXT(offset1 <= buf1.getSize() - size1, "( offset1 + size1 ) <= buf1.getSize()");
    ORV_ASSERT_TEXT(offset2 <= buf2.getSize() - size2, "( offset2 + size2 ) <= buf2.getSize()");
    return MbDualBuffer(buf1, offset1, size1, buf2, offset2, size2);
}

}  // namespace Orv
