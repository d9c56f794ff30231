#include "mbBufferWrGuardImp.h"

#include <utility>

#include "assertions.h"

namespace Orv {

MbBufferWrGuardImp::MbBufferWrGuardImp(const MbBuffer& buffer) : _buffer(buffer) {
    if (!isNull()) _buffer.getImp().wrlock();
}

MbBufferWrGuardImp::MbBufferWrGuardImp(const MbBufferWrGuardImp& other) : _buffer(other._buffer) {
    if (!isNull()) _buffer.getImp().wrdup();
}

MbBufferWrGuardImp::MbBufferWrGuardImp(MbBufferWrGuardImp&& other) noexcept
    : _buffer(std::exchange(other._buffer, MbBuffer())) {}

MbBufferWrGuardImp& MbBufferWrGuardImp::operator=(MbBufferWrGuardImp other) {
    std::swap(_buffer, other._buffer);
    other.unlock();
    return *this;
}

MbBufferWrGuardImp::~MbBufferWrGuardImp() {
    try {
        unlock();
    } catch (...) {
        Assertions::traceCurrentException("unlocking a buffer");
    }
}

void MbBufferWrGuardImp::unlock() {
    const MbBuffer buffer = std::exchange(_buffer, MbBuffer());
    if (!buffer.isNull()) buffer.getImp().unlock();
}

void* MbBufferWrGuardImp::getMemory() const {
    return _buffer.getImp().getRegion().dataStart;
}

std::span<std::byte> MbBufferWrGuardImp::getBytes() const {
    return {static_cast<std::byte*>(getMemory()), static_cast<std::size_t>(_buffer.getSize())};
}

}  // namespace Orv
