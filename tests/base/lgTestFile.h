#pragma once

#include <filesystem>
#include <fstream>
#include <sstream>
#include <string>

namespace Orv {

/// The path of a file of the running test in the temporary folder; the file goes with the object.
class LgTestFile {
public:
    LgTestFile() {
        const std::string test = testing::UnitTest::GetInstance()->current_test_info()->name();
        std::ostringstream name;
        name << "orv " << test << ' ' << this << ' '
             << std::chrono::system_clock::now().time_since_epoch().count() << ".json";
        _path = std::filesystem::temp_directory_path() / name.str();
    }

    ~LgTestFile() {
        std::error_code ignored;
        std::filesystem::remove(_path, ignored);
    }

    LgTestFile(const LgTestFile&) = delete;
    LgTestFile& operator=(const LgTestFile&) = delete;

    const std::filesystem::path& getPath() const { return _path; }

    std::string read() const {
        std::ifstream file(_path, std::ios::binary);
        std::ostringstream text;
        text << file.rdbuf();
        return text.str();
    }

private:
    std::filesystem::path _path;
};

}  // namespace Orv
