#pragma once

#include <filesystem>
#include <memory>

#include "lgSink.h"

namespace Orv {

/// Writes lines for a person to read: seconds on the monotonic clock, severity, category, thread,
/// text. Further lines of one text are indented. Timeline events are left out.
class ORV_BASE_API LgTextSink : public LgSink {
public:
    void write(const LgRecord& record, const LgThread& thread) override;
    void flush() override;

protected:
    /// Writes whole lines to where they belong.
    /// @return 0 or the operating system's error.
    virtual int performWrite(std::string_view lines) noexcept = 0;

private:
    std::string _lines;    // not written yet
    bool _isTorn = false;  // the last line that was written may lack its end
};

/// The program's standard error, whatever that is at the time of writing.
class ORV_BASE_API LgStandardErrorSink : public LgTextSink {
public:
    std::string getName() const override;

protected:
    int performWrite(std::string_view lines) noexcept override;
};

/// A text file, which starts with the wall-clock time that belongs to the monotonic clock.
class ORV_BASE_API LgFileSink : public LgTextSink {
public:
    /// Creates or empties the file. @throws ExSysError
    explicit LgFileSink(const std::filesystem::path& path);
    ~LgFileSink() override;

    std::string getName() const override;

protected:
    int performWrite(std::string_view lines) noexcept override;

private:
    class File;
    std::unique_ptr<File> _file;  // never null
    std::string _name;
};

}  // namespace Orv
