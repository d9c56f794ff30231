#pragma once

#include <type_traits>

#include "baseApi.h"
#include "lkCounter.h"

namespace Orv {

template <class T>
class RCBasePtr;

/// Base of objects that live as long as some counted pointer (RCShdPtr and kin) holds them.
///
/// An object is made with `new` and has no holder until the first pointer takes it; the pointer
/// that lets go last destroys it. Never delete it, nor keep a raw pointer without a counted one.
/// RCBaseWithDestroy recycles instead of deleting; RCProxy counts a type that has no such base.
///
/// - Threads: with @p C = LkCounter<long>, any thread may take and release, and whoever destroys
///   the object sees what all other holders wrote to it. With @p C = int, one thread at a time.
/// - A destructor may put its own object into counted pointers; it is still destroyed once.
template <class C>
class ORV_HEADER_API RCBase {
    static_assert(std::is_same_v<C, int> || std::is_same_v<C, LkCounter<long>>);

public:
    virtual ~RCBase() noexcept(false) {}

protected:
    RCBase() noexcept = default;
    RCBase(const RCBase&) noexcept {}                            ///< The copy has no holder yet.
    RCBase& operator=(const RCBase&) noexcept { return *this; }  ///< Holders stay.

    // For the pointers, and for a class that counts its own way, which hides them.

    void incReferenceCount() const noexcept { ++_count; }

    void decReferenceCount() const {
        if (--_count == 0) destroyUnheld();
    }

    int getReferenceCount() const noexcept { return read(_count); }

    void destroyUnheld() const {
        write(_count, BEING_DESTROYED);
        delete this;
    }

private:
    template <class T>
    friend class RCBasePtr;
    template <class>
    friend class RCBaseWithDestroy;

    // Far from 0, so that pointers made by the destructor do not reach it again.
    static constexpr int BEING_DESTROYED = 0x40000000;

    mutable C _count{0};

    static int read(int count) noexcept { return count; }
    static int read(const LkCounter<long>& count) noexcept {
        return static_cast<int>(count.getValue());
    }
    static void write(int& count, int value) noexcept { count = value; }
    static void write(LkCounter<long>& count, int value) noexcept { count.setUnshared(value); }
};

}  // namespace Orv
