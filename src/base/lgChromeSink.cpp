#include "lgChromeSink.h"

#include <cmath>
#include <utility>

#include "exSysError.h"
#include "formatText.h"
#include "lgJsonTextPrivate.h"
#include "lgNative.h"
#include "sourceFile.h"

namespace Orv {

namespace {

constexpr std::string_view OPENING = "{\"displayTimeUnit\":\"ns\",\"traceEvents\":[";
constexpr std::string_view CLOSING = "\n]}\n";

/// The format's name for the kind of event.
const char* phaseOf(LgRecord::Kind kind) noexcept {
    switch (kind) {
        case LgRecord::Kind::SPAN_BEGIN:
            return "B";
        case LgRecord::Kind::SPAN_END:
            return "E";
        case LgRecord::Kind::ASYNC_BEGIN:
            return "b";
        case LgRecord::Kind::ASYNC_END:
            return "e";
        case LgRecord::Kind::COUNTER:
            return "C";
        case LgRecord::Kind::THREAD_NAME:
            return "M";
        case LgRecord::Kind::LINE:
        case LgRecord::Kind::INSTANT:
            break;
    }
    return "i";
}

}  // namespace

class LgChromeSink::File : public LgFile {
public:
    using LgFile::LgFile;
};

LgChromeSink::LgChromeSink(const std::filesystem::path& path)
    : _file(std::make_unique<File>(path)), _name("timeline " + LgFile::describe(path)), _end(0) {
    writeAtEnd(OPENING);
}

LgChromeSink::~LgChromeSink() = default;

std::string LgChromeSink::getName() const {
    return _name;
}

/// What every event begins with; the caller goes on with a comma or a brace.
void LgChromeSink::appendHead(const char* phase, const LgThread& thread) {
    _events += formatText("%s\n{\"ph\":\"%s\",\"pid\":%llu,\"tid\":%llu", _isFirst ? "" : ",",
                          phase, static_cast<unsigned long long>(LgSystem::getProcessId()),
                          static_cast<unsigned long long>(thread.number));
    _isFirst = false;
}

void LgChromeSink::appendThreadName(const LgThread& thread) {
    appendHead("M", thread);
    _events += ",\"name\":\"thread_name\",\"args\":{\"name\":";
    appendJsonText(_events,
                   thread.name.empty() ? "thread " + std::to_string(thread.osId) : thread.name);
    _events += "}}";
}

void LgChromeSink::write(const LgRecord& record, const LgThread& thread) {
    using Kind = LgRecord::Kind;
    if (_namedThreads.insert(thread.number).second || record.kind == Kind::THREAD_NAME) {
        appendThreadName(thread);
    }
    if (record.kind == Kind::THREAD_NAME) return;

    appendHead(phaseOf(record.kind), thread);
    const auto nanoseconds = static_cast<long long>(record.nanoseconds);
    _events += formatText(",\"ts\":%lld.%03lld", nanoseconds / 1000, nanoseconds % 1000);
    if (record.kind != Kind::SPAN_END) {
        _events += ",\"cat\":";
        appendJsonText(_events, record.category);
        _events += ",\"name\":";
        appendJsonText(_events, record.text);
    }
    if (record.kind == Kind::LINE || record.kind == Kind::INSTANT) _events += ",\"s\":\"t\"";
    if (record.kind == Kind::ASYNC_BEGIN || record.kind == Kind::ASYNC_END) {
        _events += formatText(",\"id\":\"0x%llx\"", static_cast<unsigned long long>(record.id));
    }
    if (record.kind == Kind::COUNTER) {
        const std::string value =
            std::isfinite(record.value) ? formatText("%.17g", record.value) : "null";
        _events += ",\"args\":{\"value\":" + value + "}";
    }
    _events += '}';
}

void LgChromeSink::flush() {
    if (_events.empty()) return;
    const std::string events = std::exchange(_events, {});
    writeAtEnd(events);
}

/// Overwrites the closing brackets with the text and new ones. In case of failure the file ends as
/// it did before, unless the system refuses even that.
void LgChromeSink::writeAtEnd(std::string_view text) {
    const int error = _file->writeAt(_end, std::string(text).append(CLOSING));
    if (error == 0) {
        _end += static_cast<std::int64_t>(text.size());
        return;
    }
    _file->writeAt(_end, CLOSING);
    _file->truncate(_end + static_cast<std::int64_t>(CLOSING.size()));
    throw ExSysError(ORV_FILE, __LINE__, ("write to " + _name).c_str(), error);
}

void LgChromeSink::threadEnded(const LgThread& thread) {
    _namedThreads.erase(thread.number);
}

}  // namespace Orv
