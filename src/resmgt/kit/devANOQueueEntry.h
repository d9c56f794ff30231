#pragma once

#include <utility>

#include "devANO.h"

namespace Orv {

/// Element of every request queue: owns one notification object, or none.
///
/// Copying from an lvalue and assignment move the object, as with ObjPtr.
class DevANOQueueEntry {
public:
    DevANOQueueEntry() noexcept = default;
    explicit DevANOQueueEntry(ObjPtr<DevANO> ano) noexcept : _ano(std::move(ano)) {}

    DevANOQueueEntry(DevANOQueueEntry& other) noexcept : _ano(other._ano) {}
    DevANOQueueEntry(DevANOQueueEntry&& other) noexcept : _ano(std::move(other._ano)) {}
    DevANOQueueEntry& operator=(DevANOQueueEntry other) {
        _ano = std::move(other._ano);
        return *this;
    }

    ObjPtrRet<DevANO> release() { return ObjPtrRet<DevANO>(_ano.release()); }
    bool isEmpty() const noexcept { return _ano.isNull(); }

private:
    ObjPtr<DevANO> _ano;
};

}  // namespace Orv
