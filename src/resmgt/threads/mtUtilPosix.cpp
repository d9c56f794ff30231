#include <cerrno>
#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <fcntl.h>
#include <string>
#include <sys/mman.h>
#include <sys/stat.h>
#include <unistd.h>

#include "envVar.h"
#include "mtProcessorsPosix.h"
#include "mtUtil.h"
#include "osError.h"
#include "trace.h"

namespace Orv {

namespace {

void printError(const char* step) {
    std::fprintf(stderr, "%s: %s\n", step, OsError::describe(errno).c_str());
}

/// A file without a name in the temporary folder; below 0 if there is none to be had.
int openProbeFile() {
    std::string path = EnvVar("TMPDIR").getText().value_or("/tmp") + "/orvProbeXXXXXX";
    const int file = ::mkostemp(path.data(), O_CLOEXEC);
    if (file >= 0) ::unlink(path.c_str());
    return file;
}

/// Whether the system can read the byte: 1 or 0, or -1 after another error.
int probe(int file, const char* byte) {
    for (;;) {
        if (::pwrite(file, byte, 1, 0) == 1) return 1;
        if (errno == EFAULT) return 0;
        if (errno == EINTR) continue;
        printError("testWritable");
        return -1;
    }
}

}  // namespace

int MtUtil::getNbProcessors() {
    return MtProcessorsPosix::getNumber();
}

int MtUtil::testWritable(const void* address, int length) {
    const int file = openProbeFile();
    if (file < 0) return 0;
    const auto pageSize = static_cast<std::uintptr_t>(::sysconf(_SC_PAGESIZE));
    const auto first = reinterpret_cast<std::uintptr_t>(address);
    int result = 1;
    std::uintptr_t offset = 0;  // of the byte to probe: the first one of each page
    while (result == 1 && length > 0 && offset < static_cast<std::uintptr_t>(length)) {
        result = probe(file, static_cast<const char*>(address) + offset);
        offset += pageSize - (first + offset) % pageSize;
    }
    if (::close(file) != 0) printError("testWritable close");
    return result;
}

void MtUtil::lockProcessMemory() {
    if (::mlockall(MCL_CURRENT | MCL_FUTURE) == 0) return;
    const int error = errno;
    ORV_TRACE(TraceLevel::getMain())
        << "Process memory not locked: " << OsError::describe(error) << ".";
}

void MtUtil::unlockProcessMemory() {
    ::munlockall();
}

}  // namespace Orv
