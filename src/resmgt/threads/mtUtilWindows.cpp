#include <cstdint>
#include <cstdio>
#include <windows.h>

#include "mtUtil.h"
#include "osError.h"
#include "trace.h"

namespace Orv {

namespace {

void printError(const char* step) {
    std::fprintf(stderr, "%s: %s\n", step, OsError::describe(OsError::getLast()).c_str());
}

/// A file in the temporary folder that goes with its handle.
HANDLE openProbeFile() {
    char folder[MAX_PATH + 1];
    char path[MAX_PATH + 1];
    if (::GetTempPathA(sizeof folder, folder) == 0 ||
        ::GetTempFileNameA(folder, "orv", 0, path) == 0) {
        return INVALID_HANDLE_VALUE;
    }
    return ::CreateFileA(path, GENERIC_READ | GENERIC_WRITE | DELETE, 0, nullptr, CREATE_ALWAYS,
                         FILE_ATTRIBUTE_TEMPORARY | FILE_FLAG_DELETE_ON_CLOSE, nullptr);
}

/// Whether the system can read the byte: 1 or 0, or -1 after another error.
int probe(HANDLE file, const char* byte) {
    DWORD nbWritten = 0;
    ::SetFilePointer(file, 0, nullptr, FILE_BEGIN);
    if (::WriteFile(file, byte, 1, &nbWritten, nullptr)) return 1;
    const DWORD error = ::GetLastError();
    if (error == ERROR_NOACCESS || error == ERROR_INVALID_USER_BUFFER) return 0;
    printError("testWritable");
    return -1;
}

/// Calls the action with each region of memory that the process has committed and may touch.
template <class Action>
void forEachRegion(Action action) {
    MEMORY_BASIC_INFORMATION region;
    const char* address = nullptr;
    while (::VirtualQuery(address, &region, sizeof region) == sizeof region) {
        constexpr DWORD untouchable = PAGE_NOACCESS | PAGE_GUARD;
        if (region.State == MEM_COMMIT && (region.Protect & untouchable) == 0) {
            action(region.BaseAddress, region.RegionSize);
        }
        address = static_cast<const char*>(region.BaseAddress) + region.RegionSize;
    }
}

/// The system locks no more than fits into the least working set.
void makeRoomForLocks() {
    SIZE_T nbBytes = 0;
    forEachRegion([&](void*, SIZE_T size) { nbBytes += size; });
    SIZE_T least = 0;
    SIZE_T most = 0;
    if (!::GetProcessWorkingSetSize(::GetCurrentProcess(), &least, &most)) return;
    ::SetProcessWorkingSetSize(::GetCurrentProcess(), least + nbBytes, most + nbBytes);
}

}  // namespace

int MtUtil::getNbProcessors() {
    SYSTEM_INFO system;
    ::GetSystemInfo(&system);
    return static_cast<int>(system.dwNumberOfProcessors);
}

int MtUtil::testWritable(const void* address, int length) {
    const HANDLE file = openProbeFile();
    if (file == INVALID_HANDLE_VALUE) return 0;
    SYSTEM_INFO system;
    ::GetSystemInfo(&system);
    const std::uintptr_t pageSize = system.dwPageSize;
    const auto first = reinterpret_cast<std::uintptr_t>(address);
    int result = 1;
    std::uintptr_t offset = 0;  // of the byte to probe: the first one of each page
    while (result == 1 && length > 0 && offset < static_cast<std::uintptr_t>(length)) {
        result = probe(file, static_cast<const char*>(address) + offset);
        offset += pageSize - (first + offset) % pageSize;
    }
    if (!::CloseHandle(file)) printError("testWritable close");
    return result;
}

/// What is committed later is not locked: here that can only be asked for region by region.
void MtUtil::lockProcessMemory() {
    makeRoomForLocks();
    SIZE_T nbRefused = 0;
    int error = 0;
    forEachRegion([&](void* start, SIZE_T size) {
        if (::VirtualLock(start, size)) return;
        nbRefused += size;
        error = OsError::getLast();
    });
    if (nbRefused == 0) return;
    ORV_TRACE(TraceLevel::getMain()) << "Process memory not locked, not available under NT4.0.";
    ORV_TRACE(TraceLevel::getMain())
        << "Not locked are " << nbRefused << " bytes: " << OsError::describe(error) << ".";
}

void MtUtil::unlockProcessMemory() {}

}  // namespace Orv
