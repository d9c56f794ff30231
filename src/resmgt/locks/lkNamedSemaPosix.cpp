#include "lkNamedSemaPosix.h"

#include <algorithm>
#include <cerrno>
#include <cstring>
#include <fcntl.h>
#include <sys/file.h>
#include <sys/mman.h>
#include <sys/stat.h>
#include <unistd.h>
#include <utility>

#include "assertions.h"
#include "formatText.h"
#include "lkAddressWaitPosix.h"

namespace Orv {

namespace {

constexpr std::size_t LONGEST_NAME = 259;   // as on Windows
constexpr std::size_t LONGEST_PIECE = 240;  // a file name has at most 255 characters
constexpr double LONGEST_SLEEP_SECONDS = 1;

/// 0, or the error that the call left.
int errorOf(int result) noexcept {
    return result < 0 ? errno : 0;
}

int lockFile(int file, int operation) noexcept {
    int error = 0;
    do {
        error = errorOf(::flock(file, operation));
    } while (error == EINTR);
    return error;
}

/// The user's folder of semaphores, locked for as long as this lives.
class Folder {
public:
    Folder() {
        const std::string path = formatText("/dev/shm/orv-semaphores-%u", ::geteuid());
        ::mkdir(path.c_str(), 0700);
        _folder = ::open(path.c_str(), O_RDONLY | O_DIRECTORY | O_NOFOLLOW | O_CLOEXEC);
        _error = errorOf(_folder);
        struct stat status{};
        if (_error == 0) _error = errorOf(::fstat(_folder, &status));
        // Somebody else's folder might be changed behind our back.
        if (_error == 0 && status.st_uid != ::geteuid()) _error = EACCES;
        if (_error == 0) _error = lockFile(_folder, LOCK_EX);
    }
    ~Folder() {
        if (_folder < 0) return;
        // Said aloud: a child that was forked meanwhile has the descriptor, too, until its exec.
        lockFile(_folder, LOCK_UN);
        ::close(_folder);
    }
    Folder(const Folder&) = delete;
    Folder& operator=(const Folder&) = delete;

