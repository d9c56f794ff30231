#include "lkNamedMutexPosix.h"

#include <cerrno>
#include <map>
#include <mutex>

#include "exSysErrorPosix.h"
#include "lkFutexPosix.h"
#include "sourceFile.h"

namespace Orv {

namespace {

/// All named mutexes that somebody has open. Never destroyed.
struct Names {
    std::mutex mutex;
    std::map<std::string, std::weak_ptr<LkFutexPosix>> open;
};

Names& names() {
    static auto* const instance = new Names;
    return *instance;
}

}  // namespace

LkNamedMutexPosix::LkNamedMutexPosix(const char* name) : _name(name) {
    const std::lock_guard guard(names().mutex);
    std::weak_ptr<LkFutexPosix>& slot = names().open[_name];
    _futex = slot.lock();
    if (!_futex) slot = _futex = std::make_shared<LkFutexPosix>();
}

LkNamedMutexPosix::~LkNamedMutexPosix() {
    const std::lock_guard guard(names().mutex);
    _futex.reset();
    const auto slot = names().open.find(_name);
    if (slot->second.expired()) names().open.erase(slot);
}

bool LkNamedMutexPosix::lock() {
    if (_futex->lock(LkFutexPosix::WATCH_OWNER)) return true;
    unlock();
    throw ExSysErrorPosix(ORV_FILE, __LINE__, "locking a named mutex", EOWNERDEAD);
}

void LkNamedMutexPosix::unlock() {
    if (!_futex->unlock()) {
        throw ExSysErrorPosix(ORV_FILE, __LINE__, "unlocking a named mutex", EPERM);
    }
}

}  // namespace Orv
