#pragma once

namespace Orv {

/// A pointer of each thread, whose end is noticed. One object per process.
///
/// The compiler's own thread-local variables will not do: here their memory may go before the
/// thread's last destructors run, and comes back, to stay, when one of these touches it.
class LgThreadSlotWindows {
public:
    /// What get() gives once the thread's end has been noticed, while the thread still runs.
    static void* const ENDED;

    /// @param threadEnds  called with the value on each thread that ends after set().
    explicit LgThreadSlotWindows(void (*threadEnds)(void* value));

    void* get() const noexcept;  ///< Null before set().
    void set(void* value);       ///< Once per thread. @throws SysAssertionFailed

private:
    static void notice(void* value);

    static void (*_threadEnds)(void*);
    static unsigned long _slot;  // holds the value
    unsigned long _endSlot;      // holds it, too, and has a callback for the thread's end
};

}  // namespace Orv
