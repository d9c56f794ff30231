#include "mtOpaqueDataWindows.h"

#include <windows.h>

#include "assertions.h"
#include "osError.h"

namespace Orv {

MtOpaqueDataWindows::MtOpaqueDataWindows() : _index(::TlsAlloc()) {
    ORV_ASSERT_SYS(_index != TLS_OUT_OF_INDEXES, "(_index = ::TlsAlloc()) != TLS_OUT_OF_INDEXES",
                   OsError::getLast());
}

MtOpaqueDataWindows::~MtOpaqueDataWindows() {
    ::TlsFree(_index);
}

// TlsGetValue() clears the thread's last error, which the caller may still want to read.
void* MtOpaqueDataWindows::getValue() const noexcept {
    const DWORD error = ::GetLastError();
    void* const value = ::TlsGetValue(_index);
    ::SetLastError(error);
    return value;
}

void MtOpaqueDataWindows::setValue(void* value) {
    ORV_ASSERT_SYS(::TlsSetValue(_index, value), "::TlsSetValue( _index, value )",
                   OsError::getLast());
}

bool MtOpaqueDataWindows::isNull() const noexcept {
    const DWORD error = ::GetLastError();
    const bool isNull = ::TlsGetValue(_index) == nullptr && ::GetLastError() == ERROR_SUCCESS;
    ::SetLastError(error);
    return isNull;
}

}  // namespace Orv
