#include "lkParkerPosix.h"

#include "lkAddressWaitPosix.h"

namespace Orv {

bool LkParkerPosix::sleep(const std::atomic<std::uint32_t>& word, std::uint32_t asleep,
                          const LkTimeLimit& limit) {
    while (word.load(std::memory_order_acquire) == asleep) {
        if (!LkAddressWaitPosix::wait(&word, asleep, limit)) {
            return word.load(std::memory_order_acquire) != asleep;
        }
    }
    return true;
}

void LkParkerPosix::wake(const std::atomic<std::uint32_t>& word) noexcept {
    LkAddressWaitPosix::wakeOne(&word);
}

}  // namespace Orv
