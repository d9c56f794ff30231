#include "mbAsyncHandle.h"

#include "mbBufferImp.h"
#include "mbEx.h"
#include "sourceFile.h"

namespace Orv {

MbAsyncHandle::MbAsyncHandle(MbBufferImp& buffer)
    : _lock("MbAsyncHandle"), _buffer(&buffer), _bufferName(buffer.getNameString()) {}

MbAsyncHandle::~MbAsyncHandle() noexcept = default;

RCShdPtr<MbAsyncHandle> MbAsyncHandle::hold(LkAsyncHandle* handle) {
    return RCShdPtr<MbAsyncHandle>(dynamic_cast<MbAsyncHandle*>(handle));
}

void MbAsyncHandle::reportSucceeded() {
    report(MbEvent::ASYNC_OP_SUCCEEDED);
}

void MbAsyncHandle::reportFailed() {
    report(MbEvent::ASYNC_OP_FAILED);
}

void MbAsyncHandle::report(MbEvent event) {
    const RCShdPtr<MbAsyncHandle> self(this);  // the buffer may let go of its handle meanwhile
    RCShdEngPtr<MbBufferImp> buffer;
    const char* state = nullptr;
    {
        const LkGuard guard(_lock);
        buffer = _buffer;
        state = _stateAtEnd;
    }
    if (buffer == nullptr) {
        throw MbEx::ExIllegalTransition(ORV_FILE, __LINE__, _bufferName.getChars(),
                                        getMbEventText(event), state);
    }
    buffer->asyncOpReported(*this, event);
}

void MbAsyncHandle::end(const char* state) {
    RCShdEngPtr<MbBufferImp> buffer;  // let go of behind the lock; never the last holder
    const LkGuard guard(_lock);
    std::swap(buffer, _buffer);
    _stateAtEnd = state;
}

}  // namespace Orv
