#pragma once

#include <cstdint>
#include <string>

#include "daPages.h"

namespace Orv {

/// Named shared memory of this user, mapped while the object lives.
///
/// It is a file of /dev/shm on which every user holds a shared lock; the kernel drops the lock with
/// its process. So whoever gets the lock exclusively is alone: on opening, what the file holds is
/// stale and is dropped; on closing, the file goes.
class DaMemoryMapPosix {
public:
    /// @throws ExSysError with nothing left behind
    DaMemoryMapPosix(const std::string& name, std::uint64_t size, DaPages pages);
    ~DaMemoryMapPosix();

    DaMemoryMapPosix(const DaMemoryMapPosix&) = delete;
    DaMemoryMapPosix& operator=(const DaMemoryMapPosix&) = delete;

    void* getMemory() const noexcept { return _memory; }

private:
    std::string _file;  // name of the shared-memory object
    int _descriptor = -1;
    void* _memory = nullptr;
    std::uint64_t _size;

    void open();
    bool join(bool& isNew);
    void create();
    void map(DaPages pages);
    void close() noexcept;
    [[noreturn]] void fail(int line, const char* step, int osError);
};

}  // namespace Orv
