#include "mbBufferRdGuardImp.h"

#include <utility>

#include "assertions.h"

namespace Orv {

MbBufferRdGuardImp::MbBufferRdGuardImp(const MbBuffer& buffer) : _buffer(buffer) {
    if (!isNull()) _buffer.getImp().rdlock();
}

MbBufferRdGuardImp::MbBufferRdGuardImp(const MbBufferRdGuardImp& other) : _buffer(other._buffer) {
    if (!isNull()) _buffer.getImp().rdlock();
}

MbBufferRdGuardImp::MbBufferRdGuardImp(MbBufferRdGuardImp&& other) noexcept
    : _buffer(std::exchange(other._buffer, MbBuffer())) {}

MbBufferRdGuardImp& MbBufferRdGuardImp::operator=(MbBufferRdGuardImp other) {
    std::swap(_buffer, other._buffer);
    other.unlock();
    return *this;
}

MbBufferRdGuardImp::~MbBufferRdGuardImp() {
    try {
        unlock();
    } catch (...) {
        Assertions::traceCurrentException("unlocking a buffer");
    }
}

void MbBufferRdGuardImp::unlock() {
    const MbBuffer buffer = std::exchange(_buffer, MbBuffer());
    if (!buffer.isNull()) buffer.getImp().unlock();
}

const void* MbBufferRdGuardImp::getMemory() const {
    return _buffer.getImp().getRegion().dataStart;
}

std::span<const std::byte> MbBufferRdGuardImp::getBytes() const {
    return {static_cast<const std::byte*>(getMemory()),
            static_cast<std::size_t>(_buffer.getSize())};
}

}  // namespace Orv
