#pragma once

#include <cstddef>
#include <filesystem>
#include <fstream>

namespace MediaHost {

/// A file that gets its name when it is whole: until commit() it has ".part" behind its name, and
/// it is removed if that never comes.
///
/// - Errors: MediaError for each failure, with the system's reason.
class OutputFile {
public:
    explicit OutputFile(const std::filesystem::path& path);
    ~OutputFile();
    OutputFile(const OutputFile&) = delete;
    OutputFile& operator=(const OutputFile&) = delete;

    void write(const void* data, std::size_t nbBytes);
    void write(const std::string& text) { write(text.data(), text.size()); }
    void seek(std::uint64_t position);  ///< Where write() goes on.
    void writeAt(std::uint64_t position, const void* data, std::size_t nbBytes);
    void commit();

    std::ostream& getStream() { return _stream; }  ///< For writers that take streams.
    const std::filesystem::path& getPath() const { return _path; }

private:
    const std::filesystem::path _path;
    const std::filesystem::path _partPath;
    std::ofstream _stream;
    bool _isCommitted = false;

    void check(const char* action);
};

}  // namespace MediaHost
