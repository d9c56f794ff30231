#pragma once

#include <span>
#include <vector>

#include "formats.h"
#include "outputFile.h"

namespace MediaHost {

/// Writes sound as a RIFF WAVE file of 16-bit PCM; in a file beyond 4 GB the sizes in its header
/// say "as long as there is data", which readers take.
class WaveFile {
public:
    WaveFile(const std::filesystem::path& path, const SoundFormat& format);

    /// Samples of all channels beside each other; beyond -1 to 1 they are clipped.
    void write(std::span<const float> samples);
    void commit();

    const SoundFormat& getFormat() const { return _format; }
    std::uint64_t getNbSamples() const {
        return _nbBytes / 2 / static_cast<unsigned>(_format.nbChannels);
    }

private:
    const SoundFormat _format;
    OutputFile _file;
    std::uint64_t _nbBytes = 0;  // of samples
    std::vector<unsigned char> _bytes;

    std::vector<unsigned char> makeHeader() const;
};

}  // namespace MediaHost
