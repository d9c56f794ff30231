#include <algorithm>

#include "assertions.h"
#include "mbBufferImp.h"
#include "mbUnloadNotesPrivate.h"
#include "mbUnloadStrategy.h"

namespace Orv {

namespace {

/// Orders what threads do, without memory that they would share: the processor's time-stamp counter,
/// which all its cores have in common. Where that is not so, the order is only nearly right, and
/// nothing but the choice of a victim depends on it.
std::uint64_t now() noexcept {
    return __builtin_ia32_rdtsc() | 1;  // never 0
}

}  // namespace

MbUnloadNotes::~MbUnloadNotes() = default;

void MbUnloadNotes::note(MbBufferImp& buffer, bool isUnloadable) noexcept {
    MbPoolEntry& entry = buffer.getPoolEntry();
    // In one order with takeAll(): either it sees this stamp, or the flag is found cleared here.
    entry.unloadableSince.store(isUnloadable ? now() : 0, std::memory_order_seq_cst);
    if (!entry.isNoted.load(std::memory_order_seq_cst)) push(buffer);
}

void MbUnloadNotes::push(MbBufferImp& buffer) noexcept {
    MbPoolEntry& entry = buffer.getPoolEntry();
    if (entry.isNoted.exchange(true, std::memory_order_seq_cst)) return;
    MbBufferImp* first = _first.load(std::memory_order_relaxed);
    do {
        entry.nextNoted = first;
    } while (!_first.compare_exchange_weak(first, &buffer, std::memory_order_seq_cst,
                                           std::memory_order_relaxed));
}

void MbUnloadNotes::takeAll() noexcept {
    MbBufferImp* next = _first.exchange(nullptr, std::memory_order_seq_cst);
    while (next != nullptr) {
        MbBufferImp* const buffer = next;
        MbPoolEntry& entry = buffer->getPoolEntry();
        next = entry.nextNoted;
        entry.isNoted.store(false, std::memory_order_seq_cst);
        _batch.push_back({entry.unloadableSince.load(std::memory_order_seq_cst), buffer});
    }
}

std::exception_ptr MbUnloadNotes::applyTo(MbUnloadStrategy& strategy) noexcept {
    std::exception_ptr failure;
    takeAll();
    std::sort(_batch.begin(), _batch.end(),
              [](const Note& left, const Note& right) { return left.since < right.since; });
    for (const Note& note : _batch) {
        MbPoolEntry& entry = note.buffer->getPoolEntry();
        if (entry.insertedSince == note.since) continue;
        withdraw(strategy, *note.buffer);
        if (note.since == 0) continue;
        try {
            strategy.insertBuffer(note.buffer);
            entry.insertedSince = note.since;
        } catch (...) {
            failure = std::current_exception();
            push(*note.buffer);
        }
    }
    _batch.clear();
    return failure;
}

void MbUnloadNotes::withdraw(MbUnloadStrategy& strategy, MbBufferImp& buffer) noexcept {
    if (std::exchange(buffer.getPoolEntry().insertedSince, 0) == 0) return;
    try {
        strategy.removeBuffer(&buffer);
    } catch (...) {
        Assertions::traceCurrentException("removing a buffer from its unload strategy");
    }
}

}  // namespace Orv
