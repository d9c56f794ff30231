#pragma once

#include <cstddef>
#include <string_view>

namespace Orv {

/// A source file as errors report it: library folder and name, without the module's folder and the
/// extension ("src/resmgt/lkMutex"). Made by the compiler from `__FILE__`; take it with ORV_FILE.
template <std::size_t Capacity>
struct SourceFile {
    char chars[Capacity + 16] = {};  // at most "src/resmgt/" and the name

    explicit consteval SourceFile(const char (&path)[Capacity]) {
        const std::string_view whole(path, Capacity - 1);
        append(folderOf(whole));
        const std::string_view file = whole.substr(whole.find_last_of("/\\") + 1);
        append(file.substr(0, file.rfind('.')));
    }

private:
    std::size_t _length = 0;

    static constexpr std::string_view LIBRARY_FOLDERS[] = {"src/base/", "src/resmgt/"};

    /// The library's folder in the path; the last one, for the sources may lie below another.
    static consteval std::string_view folderOf(std::string_view path) {
        std::string_view found;
        for (std::size_t end = path.size(); end > 0 && found.empty(); --end) {
            for (const std::string_view folder : LIBRARY_FOLDERS) {
                if (endsWith(path.substr(0, end), folder)) found = folder;
            }
        }
        // Templates of the library that an installed header brings into another program.
        if (found.empty() && path.find("/orv/") != std::string_view::npos) return "src/resmgt/";
        return found;
    }

    static consteval bool endsWith(std::string_view path, std::string_view folder) {
        if (path.size() < folder.size()) return false;
        path.remove_prefix(path.size() - folder.size());
        for (std::size_t i = 0; i < path.size(); ++i) {
            if ((path[i] == '\\' ? '/' : path[i]) != folder[i]) return false;
        }
        return true;
    }

    consteval void append(std::string_view text) {
        for (const char character : text) chars[_length++] = character;
    }
};

}  // namespace Orv

/// The current file as errors report it; a text that lives as long as the program.
#define ORV_FILE                                                \
    ([]() noexcept -> const char* {                             \
        static constexpr auto file = Orv::SourceFile(__FILE__); \
        return file.chars;                                      \
    }())
