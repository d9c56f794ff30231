#pragma once

#include <iosfwd>

#include "lkInPlace.h"
#include "lkMutexAttrTypes.h"
#include "objPtr.h"
#include "resmgtApi.h"

namespace Orv {

template <class T>
class LkSingleton;

/// Attributes of a lock, given at its construction: a priority protocol, where the platform has
/// one.
///
/// Neither Windows nor Linux implements a protocol here: asking gives UNIMPLEMENTED, setting one
/// does nothing.
///
/// - Threads: set it up on one thread; afterwards any thread may read it.
class ORV_RESMGT_API LkMutexAttr : public LkMutexAttrTypes {
public:
    class Native;  // LkMutexAttrPosix or LkMutexAttrWindows

    /// @param name  shown by dump(); borrowed, must outlive the attribute.
    explicit LkMutexAttr(const char* name);
    ~LkMutexAttr();

    LkMutexAttr(const LkMutexAttr&) = delete;
    LkMutexAttr& operator=(const LkMutexAttr&) = delete;

    /// The attribute of locks that are given none, "DefaultLkMutexAttr": one for the process.
    static const LkMutexAttr& getDefaultAttr();

    bool isSetPrioProtocolImplemented() const noexcept;
    void setPrioProtocol(PrioProtocol protocol, int ceiling);
    PrioProtocol getPrioProtocol() const noexcept;
    int getPrioCeiling() const noexcept;

    const char* getName() const noexcept;
    void dump(std::ostream&) const;

    const Native& getImp() const noexcept;

private:
    friend class LkSingleton<LkMutexAttr>;

    LkInPlace<Native, 32> _native;

    static ObjPtrRet<LkMutexAttr> createInstance();
};

}  // namespace Orv
