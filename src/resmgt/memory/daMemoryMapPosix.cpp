#include "daMemoryMapPosix.h"

#include <cerrno>
#include <chrono>
#include <fcntl.h>
#include <limits>
#include <sys/mman.h>
#include <sys/stat.h>
#include <thread>
#include <unistd.h>

#include "exSysError.h"
#include "formatText.h"
#include "sourceFile.h"

namespace Orv {

namespace {

/// The object's name: the user's own, and different for different names, slashes or not.
std::string fileOf(const std::string& name) {
    std::string file = formatText("/orv.map.%u.", static_cast<unsigned>(::getuid()));
    for (const char character : name) {
        if (character == '/') {
            file += "%2F";
        } else if (character == '%') {
            file += "%25";
        } else {
            file += character;
        }
    }
    return file;
}

/// Changes the lock of this open file, which no other descriptor and no thread shares, in one step.
bool setLock(int descriptor, short type) noexcept {
    struct flock lock = {};
    lock.l_type = type;
    lock.l_whence = SEEK_SET;
    return ::fcntl(descriptor, F_OFD_SETLK, &lock) == 0;
}

bool isLockBusy(int osError) noexcept {
    return osError == EAGAIN || osError == EACCES;
}

struct stat statusOf(int descriptor) noexcept {
    struct stat status = {};
    ::fstat(descriptor, &status);  // of a descriptor that is open: cannot fail
    return status;
}

}  // namespace

DaMemoryMapPosix::DaMemoryMapPosix(const std::string& name, std::uint64_t size, DaPages pages)
    : _file(fileOf(name)), _size(size) {
    if (pages == DaPages::HUGE_ONLY) fail(__LINE__, "guaranteed huge pages", EOPNOTSUPP);
    if (size > static_cast<std::uint64_t>(std::numeric_limits<off_t>::max())) {
        fail(__LINE__, "ftruncate", EFBIG);
    }
    open();
    map(pages);
}

DaMemoryMapPosix::~DaMemoryMapPosix() {
    close();
}

/// Opens the file and holds its shared lock; creates the memory if nobody else has it.
void DaMemoryMapPosix::open() {
    using Clock = std::chrono::steady_clock;
    // Another process holds the exclusive lock for a few calls only, unless it is stopped there.
    const auto limit = Clock::now() + std::chrono::seconds(10);
    for (;;) {
        _descriptor = ::shm_open(_file.c_str(), O_RDWR | O_CREAT | O_CLOEXEC, S_IRUSR | S_IWUSR);
        if (_descriptor < 0) fail(__LINE__, "shm_open", errno);
        bool isNew = false;
        if (join(isNew)) {
            if (isNew) create();
            return;
        }
        ::close(_descriptor);
        _descriptor = -1;
        if (Clock::now() > limit) fail(__LINE__, "fcntl", ETIMEDOUT);
        std::this_thread::sleep_for(std::chrono::milliseconds(1));
    }
}

/// One try at the lock: exclusive, and the memory is to be made, or shared with its other users.
/// @return false if the file is just being made or removed.
bool DaMemoryMapPosix::join(bool& isNew) {
    isNew = setLock(_descriptor, F_WRLCK);
    if (!isNew) {
        if (!isLockBusy(errno)) fail(__LINE__, "fcntl", errno);
        if (!setLock(_descriptor, F_RDLCK)) {
            if (isLockBusy(errno)) return false;
            fail(__LINE__, "fcntl", errno);
        }
    }
    const struct stat status = statusOf(_descriptor);
    if (status.st_nlink == 0) return false;
    if (isNew) return true;
    if (status.st_size == 0) return false;  // who was making it has failed
    if (static_cast<std::uint64_t>(status.st_size) < _size) {
        fail(__LINE__, "joining a smaller memory", EINVAL);
    }
    return true;
}

/// Gives the file its size, filled with zeros, and turns the exclusive lock into a shared one.
void DaMemoryMapPosix::create() {
    if (::ftruncate(_descriptor, 0) != 0) fail(__LINE__, "ftruncate", errno);
    // Takes the memory now: where there is none left, writing to the mapping would be fatal.
    int result;
    do {
        result = ::posix_fallocate(_descriptor, 0, static_cast<off_t>(_size));
    } while (result == EINTR);
    if (result != 0) fail(__LINE__, "posix_fallocate", result);
    if (!setLock(_descriptor, F_RDLCK)) fail(__LINE__, "fcntl", errno);
}

void DaMemoryMapPosix::map(DaPages pages) {
    void* const memory = ::mmap(nullptr, _size, PROT_READ | PROT_WRITE, MAP_SHARED, _descriptor, 0);
    if (memory == MAP_FAILED) fail(__LINE__, "mmap", errno);
    _memory = memory;
    // A wish: a system that keeps huge pages from shared memory refuses it or does nothing.
    if (pages == DaPages::HUGE_IF_OFFERED) ::madvise(_memory, _size, MADV_HUGEPAGE);
}

void DaMemoryMapPosix::close() noexcept {
    if (_memory != nullptr) ::munmap(_memory, _size);
    if (_descriptor < 0) return;
    // Without a lock first: of two that leave at once and keep theirs, neither would be alone.
    setLock(_descriptor, F_UNLCK);
    const bool isAlone = setLock(_descriptor, F_WRLCK);
    if (isAlone && statusOf(_descriptor).st_nlink > 0) ::shm_unlink(_file.c_str());
    ::close(_descriptor);
}

void DaMemoryMapPosix::fail(int line, const char* step, int osError) {
    close();
    throw ExSysError(ORV_FILE, line, formatText("%s of \"%s\"", step, _file.c_str()).c_str(),
                     osError);
}

}  // namespace Orv
