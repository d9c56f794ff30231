#include "hostProgram.h"

#include <algorithm>
#include <atomic>
#include <cerrno>
#include <cstdlib>
#include <cstring>
#include <fstream>
#include <gtest/gtest.h>
#include <random>
#include <sstream>

namespace Orv {

namespace {

#ifdef _WIN32
constexpr const char* PROGRAM = "orv-mediahost.exe ";
int toCode(int status) {
    return status;
}
#else
constexpr const char* PROGRAM = "./orv-mediahost ";
int toCode(int status) {
    return status / 256;
}
#endif

// -1 with a reason in errno where the shell itself could not be started, as on a busy machine.
int runShell(const std::string& command) {
    errno = 0;
    return std::system(command.c_str());
}

std::uint32_t readNumber(const std::string& bytes, std::size_t at, int nbBytes) {
    std::uint32_t number = 0;
    for (int i = nbBytes - 1; i >= 0; --i) {
        number = number << 8 | static_cast<unsigned char>(bytes[at + static_cast<std::size_t>(i)]);
    }
    return number;
}

}  // namespace

HostRun runHost(const std::string& arguments) {
    return runCommand(PROGRAM + arguments + " 2>&1");
}

HostRun runCommand(const std::string& command) {
    const TestFolder folder;
    const std::string path = folder / "output.txt";
    const std::size_t errors = command.rfind(" 2>&1");
    const std::string redirected = errors == std::string::npos
                                       ? command + " >" + path
                                       : command.substr(0, errors) + " >" + path + " 2>&1";
    int status = runShell(redirected);
    if (status == -1 && errno != 0) status = runShell(redirected);
    if (status == -1) return {-1, "the shell has not run: " + std::string(std::strerror(errno))};
    const int code = toCode(status);
    std::string output = readFile(path);
    std::erase(output, '\r');  // lines end alike on every platform
    return {code, output};
}

TestFolder::TestFolder() {
    static std::atomic<int> counter{0};
    std::random_device random;
    _path = std::filesystem::temp_directory_path() /
            ("orv-mediahost-" + std::to_string(random()) + '-' + std::to_string(++counter));
    std::filesystem::create_directories(_path);
}

TestFolder::~TestFolder() {
    std::error_code ignored;
    std::filesystem::remove_all(_path, ignored);
}

std::vector<std::string> TestFolder::list() const {
    std::vector<std::string> names;
    for (const auto& entry : std::filesystem::directory_iterator(_path)) {
        names.push_back(entry.path().filename().string());
    }
    std::sort(names.begin(), names.end());
    return names;
}

std::string readFile(const std::string& path) {
    std::ifstream file(path, std::ios::binary);
    std::ostringstream text;
    text << file.rdbuf();
    return text.str();
}

void writeFile(const std::string& path, const std::string& text) {
    std::ofstream(path, std::ios::binary) << text;
}

std::vector<FrameLine> readFrames(const std::string& path) {
    std::ifstream file(path);
    std::vector<FrameLine> lines;
    FrameLine line;
    while (file >> line.index >> line.number >> line.timecode >> line.checksum)
        lines.push_back(line);
    return lines;
}

Wave readWave(const std::string& path) {
    const std::string bytes = readFile(path);
    Wave wave;
    if (bytes.size() < 44 || bytes.compare(0, 4, "RIFF") != 0 ||
        bytes.compare(36, 4, "data") != 0) {
        ADD_FAILURE() << path << " is no WAV file";
        return wave;
    }
    EXPECT_EQ(readNumber(bytes, 4, 4), bytes.size() - 8) << path;
    EXPECT_EQ(readNumber(bytes, 40, 4), bytes.size() - 44) << path;
    EXPECT_EQ(readNumber(bytes, 34, 2), 16u) << path;
    wave.nbChannels = static_cast<int>(readNumber(bytes, 22, 2));
    wave.rate = static_cast<int>(readNumber(bytes, 24, 4));
    wave.samples.resize((bytes.size() - 44) / 2);
    std::memcpy(wave.samples.data(), bytes.data() + 44, wave.samples.size() * 2);
    return wave;
}

}  // namespace Orv
