#include "lgReader.h"

#include <chrono>
#include <thread>

#include "assertions.h"
#include "lgRegistry.h"

namespace Orv {

void LgReader::run() {
    LgRegistry& registry = LgRegistry::getInstance();
    ORV_ASSERT_TEXT(registry.startReader(), "no other reader runs");
    while (!_isStopped.load(std::memory_order_seq_cst)) {
        if (registry.drainForReader()) {
            registry.sleepUntilLogged(_isStopped);
        } else {
            // A thread was seen in the middle of logging; its record is the next one in time.
            std::this_thread::sleep_for(std::chrono::milliseconds(1));
        }
    }
    registry.stopReader();
}

void LgReader::stop() noexcept {
    _isStopped.store(true, std::memory_order_seq_cst);
    LgRegistry::getInstance().wakeReader();
}

}  // namespace Orv
