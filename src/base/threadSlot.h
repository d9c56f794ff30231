#pragma once

#include <atomic>

#include "baseApi.h"

namespace Orv {

/// A pointer of each thread, and a function that is called with it at the thread's very end,
/// whoever started the thread.
///
/// Thread-local variables of the language will not do: on Windows their memory may go before the
/// thread's last destructors run, and comes back empty when one of these touches it.
///
/// - Threads: each sees its own pointer.
/// - Ownership: a slot lives as long as the process; make it constinit, or never destroy it.
class ORV_BASE_API ThreadSlot {
public:
    /// Whose slot it is, one for each. At a thread's end they are told in this order, and again if
    /// later ones have filled slots anew.
    enum Owner { THREADS, THREAD_DATA, WAITS, LOG, NB_OWNERS };

    /// Called on the thread that ends, if its pointer is not null; the slot is empty by then.
    using AtEnd = void (*)(void* value) noexcept;

    explicit constexpr ThreadSlot(Owner owner, AtEnd atEnd = nullptr) noexcept
        : _owner(owner), _atEnd(atEnd) {}

    ThreadSlot(const ThreadSlot&) = delete;
    ThreadSlot& operator=(const ThreadSlot&) = delete;

    void* get() const noexcept;  ///< Null before set().

    /// @return false, without an effect, once the thread's end has been dealt with, so that nobody
    ///   would be told.
    /// @throws SysAssertionFailed where the system has no room for the thread's first pointer.
    bool set(void* value);

    /// Whether the calling thread's end has been dealt with, though it still runs.
    static bool hasEnded() noexcept;

private:
    struct Values;
    struct Platform;

    const Owner _owner;
    const AtEnd _atEnd;

    static std::atomic<AtEnd> _atEnds[NB_OWNERS];

    static void tellAll(Values& values) noexcept;

    // The platform's
    static Values* find() noexcept;  // null if the calling thread is not watched
    static Values& watch();          // has its end noticed
};

/// The pointers of one thread that is watched.
struct ThreadSlot::Values {
    void* pointers[NB_OWNERS];
    bool hasEnded;
};

}  // namespace Orv
