#pragma once

#include "lkInPlace.h"
#include "resmgtApi.h"

namespace Orv {

/// A slot that holds one value per thread: made when a thread first asks for it, deleted when that
/// thread ends, whoever started the thread, or when the slot goes.
///
/// For a typed value take MtSpecificData<T>.
///
/// - Threads: any thread may ask for its own value. Destroy the slot when nobody uses it any more.
/// - Deleters run without a lock and may use other slots and log; what they make is deleted, too.
class ORV_RESMGT_API MtOpaqueData {
public:
    using Deleter = void (*)(void* value);

    MtOpaqueData(const MtOpaqueData&) = delete;
    MtOpaqueData& operator=(const MtOpaqueData&) = delete;

    const char* getName() const noexcept { return _name; }

protected:
    /// @param name  shown in errors; borrowed, must outlive the slot.
    /// @param deleter  called once for each value, on the thread that ends or destroys the slot.
    MtOpaqueData(const char* name, Deleter deleter);
    virtual ~MtOpaqueData();

    /// The calling thread's value, made if it has none.
    /// @throws MtEx::ExNoContent if none could be made; what making it throws.
    void* getPointee() const;

    void* getSpecific() const noexcept;  ///< The calling thread's value, or null.
    bool isNull() const noexcept;        ///< Whether the calling thread has no value.

    /// Gives the calling thread, which must have none, a value; it is deleted if that fails.
    /// @throws std::bad_alloc, SysAssertionFailed
    void setSpecific(void* value) const;

    /// Deletes the calling thread's value, if it has one.
    void performDelete() const;

    /// Makes the calling thread's value and stores it with setSpecific(); null if there is none.
    virtual void* createSpecific() const = 0;

private:
    friend class MtSpecificDataRegistry;
    class Native;  // MtOpaqueDataPosix or MtOpaqueDataWindows

    const char* _name;
    Deleter _deleter;
    mutable LkInPlace<Native, 16> _native;
};

}  // namespace Orv
