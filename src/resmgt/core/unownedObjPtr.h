#pragma once

#include <compare>
#include <cstddef>

#include "rcExUtil.h"

namespace Orv {

/// Borrowed object, or null: for containers that refer to objects that somebody else owns.
template <class T>
class UnownedObjPtr {
public:
    UnownedObjPtr() noexcept = default;
    UnownedObjPtr(T* object) noexcept : _object(object) {}

    T& operator*() const { return *getChecked(); }  ///< @throws RCEx::ExNullPtr
    T* operator->() const { return getChecked(); }  ///< @throws RCEx::ExNullPtr
    T* get() const noexcept { return _object; }
    bool isNull() const noexcept { return _object == nullptr; }
    explicit operator bool() const noexcept { return _object != nullptr; }

    friend auto operator<=>(const UnownedObjPtr&, const UnownedObjPtr&) noexcept = default;

private:
    T* _object = nullptr;

    T* getChecked() const {
        if (_object == nullptr) RCExUtil::throwExNullPtr();
        return _object;
    }
};

}  // namespace Orv
