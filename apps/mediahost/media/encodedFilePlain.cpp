#include "encodedFile.h"
#include "mediaError.h"

namespace MediaHost {

struct EncodedFile::Parts {};

EncodedFile::EncodedFile(const std::filesystem::path& path, const PictureFormat&) : _file(path) {
    throw MediaError("cannot encode \"" + path.string() +
                     "\": this program was built without FFmpeg");
}

EncodedFile::~EncodedFile() = default;
void EncodedFile::write(const PictureFormat&, const std::byte*) {}
void EncodedFile::commit() {}

}  // namespace MediaHost
