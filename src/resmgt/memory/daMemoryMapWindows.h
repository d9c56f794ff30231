#pragma once

#include <cstdint>
#include <string>

#include "daPages.h"

namespace Orv {

/// A named section backed by the paging file, mapped while the object lives. The system keeps it as
/// long as some process has it open.
class DaMemoryMapWindows {
public:
    /// @throws ExSysError with nothing left behind
    DaMemoryMapWindows(const std::string& name, std::uint64_t size, DaPages pages);
    ~DaMemoryMapWindows();

    DaMemoryMapWindows(const DaMemoryMapWindows&) = delete;
    DaMemoryMapWindows& operator=(const DaMemoryMapWindows&) = delete;

    void* getMemory() const noexcept { return _memory; }

private:
    void* _section = nullptr;  // HANDLE
    void* _memory = nullptr;

    bool tryHuge(const std::wstring& name, std::uint64_t size);
    bool open(const std::wstring& name, std::uint64_t size, bool isHuge);
    void close() noexcept;
};

}  // namespace Orv
