#pragma once

#include <atomic>
#include <cstdint>

namespace Orv {

template <class T>
class LkCounter;

/// Count that any number of threads change at once, without a lock; the count of shared objects.
///
/// It is 32 bits wide on every platform and wraps. For counts of 64 bits, or other memory orders,
/// use std::atomic.
///
/// - Threads: every member may be called by any thread, inside any lock. Each is one atomic machine
///   operation, in one order that all threads agree on.
template <>
class LkCounter<long> {
public:
    explicit constexpr LkCounter(long initialValue) noexcept : _value(narrow(initialValue)) {}

    LkCounter(const LkCounter&) = delete;
    LkCounter& operator=(const LkCounter&) = delete;

    long getValue() const noexcept { return _value.load(); }

    /// Each returns the value it has set, wrapped.
    long operator=(long value) noexcept { return _value = narrow(value); }
    long operator+=(long amount) noexcept { return _value += narrow(amount); }
    long operator-=(long amount) noexcept { return _value -= narrow(amount); }
    long operator++() noexcept { return ++_value; }
    long operator--() noexcept { return --_value; }

    /// Like an assignment, for a counter that no other thread uses just now: a plain store.
    void setUnshared(long value) noexcept {
        _value.store(narrow(value), std::memory_order_relaxed);
    }

    /// Each returns the value before.
    long operator++(int) noexcept { return _value++; }
    long operator--(int) noexcept { return _value--; }

private:
    std::atomic<std::int32_t> _value;

    static constexpr std::int32_t narrow(long value) noexcept {
        return static_cast<std::int32_t>(value);
    }
};

// The compilers of both platforms make one locked instruction of each operation above, so the
// portable class is its own native class.
template <class T>
using LkCounterWindows = LkCounter<T>;
template <class T>
using LkCounterPosix = LkCounter<T>;

}  // namespace Orv
