#include "lkCondVar.h"

#include <ostream>

namespace Orv {

LkCondVar::LkCondVar(const char* name) noexcept
    : _queue(LkWaitQueue::Memory::FORGETS), _name(name) {}

LkCondVar::LkCondVar(const char* name, const LkCondVarAttr&) noexcept : LkCondVar(name) {}

void LkCondVar::signal() noexcept {
    _queue.release();
}

void LkCondVar::broadcast() noexcept {
    _queue.releaseAll();
}

void LkCondVar::performWait(const LkMutex& mutex) {
    _queue.wait(mutex, LkTimeLimit());
}

bool LkCondVar::performTimedWait(const LkMutex& mutex, double seconds) {
    return _queue.wait(mutex, LkTimeLimit(seconds));
}

void LkCondVar::dump(std::ostream& stream) const {
    stream << "LkCondVar \"" << _name << "\" waiting " << _queue.getNbWaiters();
}

}  // namespace Orv
