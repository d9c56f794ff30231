#include "mbPoolManager.h"

#include <ostream>

#include "assertions.h"
#include "mbBufferImp.h"
#include "mbEx.h"
#include "mbUnloadNotesPrivate.h"

namespace Orv {

namespace {

/// Counts for a scope.
class Counted {
public:
    explicit Counted(std::atomic<std::uint32_t>& count) noexcept : _count(count) { ++_count; }
    ~Counted() { --_count; }
    Counted(const Counted&) = delete;
    Counted& operator=(const Counted&) = delete;

private:
    std::atomic<std::uint32_t>& _count;
};

}  // namespace

MbPoolManager::MbPoolManager(const LiString& name, ObjPtr<MbUnloadStrategy> strategy)
    : _name(name),
      _mutex(_name.getChars()),
      _pulse(_name.getChars(), LkPulse::WAKE_ALL),
      _strategy(strategy),
      _notes(std::make_unique<MbUnloadNotes>()),
      _listLock(_name.getChars()) {
    ORV_ASSERT_TEXT(!_strategy.isNull(), "strategy != null");
}

MbPoolManager::~MbPoolManager() = default;

// ----------------------------------------------------------------------------------------- room

void MbPoolManager::allocateRegion(MbBufferImp* buffer) {
    Guard guard(_mutex);
    if (allocateNow(buffer)) return;
    const Counted seeking(_nbSeeking);  // from here on, room that appears is pulsed
    do {
        makeRoom(guard);
    } while (!allocateNow(buffer));
}

bool MbPoolManager::tryAllocateRegion(MbBufferImp* buffer) {
    const LkGuard guard(_mutex);
    return _nbSeeking == 0 && allocateNow(buffer);  // who seeks room has made what there is
}

bool MbPoolManager::allocateNow(MbBufferImp* buffer) {
    _notes->reserve(_nbRegions + 1);
    if (!performAllocate(buffer)) return false;
    ++_nbRegions;
    _bytesInUse += buffer->getRegion().getBlockBytes();
    return true;
}

/// Unloads one buffer, or waits for a change.
void MbPoolManager::makeRoom(Guard& guard) {
    _pulse.reset();  // before looking: what comes later ends the wait
    const std::exception_ptr failure = _notes->applyTo(*_strategy);
    if (MbBufferImp* const victim = _strategy->isEmpty() ? nullptr : _strategy->selectVictim()) {
        evict(*victim, guard);
        return;
    }
    if (failure) std::rethrow_exception(failure);
    waitForRoom(guard);
}

void MbPoolManager::evict(MbBufferImp& victim, Guard& guard) {
    RCShdEngPtr<MbBufferImp> held = victim.tryHold();
    if (held == nullptr) {  // its last holder is gone: being destroyed, it makes room by itself
        MbUnloadNotes::withdraw(*_strategy, victim);
        return;
    }
    guard.unlock();
    held->unload();
    held.reset();  // may destroy it, which takes the mutex
    guard.lock();
}

void MbPoolManager::waitForRoom(Guard& guard) {
    if (_nbRegions == 0) {  // nothing is handed out, so nothing can come back
        throw MbEx::ExNotEnoughMemory(ORV_FILE, __LINE__, "Buffer does not fit into empty pool.");
    }
    const Counted waiting(_nbWaiting);
    _pulse.wait(guard);
}

void MbPoolManager::deallocateRegion(MbBufferImp* buffer) {
    const LkGuard guard(_mutex);
    // A buffer without memory is in no list. What the strategy refuses stays noted for others.
    static_cast<void>(_notes->applyTo(*_strategy));
    _bytesInUse -= buffer->getRegion().getBlockBytes();
    performDeallocate(buffer);
    --_nbRegions;
    _pulse.pulse();
}

void MbPoolManager::bufferNotUnloadable(MbBufferImp* buffer) {
    _notes->note(*buffer, false);
}

void MbPoolManager::bufferUnloadable(MbBufferImp* buffer) {
    _notes->note(*buffer, true);
    // In one order with the count: either it is seen here, or who seeks sees the note.
    if (_nbSeeking != 0) _pulse.pulse();
}

// -------------------------------------------------------------------------------------- buffers

void MbPoolManager::bufferCreated(MbBufferImp* buffer) {
    const LkGuard guard(_listLock);
    buffer->getPoolEntry().next = _firstBuffer;
    if (_firstBuffer != nullptr) _firstBuffer->getPoolEntry().previous = buffer;
    _firstBuffer = buffer;
    ++_nbBuffers;
}

void MbPoolManager::bufferDestroyed(MbBufferImp* buffer) {
    const LkGuard guard(_listLock);
    MbBufferImp* const previous = buffer->getPoolEntry().previous;
    MbBufferImp* const next = buffer->getPoolEntry().next;
    if (previous != nullptr) {
        previous->getPoolEntry().next = next;
    } else {
        _firstBuffer = next;
    }
    if (next != nullptr) next->getPoolEntry().previous = previous;
    --_nbBuffers;
    _countsOfGone += buffer->getStatistics();
}

MbManagerStatistics MbPoolManager::getStatistics() const {
    MbManagerStatistics result;
    const LkGuard guard(_listLock);
    result.nbBuffers = _nbBuffers;
    result.bytesInUse = getBytesInUse();
    result.nbWaiting = _nbWaiting;
    result.counts = _countsOfGone;
    for (MbBufferImp* buffer = _firstBuffer; buffer != nullptr;
         buffer = buffer->getPoolEntry().next) {
        result.nbLoaded += buffer->isLoaded();
        result.nbLocked += buffer->isLocked();
        result.counts += buffer->getStatistics();
    }
    return result;
}

void MbPoolManager::dump(std::ostream& stream) const {
    const LkGuard guard(_mutex);
    static_cast<void>(_notes->applyTo(*_strategy));
    stream << "Name = " << _name << "\nUnload strategy = ";
    _strategy->dump(stream);
}

}  // namespace Orv
