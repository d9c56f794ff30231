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
std::string LgChromeSink::makeHead(const char* phase, const LgThread& thread) {
    return formatText("{\"ph\":\"%s\",\"pid\":%llu,\"tid\":%llu", phase,
                      static_cast<unsigned long long>(LgSystem::getProcessId()),
                      static_cast<unsigned long long>(thread.number));
}

/// Adds a whole event, or nothing if there is no memory for it.
void LgChromeSink::addEvent(std::string_view event) {
    const bool isFirst = _events.empty() && _end == static_cast<std::int64_t>(OPENING.size());
    _events.reserve(_events.size() + event.size() + 2);
    _events.append(isFirst ? "\n" : ",\n").append(event);
}

void LgChromeSink::addThreadName(const LgThread& thread) {
    std::string event = makeHead("M", thread) + ",\"name\":\"thread_name\",\"args\":{\"name\":";
    appendJsonText(event,
                   thread.name.empty() ? "thread " + std::to_string(thread.osId) : thread.name);
    addEvent(event + "}}");
    _namedThreads.insert(thread.number);
}

void LgChromeSink::write(const LgRecord& record, const LgThread& thread) {
    using Kind = LgRecord::Kind;
    if (!_namedThreads.contains(thread.number) || record.kind == Kind::THREAD_NAME) {
        addThreadName(thread);
    }
    if (record.kind == Kind::THREAD_NAME) return;

    std::string event = makeHead(phaseOf(record.kind), thread);
    const auto nanoseconds = static_cast<long long>(record.nanoseconds);
    event += formatText(",\"ts\":%lld.%03lld", nanoseconds / 1000, nanoseconds % 1000);
    if (record.kind != Kind::SPAN_END) {
        event += ",\"cat\":";
        appendJsonText(event, record.category);
        event += ",\"name\":";
        appendJsonText(event, record.text);
    }
    if (record.kind == Kind::LINE || record.kind == Kind::INSTANT) event += ",\"s\":\"t\"";
    if (record.kind == Kind::ASYNC_BEGIN || record.kind == Kind::ASYNC_END) {
        event += formatText(",\"id\":\"0x%llx\"", static_cast<unsigned long long>(record.id));
    }
    if (record.kind == Kind::COUNTER) {
        const std::string value =
            std::isfinite(record.value) ? formatText("%.17g", record.value) : "null";
        event += ",\"args\":{\"value\":" + value + "}";
    }
    addEvent(event + '}');
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
    _namedThreads.clear();  // some of the names may be among what is lost
    _file->truncate(_end + static_cast<std::int64_t>(CLOSING.size()));
    throw ExSysError(ORV_FILE, __LINE__, ("write to " + _name).c_str(), error);
}

void LgChromeSink::threadEnded(const LgThread& thread) {
    _namedThreads.erase(thread.number);
}

}  // namespace Orv
