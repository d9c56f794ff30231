#pragma once

#include <memory>
#include <string>

#include "daArenaAllocator.h"
#include "daPages.h"
#include "objPtr.h"

namespace Orv {

/// One block of memory under a name: whoever allocates under the same name gets the same memory, in
/// this process or another one of the same user.
///
/// The first to allocate sets the size and finds zeros; later ones may map as much or less of it.
/// The memory lives until the last of them has deallocated it or has ended. Keep it apart: one
/// process may carve it up with an arena, the others only look at what they are told of.
///
/// - Threads: one at a time.
/// - Linux: a process that dies as the last user leaves the memory behind, in /dev/shm; the next to
///   allocate under the name, with any size, starts afresh in it.
/// - Huge pages: on Linux they can be had for named memory, not guaranteed, so HUGE_ONLY fails; on
///   Windows the user needs the right to lock pages in memory.
class ORV_RESMGT_API DaMemoryMapAllocator : public DaArenaAllocator {
public:
    /// @param name  not null or empty (else an assertion), copied; backslashes count as slashes.
    static ObjPtrRet<DaMemoryMapAllocator> create(const char* name,
                                                  DaPages pages = DaPages::NORMAL);

    /// Gives what is still allocated back.
    ~DaMemoryMapAllocator() override;

    const std::string& getName() const noexcept { return _name; }

    /// Creates the memory or joins the one there is; all of it is there when the call returns.
    /// An allocator has one block at a time, else an assertion.
    /// @throws ExSysError also if the memory there is smaller than @p size.
    [[nodiscard]] void* allocate(std::uint64_t size) override;
    void deallocate(void* block, std::uint64_t size) override;

private:
    class Native;  // DaMemoryMapPosix or DaMemoryMapWindows, see daNative.h

    std::string _name;
    DaPages _pages;
    std::unique_ptr<Native> _mapping;  // null: nothing is allocated

    DaMemoryMapAllocator(std::string name, DaPages pages);
};

}  // namespace Orv
