#pragma once

#include <cstdint>
#include <filesystem>
#include <map>
#include <string>
#include <vector>

namespace Orv {

/// Runs orv-mediahost, which lies in the folder that the tests run in.
struct HostRun {
    int code;
    std::string output;  // what it wrote to both of its outputs
};
HostRun runHost(const std::string& arguments);

/// Any command line; its output is what it wrote to its standard output.
HostRun runCommand(const std::string& command);

/// A new, empty folder for one test; it goes with the object.
class TestFolder {
public:
    TestFolder();
    ~TestFolder();
    TestFolder(const TestFolder&) = delete;
    TestFolder& operator=(const TestFolder&) = delete;

    std::string operator/(const std::string& name) const { return (_path / name).string(); }
    std::string getPath() const { return _path.string(); }
    std::vector<std::string> list() const;  ///< Names, sorted.

private:
    std::filesystem::path _path;
};

std::string readFile(const std::string& path);
void writeFile(const std::string& path, const std::string& text);

/// A line of frames.txt.
struct FrameLine {
    std::int64_t index;   // in the show
    std::int64_t number;  // in the track
    std::string timecode;
    std::string checksum;
};
std::vector<FrameLine> readFrames(const std::string& path);

/// The samples of a WAV file with the header that the recorder writes; fails the test if the header
/// does not fit the file.
struct Wave {
    int nbChannels = 0;
    int rate = 0;
    std::vector<std::int16_t> samples;
};
Wave readWave(const std::string& path);

}  // namespace Orv
