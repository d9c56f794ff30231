#include "seSourceStepped.h"

#include <utility>

#include "assertions.h"

namespace Orv {

SeSourceStepped::SeSourceStepped(const LiString& name) : SeSourceProtocol(name) {}

std::uint32_t SeSourceStepped::step(std::uint32_t nbTicks) {
    ORV_ASSERT(nbTicks > 0);
    const LkGuard guard(_lock);
    _tick += nbTicks;
    if (_tick == 0) _tick = 1;  // 0 is no first tick
    _pulse.pulse();
    return _tick;
}

void SeSourceStepped::fail(std::exception_ptr error) {
    ORV_ASSERT(error != nullptr);
    const LkGuard guard(_lock);
    _error = std::move(error);
    _pulse.pulse();
}

std::uint32_t SeSourceStepped::getTick() const {
    const LkGuard guard(_lock);
    return _tick;
}

void SeSourceStepped::start() {
    const LkGuard guard(_lock);
    _isCancelled = false;
}

std::uint32_t SeSourceStepped::waitForTick() {
    const LkGuard guard(_lock);
    while (_tick == _toldTick && !_error && !_isCancelled) {
        _pulse.reset();
        _pulse.wait(guard);
    }
    if (_error) std::rethrow_exception(std::exchange(_error, nullptr));
    return _toldTick = _tick;
}

void SeSourceStepped::stop() {}

void SeSourceStepped::cancelWait() {
    const LkGuard guard(_lock);
    _isCancelled = true;
    _pulse.pulse();
}

}  // namespace Orv
