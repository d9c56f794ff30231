#pragma once

#include <windows.h>

namespace Orv {

/// Keeps the DLL that holds @p address loaded until the process ends: its threads may still run and
/// its objects still be in use when whoever loaded it lets go.
inline bool pinModule(const void* address) noexcept {
    HMODULE module = nullptr;
    return ::GetModuleHandleExA(
               GET_MODULE_HANDLE_EX_FLAG_FROM_ADDRESS | GET_MODULE_HANDLE_EX_FLAG_PIN,
               static_cast<LPCSTR>(address), &module) != FALSE;
}

}  // namespace Orv
