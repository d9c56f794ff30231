#include "lgFilePosix.h"

#include <cerrno>
#include <fcntl.h>
#include <unistd.h>

#include "exSysErrorPosix.h"
#include "sourceFile.h"

namespace Orv {

namespace {

/// Calls write(rest of the text) until all is written. @return 0 or the error.
template <class Write>
int writeAll(std::string_view text, Write write) noexcept {
    while (!text.empty()) {
        const ssize_t written = write(text);
        if (written > 0) {
            text.remove_prefix(static_cast<std::size_t>(written));
        } else if (written == 0 || errno != EINTR) {
            return written == 0 ? ENOSPC : errno;
        }
    }
    return 0;
}

}  // namespace

LgFilePosix::LgFilePosix(const std::filesystem::path& path)
    : _descriptor(::open(path.c_str(), O_WRONLY | O_CREAT | O_TRUNC | O_CLOEXEC, 0666)) {
    if (_descriptor < 0) {
        const int error = errno;
        throw ExSysErrorPosix(ORV_FILE, __LINE__, ("open of " + describe(path)).c_str(), error);
    }
}

LgFilePosix::~LgFilePosix() {
    ::close(_descriptor);
}

int LgFilePosix::append(std::string_view text) noexcept {
    return writeAll(text, [this](std::string_view rest) {
        return ::write(_descriptor, rest.data(), rest.size());
    });
}

int LgFilePosix::writeAt(std::int64_t offset, std::string_view text) noexcept {
    const char* const start = text.data();
    return writeAll(text, [=, this](std::string_view rest) {
        return ::pwrite(_descriptor, rest.data(), rest.size(), offset + (rest.data() - start));
    });
}

int LgFilePosix::truncate(std::int64_t length) noexcept {
    return ::ftruncate(_descriptor, length) == 0 ? 0 : errno;
}

int LgFilePosix::writeToStandardError(std::string_view text) noexcept {
    return writeAll(text, [](std::string_view rest) {
        return ::write(STDERR_FILENO, rest.data(), rest.size());
    });
}

std::string LgFilePosix::describe(const std::filesystem::path& path) {
    return path.string();
}

}  // namespace Orv
