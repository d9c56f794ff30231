#pragma once

#include <cstdint>
#include <filesystem>
#include <string>
#include <string_view>

namespace Orv {

/// A file that the log writes; every write goes straight to the system.
class LgFileWindows {
public:
    /// Creates or empties the file. @throws ExSysError
    explicit LgFileWindows(const std::filesystem::path& path);
    ~LgFileWindows();

    LgFileWindows(const LgFileWindows&) = delete;
    LgFileWindows& operator=(const LgFileWindows&) = delete;

    // Each gives 0 or the operating system's error.
    int append(std::string_view text) noexcept;
    int writeAt(std::int64_t offset, std::string_view text) noexcept;
    int truncate(std::int64_t length) noexcept;
    static int writeToStandardError(std::string_view text) noexcept;

    static std::string describe(const std::filesystem::path& path);  ///< In UTF-8.

private:
    void* _handle;
};

}  // namespace Orv
