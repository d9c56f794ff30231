#pragma once

#include <cstdint>
#include <filesystem>
#include <memory>
#include <set>

#include "lgSink.h"

namespace Orv {

/// Writes the timeline, with the log's lines in it, as JSON in the Trace Event Format, which
/// chrome://tracing and ui.perfetto.dev show: threads by name, spans, asynchronous spans, counters.
///
/// The file is valid JSON from the constructor on and after every flush, so that it can be read
/// when the program was aborted, too. Bytes that are no UTF-8 are shown as Latin-1.
class ORV_BASE_API LgChromeSink : public LgSink {
public:
    /// Creates or empties the file. @throws ExSysError
    explicit LgChromeSink(const std::filesystem::path& path);
    ~LgChromeSink() override;

    void write(const LgRecord& record, const LgThread& thread) override;
    void flush() override;
    void threadEnded(const LgThread& thread) override;
    bool wantsTimeline() const noexcept override { return true; }
    std::string getName() const override;

private:
    class File;

    static std::string makeHead(const char* phase, const LgThread& thread);
    void addEvent(std::string_view event);
    void addThreadName(const LgThread& thread);
    void writeAtEnd(std::string_view text);

    std::unique_ptr<File> _file;  // never null
    std::string _name;
    std::string _events;                    // not written yet
    std::int64_t _end;                      // bytes in the file, without the closing brackets
    std::set<std::uint64_t> _namedThreads;  // in the file, and not ended
};

}  // namespace Orv
