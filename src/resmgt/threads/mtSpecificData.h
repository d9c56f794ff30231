#pragma once

#include "mtOpaqueData.h"

namespace Orv {

/// A @p T for each thread, made with its default constructor when the thread first asks for it and
/// deleted when the thread ends. What thread_local is not: a member of an object, and safe across
/// libraries on every platform.
///
/// - Threads: as MtOpaqueData.
template <class T>
class MtSpecificData : public MtOpaqueData {
public:
    /// @param name  shown in errors; borrowed, must outlive the slot.
    explicit MtSpecificData(const char* name) : MtOpaqueData(name, deleteValue) {}

    /// The calling thread's value.
    T& get() const { return *static_cast<T*>(getPointee()); }
    T& operator*() const { return get(); }
    T* operator->() const { return &get(); }

    /// The calling thread's value if it has one by now, else null.
    T* find() const noexcept { return static_cast<T*>(getSpecific()); }

    void reset() const { performDelete(); }  ///< Deletes the calling thread's value.

private:
    void* createSpecific() const override {
        T* const value = new T;
        setSpecific(value);
        return value;
    }

    static void deleteValue(void* value) { delete static_cast<T*>(value); }
};

}  // namespace Orv
