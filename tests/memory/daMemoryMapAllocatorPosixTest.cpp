#include <cerrno>
#include <fcntl.h>
#include <filesystem>
#include <fstream>
#include <gtest/gtest.h>
#include <sstream>
#include <unistd.h>

#include "daArenaPool.h"
#include "daMemoryMapAllocator.h"
#include "exSysError.h"

namespace Orv {

namespace {

constexpr std::uint64_t HUGE_PAGE = std::uint64_t(2) << 20;

std::string fileOf(const std::string& name) {
    return "/dev/shm/orv.map." + std::to_string(::getuid()) + "." + name;
}

/// Descriptors of this process that are open on the file.
std::vector<int> descriptorsOf(const std::string& file) {
    std::vector<int> found;
    for (const auto& entry : std::filesystem::directory_iterator("/proc/self/fd")) {
        std::error_code error;  // the directory's own descriptor is gone again
        if (std::filesystem::read_symlink(entry, error) == file) {
            found.push_back(std::stoi(entry.path().filename().string()));
        }
    }
    return found;
}

/// The line of /proc/self/smaps for the mapping that contains the address.
std::string smapsLineOf(const void* address, const std::string& key) {
    std::ifstream file("/proc/self/smaps");
    bool isInside = false;
    for (std::string line; std::getline(file, line);) {
        unsigned long start, end;
        char dash;
        std::istringstream words(line);
        if (words >> std::hex >> start >> dash >> end && dash == '-') {
            const auto wanted = reinterpret_cast<unsigned long>(address);
            isInside = start <= wanted && wanted < end;
        }
        if (isInside && line.compare(0, key.size(), key) == 0) return line;
    }
    return {};
}

TEST(DaMemoryMapPosix, isNotInheritedAndRemovesItsFile) {
    const std::string name = "daPosixTest." + std::to_string(::getpid());
    ObjPtr<DaMemoryMapAllocator> first = DaMemoryMapAllocator::create(name.c_str());
    ObjPtr<DaMemoryMapAllocator> second = DaMemoryMapAllocator::create(name.c_str());
    void* const memory = first->allocate(4096);
    (void)second->allocate(4096);
    ObjPtr<DaMemoryMapAllocator> refused = DaMemoryMapAllocator::create(name.c_str());
    EXPECT_THROW((void)refused->allocate(8192), ExSysError);
    const std::vector<int> descriptors = descriptorsOf(fileOf(name));
    EXPECT_EQ(descriptors.size(), 2u) << "a refused user leaves none open";
    for (const int descriptor : descriptors) {
        EXPECT_EQ(::fcntl(descriptor, F_GETFD) & FD_CLOEXEC, FD_CLOEXEC);
    }
    first->deallocate(memory, 4096);
    EXPECT_TRUE(std::filesystem::exists(fileOf(name)));
    second.reset();
    EXPECT_FALSE(std::filesystem::exists(fileOf(name)));
}

TEST(DaMemoryMapPosix, throwsTheCallAndItsError) {
    const std::string name(300, 'n');
    ObjPtr<DaMemoryMapAllocator> allocator = DaMemoryMapAllocator::create(name.c_str());
    try {
        (void)allocator->allocate(64);
        ADD_FAILURE() << "a name longer than the system takes";
    } catch (const ExSysError& error) {
        EXPECT_EQ(error.getOsError(), EINVAL);  // as shm_open() has it
        EXPECT_EQ(std::string(error.what()).find("shm_open of \"/orv.map."), 0u) << error.what();
    }
}

TEST(DaMemoryMapPosix, guaranteesNoHugePages) {
    ObjPtr<DaMemoryMapAllocator> allocator =
        DaMemoryMapAllocator::create("daPosixTest.huge", DaPages::HUGE_ONLY);
    try {
        (void)allocator->allocate(64);
        ADD_FAILURE() << "guaranteed";
    } catch (const ExSysError& error) {
        EXPECT_EQ(error.getOsError(), EOPNOTSUPP);
    }
    EXPECT_FALSE(std::filesystem::exists(fileOf("daPosixTest.huge")));
}

TEST(DaArenaPoolPosix, asksForHugePagesAndGivesAllOfThemBack) {
    constexpr std::uint64_t SIZE = 3 * HUGE_PAGE - 8;
    ObjPtr<DaArenaPool> pool = DaArenaPool::create(SIZE, DaPages::HUGE_IF_OFFERED);
    char* const block = static_cast<char*>(pool->allocate(SIZE, 0));
    EXPECT_EQ(reinterpret_cast<std::uintptr_t>(block) % HUGE_PAGE, 0u);
    block[0] = block[SIZE - 1] = 'x';
    // "hg": huge pages are advised, "ht": the pages are huge ones by nature.
    const std::string flags = smapsLineOf(block, "VmFlags:") + " ";
    EXPECT_TRUE(flags.find(" hg ") != std::string::npos || flags.find(" ht ") != std::string::npos)
        << flags;
    pool.reset();
    for (std::uint64_t i = 0; i < 3; ++i) {
        EXPECT_EQ(smapsLineOf(block + i * HUGE_PAGE, "VmFlags:").find(" hg"), std::string::npos);
    }
}

TEST(DaArenaPoolPosix, throwsUnlessGuaranteedPagesAreHuge) {
    try {
        ObjPtr<DaArenaPool> pool = DaArenaPool::create(HUGE_PAGE + 8, DaPages::HUGE_ONLY);
        const void* const block = pool->allocate(64, 0);
        EXPECT_NE(smapsLineOf(block, "KernelPageSize:").find(" 2048 kB"), std::string::npos);
    } catch (const ExSysError& error) {
        EXPECT_EQ(error.getOsError(), ENOMEM);  // none are set aside
    }
}

}  // namespace

}  // namespace Orv
