#include "mtSpecificDataRegistry.h"

#include <algorithm>
#include <atomic>
#include <exception>
#include <iterator>

#include "assertions.h"
#include "lkGuard.h"
#include "mtNative.h"
#include "mtOpaqueData.h"
#include "threadSlot.h"

namespace Orv {

namespace {

// A deleter that makes a value of its own slot again, each time, would never come to an end.
constexpr int maxNbDeletions = 10000;

}  // namespace

MtSpecificDataRegistry& MtSpecificDataRegistry::getInstance() {
    static auto* const registry = new MtSpecificDataRegistry;
    return *registry;
}

std::uintptr_t MtSpecificDataRegistry::getThreadNumber() {
    static constinit std::atomic<std::uintptr_t> lastNumber{0};
    if (void* const number = _ownNumber.get()) return reinterpret_cast<std::uintptr_t>(number);
    const std::uintptr_t number = lastNumber.fetch_add(1, std::memory_order_relaxed) + 1;
    return _ownNumber.set(reinterpret_cast<void*>(number)) ? number : 0;
}

constinit ThreadSlot MtSpecificDataRegistry::_ownNumber(ThreadSlot::THREAD_DATA, noticeEnd);

void MtSpecificDataRegistry::noticeEnd(void* number) noexcept {
    try {
        getInstance().removeThread(reinterpret_cast<std::uintptr_t>(number));
    } catch (...) {
        Assertions::traceCurrentException("deleting the data of a thread that ends");
    }
}

void MtSpecificDataRegistry::addSpecificData(const MtOpaqueData* data) {
    ORV_ASSERT_TEXT(data != nullptr, "data");
    const std::uintptr_t number = getThreadNumber();
    const LkGuard guard(_lock);
    _entries.emplace(number, Entry{data, data->getSpecific()});
}

void MtSpecificDataRegistry::removeSpecificData() {
    if (const void* const number = _ownNumber.get()) {
        removeThread(reinterpret_cast<std::uintptr_t>(number));
    }
}

void MtSpecificDataRegistry::removeThread(std::uintptr_t number) {
    std::exception_ptr firstError;
    for (int nbDeletions = 0; nbDeletions < maxNbDeletions; ++nbDeletions) {
        try {
            if (removeFirst(number)) continue;
        } catch (...) {
            if (!firstError) firstError = std::current_exception();
            continue;
        }
        if (firstError) std::rethrow_exception(firstError);
        return;
    }
    Assertions::throwProgramAborted(ORV_FILE, __LINE__,
                                    "thread data that is made anew without end");
}

/// Deletes one value of the calling thread; false if it has none.
bool MtSpecificDataRegistry::removeFirst(std::uintptr_t number) {
    LkGuard guard(_lock);
    const auto found = _entries.find(number);
    if (found == _entries.end()) return false;
    // The slot may go as soon as it holds no more values, so it is not used after the lock.
    const MtOpaqueData::Deleter deleter = found->second.data->_deleter;
    void* const value = found->second.value;
    found->second.data->_native->setValue(nullptr);
    _entries.erase(found);
    guard.unlock();
    deleter(value);
    return true;
}

void MtSpecificDataRegistry::removeSpecificData(const MtOpaqueData* data) {
    void* const value = data->getSpecific();
    if (value == nullptr) return;
    LkGuard guard(_lock);
    const auto [first, last] = _entries.equal_range(getThreadNumber());
    const auto found = std::find_if(first, last, [&](const Entries::value_type& entry) {
        return entry.second.data == data && entry.second.value == value;
    });
    data->_native->setValue(nullptr);
    if (found != last) _entries.erase(found);
    guard.unlock();
    data->_deleter(value);
}

void MtSpecificDataRegistry::forgetThread(std::uintptr_t number) noexcept {
    const LkGuard guard(_lock);
    _entries.erase(number);
}

void MtSpecificDataRegistry::removeSlot(const MtOpaqueData* data) noexcept {
    // Taken over node by node: that needs no memory.
    Entries removed;
    {
        const LkGuard guard(_lock);
        for (auto entry = _entries.begin(); entry != _entries.end();) {
            const auto next = std::next(entry);
            if (entry->second.data == data) removed.insert(_entries.extract(entry));
            entry = next;
        }
    }
    for (const auto& [thread, entry] : removed) {
        try {
            data->_deleter(entry.value);
        } catch (...) {
            Assertions::traceCurrentException("deleting the data of a slot that goes");
        }
    }
}

void MtSpecificDataRegistry::whileLocked(const std::function<void()>& action) const {
    const LkGuard guard(_lock);
    action();
}

std::size_t MtSpecificDataRegistry::getNbValues() const {
    const LkGuard guard(_lock);
    return _entries.size();
}

}  // namespace Orv
