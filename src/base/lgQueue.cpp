#include "lgQueue.h"

#include <algorithm>
#include <new>
#include <utility>

#include "assertions.h"
#include "lgClockPrivate.h"

namespace Orv {

namespace {

/// A creator that takes longer than this over one record was ended in the middle of it, and the
/// others' records wait for it no longer.
constexpr std::int64_t LONGEST_PUSH = 100'000'000;  // nanoseconds

constexpr std::size_t INLINE_TEXT = 128;

}  // namespace

struct LgQueue::Slot {
    LgRecord record;
    std::unique_ptr<char[]> longText;
    char shortText[INLINE_TEXT];

    Slot(const LgRecord& original, std::unique_ptr<char[]> ownText) noexcept
        : record(original), longText(std::move(ownText)) {
        const std::string_view text = original.text;
        char* const copy = longText ? longText.get() : shortText;
        std::ranges::copy(text, copy);
        record.text = {copy, text.size()};
    }
};

LgQueue::LgQueue(LgThread creator, std::size_t capacity)
    : _capacity(capacity), _thread(std::move(creator)) {
    ORV_ASSERT(capacity > 0 && (capacity & (capacity - 1)) == 0);
}

LgQueue::~LgQueue() {
    const std::uint64_t end = _progress.load(std::memory_order_acquire) / 2;
    for (std::uint64_t at = _head.load(std::memory_order_relaxed); at != end; ++at) {
        slotAt(at).~Slot();
    }
    ::operator delete(_slots);
}

LgQueue::Slot& LgQueue::slotAt(std::uint64_t position) const noexcept {
    return _slots[position & (_capacity - 1)];
}

bool LgQueue::isFull(std::uint64_t tail) noexcept {
    if (tail - _knownHead < _capacity) return false;
    _knownHead = _head.load(std::memory_order_acquire);
    return tail - _knownHead == _capacity;
}

/// Room for one more record, with memory of its own for a long text.
bool LgQueue::prepare(std::string_view text, std::uint64_t tail,
                      std::unique_ptr<char[]>& longText) noexcept {
    if (_slots == nullptr) {
        _slots = static_cast<Slot*>(::operator new(_capacity * sizeof(Slot), std::nothrow));
        if (_slots == nullptr) return false;
    }
    if (isFull(tail)) return false;
    if (text.size() <= INLINE_TEXT) return true;
    longText.reset(new (std::nothrow) char[text.size()]);
    return longText != nullptr;
}

bool LgQueue::push(const LgRecord& record) noexcept {
    const std::uint64_t progress = _progress.load(std::memory_order_relaxed);
    const std::uint64_t tail = progress / 2;
    std::unique_ptr<char[]> longText;
    if (!prepare(record.text, tail, longText)) {
        _nbLost.store(_nbLost.load(std::memory_order_relaxed) + 1, std::memory_order_release);
        return false;
    }
    // The reader must see that a record is being made before that record's time is read: only so
    // can it tell which records of other queues are surely earlier.
    _progress.store(progress + 1, std::memory_order_seq_cst);
    Slot* const slot = new (&slotAt(tail)) Slot(record, std::move(longText));
    slot->record.nanoseconds = LgClock::now();
    _progress.store(progress + 2, std::memory_order_seq_cst);
    return true;
}

std::int64_t LgQueue::observe(std::int64_t now) noexcept {
    _isFinalView = _isAbandoned.load(std::memory_order_acquire);
    _nbObservedLost =
        _nbLost.load(std::memory_order_acquire);  // before the look at what was pushed
    const std::uint64_t progress = _progress.load(std::memory_order_seq_cst);
    const bool isPushing = progress % 2 != 0;
    if (isPushing && progress != _observedProgress) {
        _quietUntil = std::max(_quietUntil, _observedAt);  // this record was begun after that
        _pushSeenAt = now;
    } else if (!isPushing || now - _pushSeenAt > LONGEST_PUSH) {
        _quietUntil = now;
    }
    _observedProgress = progress;
    _observedAt = now;
    return _quietUntil;
}

const LgRecord* LgQueue::front() const noexcept {
    const std::uint64_t head = _head.load(std::memory_order_relaxed);
    return head < _observedProgress / 2 ? &slotAt(head).record : nullptr;
}

void LgQueue::pop() noexcept {
    const std::uint64_t head = _head.load(std::memory_order_relaxed);
    slotAt(head).~Slot();
    _head.store(head + 1, std::memory_order_release);
}

std::uint64_t LgQueue::takeNbLost() noexcept {
    if (front() != nullptr) return 0;
    return _nbObservedLost - std::exchange(_nbReportedLost, _nbObservedLost);
}

bool LgQueue::isFinished() const noexcept {
    return _isFinalView && front() == nullptr;
}

}  // namespace Orv
