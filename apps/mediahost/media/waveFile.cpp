#include "waveFile.h"

#include <algorithm>
#include <cmath>

namespace MediaHost {

namespace {

constexpr std::uint64_t HEADER_BYTES = 44;

void append(std::vector<unsigned char>& bytes, const char* text) {
    for (int i = 0; i < 4; ++i) bytes.push_back(static_cast<unsigned char>(text[i]));
}
void append(std::vector<unsigned char>& bytes, std::uint64_t number, int nbBytes) {
    for (int i = 0; i < nbBytes; ++i) {
        bytes.push_back(static_cast<unsigned char>(number >> (8 * i)));
    }
}

}  // namespace

WaveFile::WaveFile(const std::filesystem::path& path, const SoundFormat& format)
    : _format(format), _file(path) {
    const std::vector<unsigned char> header = makeHeader();
    _file.write(header.data(), header.size());
}

std::vector<unsigned char> WaveFile::makeHeader() const {
    const std::uint64_t limit = 0xFFFFFFFF;
    const auto nbChannels = static_cast<std::uint64_t>(_format.nbChannels);
    const auto rate = static_cast<std::uint64_t>(_format.rate);
    std::vector<unsigned char> bytes;
    bytes.reserve(HEADER_BYTES);
    append(bytes, "RIFF");
    append(bytes, std::min(_nbBytes + HEADER_BYTES - 8, limit), 4);
    append(bytes, "WAVE");
    append(bytes, "fmt ");
    append(bytes, 16, 4);
    append(bytes, 1, 2);  // PCM
    append(bytes, nbChannels, 2);
    append(bytes, rate, 4);
    append(bytes, rate * nbChannels * 2, 4);
    append(bytes, nbChannels * 2, 2);
    append(bytes, 16, 2);
    append(bytes, "data");
    append(bytes, std::min(_nbBytes, limit), 4);
    return bytes;
}

void WaveFile::write(std::span<const float> samples) {
    _bytes.clear();
    for (const float sample : samples) {
        const long value = std::clamp(std::lrintf(sample * 32768.0F), -32768L, 32767L);
        append(_bytes, static_cast<std::uint64_t>(value), 2);
    }
    _file.write(_bytes.data(), _bytes.size());
    _nbBytes += _bytes.size();
}

void WaveFile::commit() {
    const std::vector<unsigned char> header = makeHeader();
    _file.writeAt(0, header.data(), header.size());
    _file.commit();
}

}  // namespace MediaHost
