#include "mbDualBuffer.h"

namespace Orv {

void MbDualBuffer::prefetch() const {
    _buffer1.prefetch();
    if (_buffer2 != _buffer1) _buffer2.prefetch();
}

void MbDualBuffer::asyncSync() const {
    _buffer1.asyncSync();
    if (_buffer2 != _buffer1) _buffer2.asyncSync();
}

}  // namespace Orv
