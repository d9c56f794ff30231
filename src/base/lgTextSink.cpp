#include "lgTextSink.h"

#include <ctime>

#include "exSysError.h"
#include "formatText.h"
#include "lgClockPrivate.h"
#include "lgNative.h"
#include "sourceFile.h"

namespace Orv {

namespace {

const char* nameOf(LgSeverity severity) noexcept {
    switch (severity) {
        case LgSeverity::INFO:
            return "info";
        case LgSeverity::WARNING:
            return "warning";
        case LgSeverity::FAILURE:
            return "error";
    }
    return "?";
}

std::string secondsOf(std::int64_t nanoseconds) {
    const auto microseconds = static_cast<long long>(nanoseconds / 1000);
    return formatText("%lld.%06lld", microseconds / 1'000'000, microseconds % 1'000'000);
}

/// The text without line end, its further lines indented.
void appendLines(std::string& lines, std::string_view text) {
    while (text.ends_with('\n')) text.remove_suffix(1);
    for (const char character : text) {
        lines += character;
        if (character == '\n') lines += "    ";
    }
    lines += '\n';
}

}  // namespace

// LgTextSink

void LgTextSink::write(const LgRecord& record, const LgThread& thread) {
    if (record.kind != LgRecord::Kind::LINE) return;
    std::string line = formatText("%s %s %s [", secondsOf(record.nanoseconds).c_str(),
                                  nameOf(record.severity), record.category);
    line += thread.name.empty() ? std::to_string(thread.osId) : thread.name;
    line += "] ";
    appendLines(line, record.text);
    _lines += line;
}

void LgTextSink::flush() {
    if (_lines.empty()) return;
    if (_isTorn) _lines.insert(0, 1, '\n');
    const int error = performWrite(_lines);
    _lines.clear();
    _isTorn = error != 0;
    if (error != 0) throw ExSysError(ORV_FILE, __LINE__, "write", error);
}

// LgStandardErrorSink

std::string LgStandardErrorSink::getName() const {
    return "standard error";
}

int LgStandardErrorSink::performWrite(std::string_view lines) noexcept {
    return LgFile::writeToStandardError(lines);
}

// LgFileSink

class LgFileSink::File : public LgFile {
public:
    using LgFile::LgFile;
};

LgFileSink::LgFileSink(const std::filesystem::path& path)
    : _file(std::make_unique<File>(path)), _name("file " + LgFile::describe(path)) {
    const std::time_t now = std::time(nullptr);
    std::tm utc{};
    LgSystem::toUtc(now, utc);
    char date[32];
    std::strftime(date, sizeof date, "%Y-%m-%d %H:%M:%S", &utc);
    const int error =
        _file->append(formatText("# %s UTC is %s s\n", date, secondsOf(LgClock::now()).c_str()));
    if (error != 0) throw ExSysError(ORV_FILE, __LINE__, ("write to " + _name).c_str(), error);
}

LgFileSink::~LgFileSink() = default;

std::string LgFileSink::getName() const {
    return _name;
}

int LgFileSink::performWrite(std::string_view lines) noexcept {
    return _file->append(lines);
}

}  // namespace Orv
