#include "lgFileWindows.h"

#include <algorithm>
#include <windows.h>

#include "exSysErrorWindows.h"
#include "sourceFile.h"

namespace Orv {

namespace {

int lastError() noexcept {
    return static_cast<int>(::GetLastError());
}

/// Writes all of the text where the handle stands. @return 0 or the error.
int writeAll(HANDLE handle, std::string_view text) noexcept {
    while (!text.empty()) {
        const auto length = static_cast<DWORD>(std::min<std::size_t>(text.size(), 1U << 20));
        DWORD written = 0;
        if (!::WriteFile(handle, text.data(), length, &written, nullptr)) return lastError();
        if (written == 0) return ERROR_DISK_FULL;
        text.remove_prefix(written);
    }
    return 0;
}

int seek(HANDLE handle, std::int64_t offset) noexcept {
    LARGE_INTEGER position;
    position.QuadPart = offset;
    return ::SetFilePointerEx(handle, position, nullptr, FILE_BEGIN) ? 0 : lastError();
}

}  // namespace

LgFileWindows::LgFileWindows(const std::filesystem::path& path)
    : _handle(::CreateFileW(path.c_str(), GENERIC_WRITE, FILE_SHARE_READ | FILE_SHARE_DELETE,
                            nullptr, CREATE_ALWAYS, FILE_ATTRIBUTE_NORMAL, nullptr)) {
    if (_handle == INVALID_HANDLE_VALUE) {
        const int error = lastError();
        throw ExSysErrorWindows(ORV_FILE, __LINE__, ("open of " + describe(path)).c_str(), error);
    }
}

LgFileWindows::~LgFileWindows() {
    ::CloseHandle(_handle);
}

int LgFileWindows::append(std::string_view text) noexcept {
    return writeAll(_handle, text);
}

int LgFileWindows::writeAt(std::int64_t offset, std::string_view text) noexcept {
    const int error = seek(_handle, offset);
    return error != 0 ? error : writeAll(_handle, text);
}

int LgFileWindows::truncate(std::int64_t length) noexcept {
    const int error = seek(_handle, length);
    if (error != 0) return error;
    return ::SetEndOfFile(_handle) ? 0 : lastError();
}

int LgFileWindows::writeToStandardError(std::string_view text) noexcept {
    const HANDLE handle = ::GetStdHandle(STD_ERROR_HANDLE);
    if (handle == nullptr || handle == INVALID_HANDLE_VALUE) return 0;  // a program without console
    return writeAll(handle, text);
}

std::string LgFileWindows::describe(const std::filesystem::path& path) {
    const std::u8string text = path.u8string();
    return {text.begin(), text.end()};
}

}  // namespace Orv