    int get() const noexcept { return _folder; }
    int getError() const noexcept { return _error; }

private:
    int _folder = -1;
    int _error = 0;
};

/// A name of characters that a file name may have, different for each name.
std::string escape(const std::string& name) {
    std::string escaped;
    for (const char character : name) {
        const bool isPlain =
            (character >= 'a' && character <= 'z') || (character >= 'A' && character <= 'Z') ||
            (character >= '0' && character <= '9') || std::strchr("_-. ", character) != nullptr;
        const char byte = character == '\\' ? '/' : character;
        escaped +=
            isPlain ? std::string(1, byte) : formatText("%%%02X", static_cast<unsigned char>(byte));
    }
    return escaped;
}

/// The path of a name's file in the folder; makes the folders in between, which long names need.
std::string makePath(int folder, const std::string& name) {
    std::string rest = escape(name);
    std::string path;
    while (rest.size() > LONGEST_PIECE) {
        path += "folder " + rest.substr(0, LONGEST_PIECE);
        ::mkdirat(folder, path.c_str(), 0700);
        path += '/';
        rest.erase(0, LONGEST_PIECE);
    }
    return path + "semaphore " + rest;
}

}  // namespace

LkNamedSemaPosix::LkNamedSemaPosix(const char* osName, unsigned initialCount,
                                   LkSemaTypes::CreateFlag createFlag) {
    if (initialCount > LkSemaTypes::HIGHEST_COUNT) {
        _errno = LkSemaTypes::getCountError();
    } else if (osName != nullptr) {
        _errno = open(osName, initialCount, createFlag);
    } else if (createFlag == LkSemaTypes::OPEN) {
        _errno = EINVAL;
    } else {
        _ownWord = initialCount;
        _word = &_ownWord;
    }
}

int LkNamedSemaPosix::open(const char* osName, unsigned initialCount,
                           LkSemaTypes::CreateFlag createFlag) {
    const std::string name = osName;
    if (name.empty()) return EINVAL;
    if (name.size() > LONGEST_NAME) return ENAMETOOLONG;
    const Folder folder;
    if (folder.getError() != 0) return folder.getError();
    _path = makePath(folder.get(), name);

    bool isNew = false;
    if (const int error = openFile(folder.get(), createFlag, isNew)) return error;
    int error = 0;
    if (isNew) {
        error = errorOf(::ftruncate(_file, 0));
        // With its room taken now, no later access to the word can fail.
        while (error == 0 && (error = ::posix_fallocate(_file, 0, sizeof(Word))) == EINTR) {
            error = 0;
        }
    }
    void* const memory =
        ::mmap(nullptr, sizeof(Word), PROT_READ | PROT_WRITE, MAP_SHARED, _file, 0);
    if (error == 0 && memory == MAP_FAILED) error = errno;
    if (error == 0 && isNew) new (memory) Word(initialCount);
    if (error == 0) error = lockFile(_file, LOCK_SH);
    if (error == 0) {
        _word = static_cast<Word*>(memory);
        return 0;
    }
    if (memory != MAP_FAILED) ::munmap(memory, sizeof(Word));
    if (isNew) ::unlinkat(folder.get(), _path.c_str(), 0);
    ::close(std::exchange(_file, -1));
    return error;
}

/// Opens the file of a semaphore that is in use, or a new one, or what is left of an old one.
int LkNamedSemaPosix::openFile(int folder, LkSemaTypes::CreateFlag createFlag,
                               bool& isNew) noexcept {
    constexpr int flags = O_RDWR | O_NOFOLLOW | O_CLOEXEC;
    _file = ::openat(folder, _path.c_str(), flags);
    int error = errorOf(_file);
    if (error != 0 && error != ENOENT) return error;
    const bool isInUse = error == 0 && lockFile(_file, LOCK_EX | LOCK_NB) == EWOULDBLOCK;
    isNew = !isInUse && createFlag != LkSemaTypes::OPEN;
    if (isNew && _file < 0) {
        _file = ::openat(folder, _path.c_str(), flags | O_CREAT | O_EXCL, 0600);
        return errorOf(_file);
    }
    if (isNew || (isInUse && createFlag != LkSemaTypes::CREATE_EXCLUSIVE)) return 0;
    if (_file >= 0) ::close(std::exchange(_file, -1));
    if (isInUse) return EEXIST;
    ::unlinkat(folder, _path.c_str(), 0);
    return ENOENT;
}

int LkNamedSemaPosix::close() noexcept {
    if (_file < 0) return 0;
    int error = 0;
    try {
        const Folder folder;
        const bool isLast = folder.getError() == 0 && lockFile(_file, LOCK_EX | LOCK_NB) == 0;
        if (isLast) error = errorOf(::unlinkat(folder.get(), _path.c_str(), 0));
    } catch (...) {
        // Without memory for a path the file stays behind, as if this process had died here.
    }
    ::munmap(_word, sizeof(Word));
    lockFile(_file, LOCK_UN);
    ::close(std::exchange(_file, -1));
    return error == ENOENT ? 0 : error;
}

void LkNamedSemaPosix::post() {
    Word* const word = _word;
    std::uint32_t count = word->load(std::memory_order_relaxed);
    do {
        ORV_ASSERT_SYS(count < LkSemaTypes::HIGHEST_COUNT, "count < 2147483647", EOVERFLOW);
    } while (!word->compare_exchange_weak(count, count + 1, std::memory_order_acq_rel));
    // All of them: the one that is woken may be killed before it takes anything.
    LkAddressWaitPosix::wakeAll(word, LkAddressWaitPosix::Scope::MACHINE);
}

void LkNamedSemaPosix::wait() {
    // A process may be killed between its post and the wake-up, so sleep is never for good.
    while (!tryWait()) {
        LkAddressWaitPosix::wait(_word, 0, LkTimeLimit(LONGEST_SLEEP_SECONDS),
                                 LkAddressWaitPosix::Scope::MACHINE);
    }
}

bool LkNamedSemaPosix::tryWait() noexcept {
    std::uint32_t count = _word->load(std::memory_order_relaxed);
    while (count > 0) {
        if (_word->compare_exchange_weak(count, count - 1, std::memory_order_acquire)) return true;
    }
    return false;
}

}  // namespace Orv
