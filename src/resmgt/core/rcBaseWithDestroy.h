#pragma once

#include "rcBase.h"

namespace Orv {

/// Like RCBase, but an object that nobody holds any more is handed to its own destroy(), which may
/// recycle it instead of deleting it.
///
/// - Threads: as RCBase; destroy() runs on the thread that let go last.
/// - A destroy() that keeps the object may put it into a counted pointer at once or later; one that
///   ends it calls deleteThis().
template <class C>
class ORV_HEADER_API RCBaseWithDestroy {
public:
    virtual ~RCBaseWithDestroy() noexcept(false) {}

protected:
    RCBaseWithDestroy() noexcept = default;
    RCBaseWithDestroy(const RCBaseWithDestroy&) noexcept {}  ///< The copy has no holder yet.
    RCBaseWithDestroy& operator=(const RCBaseWithDestroy&) noexcept { return *this; }

    /// Deletes the object. Unlike `delete this` it lets the destructor put the object into counted
    /// pointers without destroying it twice.
    void deleteThis() {
        RCBase<C>::write(_count, RCBase<C>::BEING_DESTROYED);
        delete this;
    }

private:
    template <class T>
    friend class RCBasePtr;

    C _count{0};

    virtual void destroy() { deleteThis(); }

    void incReferenceCount() noexcept { ++_count; }

    void decReferenceCount() {
        if (--_count == 0) destroy();
    }

    int getReferenceCount() const noexcept { return RCBase<C>::read(_count); }
};

}  // namespace Orv
