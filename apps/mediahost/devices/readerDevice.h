#pragma once

#include "settings.h"
#include "sourceDevice.h"

namespace MediaHost {

/// Reads a file of any kind that FFmpeg knows. Settings: file, threads (0: one per processor).
///
/// - Errors: MediaError if the file cannot be read, or has neither pictures nor sound.
class ReaderDevice : public SourceDevice {
public:
    ReaderDevice(const Orv::LiString& name, HostContext& context, Settings settings);

    static bool isAvailable();  ///< Was the program built with FFmpeg?

private:
    std::string _file;
    std::int64_t _nbThreads = 0;
    std::string _codecs;

    void openFile();
    void addFileProperties();
};

}  // namespace MediaHost
