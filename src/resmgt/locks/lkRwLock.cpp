#include "lkRwLock.h"

#include <ostream>

#include "assertions.h"

namespace Orv {

namespace {

constexpr auto relaxed = std::memory_order_relaxed;
constexpr auto acquire = std::memory_order_acquire;

/// Leaves the word alone for a while: who has it gets more done than if both want it all the time.
void backOff() noexcept {
    for (int i = 0; i < 6; ++i) __builtin_ia32_pause();
}

/// Makes up to @p tries attempts, 0 being very many, within the while that a wait may look.
template <class Attempt>
bool spin(unsigned tries, Attempt attempt) {
    LkAdaptiveWait::Look look;
    do {
        if (attempt()) return true;
    } while (--tries != 0 && LkAdaptiveWait::mayLook() && look.goesOn());
    return false;
}

/// Counts a waiting thread and shows the flag for as long as there is one.
class Waiting {
public:
    Waiting(std::uint32_t& number, std::atomic<std::uint32_t>& word, std::uint32_t flag)
        : _number(number), _word(word), _flag(flag) {
        if (_number++ == 0) _word.fetch_or(_flag, std::memory_order_acq_rel);
    }
    ~Waiting() {
        if (--_number == 0) _word.fetch_and(~_flag, std::memory_order_acq_rel);
    }
    Waiting(const Waiting&) = delete;
    Waiting& operator=(const Waiting&) = delete;

private:
    std::uint32_t& _number;
    std::atomic<std::uint32_t>& _word;
    const std::uint32_t _flag;
};

}  // namespace

LkRwLock::LkRwLock(const char* name)
    : _mutex(name),
      _readersPulse(name, LkPulse::WAKE_ALL),
      _writersPulse(name, LkPulse::WAKE_ONE) {}

LkRwLock::LkRwLock(const char* name, const LkMutexAttr&) : LkRwLock(name) {}

// --- reading ---

bool LkRwLock::tryReadLock() const noexcept {
    std::uint32_t word = _word.load(relaxed);
    while ((word & (WRITER | WRITERS_WAIT)) == 0) {
        if (_word.compare_exchange_weak(word, word + READER, acquire, relaxed)) return true;
    }
    return false;
}

bool LkRwLock::readLock() const {
    // Counting first and asking afterwards takes one access to a word that other readers change,
    // too.
    const std::uint32_t word = _word.fetch_add(READER, acquire);
    if ((word & (WRITER | WRITERS_WAIT)) == 0) return true;
    release(READER);
    const auto tryAgain = [this] {
        backOff();
        return tryReadLock();
    };
    if (!_readersWait.look(tryAgain)) waitToRead();
    return true;
}

bool LkRwLock::spinReadLock(unsigned tries) const {
    return spin(tries, [this] { return tryReadLock(); }) || readLock();
}

void LkRwLock::waitToRead() const {
    const LkGuard guard(_mutex);
    const Waiting waiting(_nbWaitingReaders, _word, READERS_WAIT);
    while (!tryReadLock()) {
        _readersPulse.reset();
        _readersPulse.wait(guard);
    }
}

// --- writing ---

bool LkRwLock::tryWriteLock() noexcept {
    std::uint32_t word = _word.load(relaxed);
    while ((word & HOLDERS) == 0) {
        if (_word.compare_exchange_weak(word, word | WRITER, acquire, relaxed)) return true;
    }
    return false;
}

bool LkRwLock::writeLock() {
    const auto tryAgain = [this] {
        backOff();
        return tryWriteLock();
    };
    if (!tryWriteLock() && !_writersWait.look(tryAgain)) waitToWrite();
    return true;
}

bool LkRwLock::spinWriteLock(unsigned tries) {
    return spin(tries, [this] { return tryWriteLock(); }) || writeLock();
}

void LkRwLock::waitToWrite() {
    const LkGuard guard(_mutex);
    const Waiting waiting(_nbWaitingWriters, _word, WRITERS_WAIT);
    while (!tryWriteLock()) {
        _writersPulse.wait(guard);
        _isWriterWoken = false;
    }
}

// --- releasing ---

void LkRwLock::unlock() const {
    const std::uint32_t word = _word.load(relaxed);
    ORV_ASSERT_TEXT((word & HOLDERS) != 0, "_state != 0");
    release((word & WRITER) != 0 ? WRITER : READER);
}

/// @param holder  who goes: a writer, or a reader, which may have counted itself in vain.
void LkRwLock::release(std::uint32_t holder) const {
    std::uint32_t word = _word.load(relaxed);
    for (;;) {
        const std::uint32_t next = word - holder;
        if ((next & HOLDERS) == 0 && next != FREE) return releaseForWaiters(holder);
        // From here on the lock may be gone.
        if (_word.compare_exchange_strong(word, next, std::memory_order_release, relaxed)) return;
        backOff();
        word = _word.load(relaxed);
    }
}

/// Those who wait cannot go on before this has released the mutex, so they are still here.
void LkRwLock::releaseForWaiters(std::uint32_t holder) const {
    const LkGuard guard(_mutex);
    const std::uint32_t next = _word.fetch_sub(holder, std::memory_order_acq_rel) - holder;
    if ((next & HOLDERS) == 0) wakeNext();
}

void LkRwLock::wakeNext() const {
    if (_nbWaitingWriters > 0) {
        // One on its way looks again by itself; a second pulse would be left over.
        if (!_isWriterWoken) {
            _isWriterWoken = true;
            _writersPulse.pulse();
        }
    } else if (_nbWaitingReaders > 0) {
        _readersPulse.pulse();
    }
}

// --- asking ---

bool LkRwLock::isLocked() const noexcept {
    return (_word.load(relaxed) & HOLDERS) != 0;
}

void LkRwLock::dump(std::ostream& stream) const {
    const LkGuard guard(_mutex);
    const std::uint32_t word = _word.load(relaxed);
    const int state = (word & WRITER) != 0 ? -1 : static_cast<int>(word & READERS);
    stream << "name " << getName() << " rwLock " << state << " wr wait " << _nbWaitingWriters
           << " rd wait " << _nbWaitingReaders;
}

}  // namespace Orv
