#include <windows.h>

#include "formatText.h"
#include "osError.h"

namespace Orv {

int OsError::getLast() noexcept {
    return static_cast<int>(::GetLastError());
}

std::string OsError::getText(int code) {
    char text[512];
    DWORD length =
        ::FormatMessageA(FORMAT_MESSAGE_FROM_SYSTEM | FORMAT_MESSAGE_IGNORE_INSERTS, nullptr,
                         static_cast<DWORD>(code), 0, text, sizeof text, nullptr);
    while (length > 0 && (text[length - 1] == '\n' || text[length - 1] == '\r')) --length;
    return length > 0 ? std::string(text, length) : formatText("unknown error %d", code);
}

}  // namespace Orv
