#pragma once

#include <memory>

#include "formats.h"
#include "outputFile.h"

namespace MediaHost {

/// Encodes pictures into a file whose name tells its kind, "clip.mp4", "clip.mkv" and so on, at
/// their rate, whenever they come. An odd column or row at the edge is left out.
///
/// - Threads: one at a time.
/// - Errors: MediaError; FFmpeg has to know the kind and an encoder for it.
class EncodedFile {
public:
    EncodedFile(const std::filesystem::path& path, const PictureFormat& format);
    ~EncodedFile();  ///< Without commit() there is no file.

    /// @param picture  of the format given first; else an error.
    void write(const PictureFormat& format, const std::byte* picture);
    void commit();

private:
    struct Parts;
    const PictureFormat _format;
    OutputFile _file;
    std::unique_ptr<Parts> _parts;  // never null
};

}  // namespace MediaHost
