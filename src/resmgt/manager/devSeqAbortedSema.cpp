#include "devSeqAbortedSema.h"

#include <atomic>

#include "assertions.h"
#include "formatText.h"
#include "lkNative.h"

namespace Orv {

DevSeqAbortedSema::DevSeqAbortedSema() = default;
DevSeqAbortedSema::~DevSeqAbortedSema() noexcept(false) = default;

LiString DevSeqAbortedSema::getName() {
    static std::atomic<unsigned long> serial{0};
    const LkGuard guard(_lock);
    if (_sema != nullptr) return _name;
    _name =
        LiString(formatText("orv-sequence-%ld-%lu", LkNamedMutexNative::getProcessId(), ++serial));
    auto sema = std::make_unique<LkNamedSema>(_name.getChars(), _isPosted ? 1U : 0U,
                                              LkSemaTypes::CREATE_EXCLUSIVE);
    ORV_ASSERT_SYS(sema->isValid(), "sema->isValid()", sema->getErrno());
    _sema = std::move(sema);
    return _name;
}

void DevSeqAbortedSema::post() {
    const LkGuard guard(_lock);
    if (std::exchange(_isPosted, true)) return;
    if (_sema != nullptr) _sema->post();
}

}  // namespace Orv
