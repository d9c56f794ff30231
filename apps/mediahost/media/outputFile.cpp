#include "outputFile.h"

#include <cerrno>
#include <system_error>

#include "mediaError.h"

namespace MediaHost {

namespace {

std::filesystem::path addPart(std::filesystem::path path) {
    path += ".part";
    return path;
}

}  // namespace

OutputFile::OutputFile(const std::filesystem::path& path) : _path(path), _partPath(addPart(path)) {
    errno = 0;
    _stream.open(_partPath, std::ios::binary | std::ios::trunc);
    check("create");
}

OutputFile::~OutputFile() {
    if (_isCommitted) return;
    _stream.close();
    std::error_code ignored;
    std::filesystem::remove(_partPath, ignored);
}

void OutputFile::check(const char* action) {
    if (_stream) return;
    const std::string reason =
        errno != 0 ? std::generic_category().message(errno) : "unknown reason";
    throw MediaError(std::string("cannot ") + action + " \"" + _path.string() + "\": " + reason);
}

void OutputFile::write(const void* data, std::size_t nbBytes) {
    errno = 0;
    _stream.write(static_cast<const char*>(data), static_cast<std::streamsize>(nbBytes));
    check("write");
}

void OutputFile::seek(std::uint64_t position) {
    errno = 0;
    _stream.seekp(static_cast<std::streamoff>(position));
    check("write");
}

void OutputFile::writeAt(std::uint64_t position, const void* data, std::size_t nbBytes) {
    errno = 0;
    const std::ofstream::pos_type end = _stream.tellp();
    _stream.seekp(static_cast<std::streamoff>(position));
    _stream.write(static_cast<const char*>(data), static_cast<std::streamsize>(nbBytes));
    _stream.seekp(end);
    check("write");
}

void OutputFile::commit() {
    errno = 0;
    _stream.close();
    check("finish");
    std::error_code error;
    std::filesystem::rename(_partPath, _path, error);
    if (error) throw MediaError("cannot finish \"" + _path.string() + "\": " + error.message());
    _isCommitted = true;
}

}  // namespace MediaHost
