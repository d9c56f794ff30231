#include "lkNamedSema.h"

#include "assertions.h"
#include "lkNamedSemaNative.h"

namespace Orv {

class LkNamedSema::Native : public LkNamedSemaNative {
public:
    using LkNamedSemaNative::LkNamedSemaNative;
};

LkNamedSema::LkNamedSema(const char* osName, unsigned initialCount,
                         LkSemaTypes::CreateFlag createFlag, const char* name)
    : _native(std::make_unique<Native>(osName, initialCount, createFlag)),
      _name(name != nullptr ? name : osName) {}

LkNamedSema::~LkNamedSema() noexcept(false) {
    const int error = _native->close();
    if (error != 0) {
        Assertions::reportSysAssertionFailed(ORV_FILE, __LINE__, "::CloseHandle( _sema )", error);
    }
}

void LkNamedSema::post() {
    ORV_ASSERT(isValid());
    _native->post();
}

void LkNamedSema::wait() {
    ORV_ASSERT(isValid());
    _native->wait();
}

bool LkNamedSema::tryWait() {
    ORV_ASSERT_TEXT(isValid(), "result == WAIT_TIMEOUT");
    return _native->tryWait();
}

bool LkNamedSema::isValid() const noexcept {
    return _native->getErrno() == 0;
}

int LkNamedSema::getErrno() const noexcept {
    return _native->getErrno();
}

}  // namespace Orv
