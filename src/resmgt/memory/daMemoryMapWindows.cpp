#include "daMemoryMapWindows.h"

#include <windows.h>

#include "daHugePagesWindows.h"
#include "exSysError.h"
#include "formatText.h"
#include "osError.h"
#include "sourceFile.h"

namespace Orv {

namespace {

/// The section's name: apart from those of other objects, and different for different bytes.
std::wstring objectOf(const std::string& name) {
    std::wstring object = L"Local\\orv.map.";
    for (const char character : name) object += static_cast<unsigned char>(character);
    return object;
}

}  // namespace

DaMemoryMapWindows::DaMemoryMapWindows(const std::string& name, std::uint64_t size, DaPages pages) {
    const std::wstring object = objectOf(name);
    if (pages != DaPages::NORMAL && tryHuge(object, size)) return;
    if (pages != DaPages::HUGE_ONLY && open(object, size, false)) return;
    const int osError = OsError::getLast();
    throw ExSysError(ORV_FILE, __LINE__, formatText("mapping \"%s\"", name.c_str()).c_str(),
                     osError);
}

DaMemoryMapWindows::~DaMemoryMapWindows() {
    close();
}

bool DaMemoryMapWindows::tryHuge(const std::wstring& name, std::uint64_t size) {
    const std::uint64_t wholePages = DaHugePagesWindows::roundUp(size);
    return wholePages > 0 && DaHugePagesWindows::enable() && open(name, wholePages, true);
}

/// Creates or joins the section and maps it; else leaves nothing but the OS error.
bool DaMemoryMapWindows::open(const std::wstring& name, std::uint64_t size, bool isHuge) {
    const DWORD protection = PAGE_READWRITE | SEC_COMMIT | (isHuge ? SEC_LARGE_PAGES : 0);
    _section = ::CreateFileMappingW(INVALID_HANDLE_VALUE, nullptr, protection,
                                    static_cast<DWORD>(size >> 32), static_cast<DWORD>(size),
                                    name.c_str());
    if (_section == nullptr) return false;
    // Fails if the section is an older and smaller one.
    const DWORD access = FILE_MAP_ALL_ACCESS | (isHuge ? FILE_MAP_LARGE_PAGES : 0);
    _memory = ::MapViewOfFile(_section, access, 0, 0, size);
    if (_memory != nullptr) return true;
    const DWORD osError = ::GetLastError();
    close();
    ::SetLastError(osError);
    return false;
}

void DaMemoryMapWindows::close() noexcept {
    if (_memory != nullptr) ::UnmapViewOfFile(_memory);
    if (_section != nullptr) ::CloseHandle(_section);
    _memory = nullptr;
    _section = nullptr;
}

}  // namespace Orv
