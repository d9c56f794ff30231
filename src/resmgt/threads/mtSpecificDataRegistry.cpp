#include "mtSpecificDataRegistry.h"

#include <exception>
#include <iterator>

#include "assertions.h"
#include "lkGuard.h"
#include "mtNative.h"
#include "mtOpaqueData.h"

namespace Orv {

namespace {

// A deleter that makes a value of its own slot again, each time, would never come to an end.
constexpr int maxNbDeletions = 10000;

}  // namespace

MtSpecificDataRegistry& MtSpecificDataRegistry::getInstance() {
    static auto* const registry = new MtSpecificDataRegistry;
    return *registry;
}

void MtSpecificDataRegistry::addSpecificData(const MtOpaqueData* data) {
    ORV_ASSERT_TEXT(data != nullptr, "data");
    MtThreadEndNative::watchCallingThread();
    const LkGuard guard(_lock);
    _entries.emplace(LkThreadId::CURRENT_THREAD, Entry{data, data->getSpecific()});
}

void MtSpecificDataRegistry::removeSpecificData() {
    std::exception_ptr firstError;
    for (int nbDeletions = 0; nbDeletions < maxNbDeletions; ++nbDeletions) {
        try {
            if (removeFirst()) continue;
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
bool MtSpecificDataRegistry::removeFirst() {
    LkGuard guard(_lock);
    const auto found = _entries.find(LkThreadId::CURRENT_THREAD);
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
    LkGuard guard(_lock);
    const auto [first, last] = _entries.equal_range(LkThreadId::CURRENT_THREAD);
    for (auto entry = first; entry != last; ++entry) {
        if (entry->second.data != data) continue;
        void* const value = entry->second.value;
        data->_native->setValue(nullptr);
        _entries.erase(entry);
        guard.unlock();
        data->_deleter(value);
        return;
    }
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

std::size_t MtSpecificDataRegistry::getNbValues() const {
    const LkGuard guard(_lock);
    return _entries.size();
}

}  // namespace Orv
