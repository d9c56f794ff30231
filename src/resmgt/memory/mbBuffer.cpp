#include "mbBuffer.h"

namespace Orv {

// Each holds the buffer: a callback of the protocol may drop the handle that it was called through.

void MbBuffer::prefetch() const {
    const RCShdEngPtr<MbBufferImp> imp = _imp;
    imp->prefetch();
}

void MbBuffer::sync() const {
    const RCShdEngPtr<MbBufferImp> imp = _imp;
    imp->sync();
}

void MbBuffer::asyncSync() const {
    const RCShdEngPtr<MbBufferImp> imp = _imp;
    imp->asyncSync();
}

void MbBuffer::free() const {
    const RCShdEngPtr<MbBufferImp> imp = _imp;
    imp->free();
}

void MbBuffer::dump(std::ostream& stream) const {
    _imp->dump(stream);
}

}  // namespace Orv
