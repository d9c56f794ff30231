#pragma once

#include "mbBuffer.h"

namespace Orv {

/// A range of each of two buffers that belong together, such as the last part of one block of a
/// recording and the first of the next; both may be ranges of one buffer. MbDualBufferFactory creates
/// it.
///
/// Lock both at once with MbDualBufferRdGuard or MbDualBufferWrGuard, which take any two buffers in
/// one order, so that no two of them wait for each other.
///
/// - Threads: as MbBuffer.
class ORV_RESMGT_API MbDualBuffer {
public:
    const MbBuffer& getBuffer1() const noexcept { return _buffer1; }
    const MbBuffer& getBuffer2() const noexcept { return _buffer2; }
    int getOffset1() const noexcept { return _offset1; }  ///< In bytes, as all four.
    int getOffset2() const noexcept { return _offset2; }
    int getSize1() const noexcept { return _size1; }
    int getSize2() const noexcept { return _size2; }

    void prefetch() const;   ///< Of both buffers, as a whole.
    void asyncSync() const;  ///< Of both buffers, as a whole.
    bool isLoaded() const { return _buffer1.isLoaded() && _buffer2.isLoaded(); }

private:
    friend class MbDualBufferFactory;

    MbDualBuffer(const MbBuffer& buffer1, int offset1, int size1, const MbBuffer& buffer2,
                 int offset2, int size2)
        : _buffer1(buffer1),
          _buffer2(buffer2),
          _offset1(offset1),
          _offset2(offset2),
          _size1(size1),
          _size2(size2) {}

    MbBuffer _buffer1;
    MbBuffer _buffer2;
    int _offset1;
    int _offset2;
    int _size1;
    int _size2;
};

}  // namespace Orv
