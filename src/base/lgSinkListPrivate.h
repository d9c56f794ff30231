#pragma once

#include <memory>
#include <string>
#include <vector>

#include "lgSink.h"

namespace Orv {

/// The sinks of the log. A sink that throws keeps no record from the others, and nothing escapes.
class LgSinkList {
public:
    void add(std::shared_ptr<LgSink> sink);
    std::shared_ptr<LgSink> remove(const LgSink& sink) noexcept;  ///< Null if it is not there.
    bool wantTimeline() const noexcept;

    void write(const LgRecord& record, const LgThread& thread) noexcept;
    void threadEnded(const LgThread& thread) noexcept;

    /// @param now  the time of the reports of sinks that have failed since the last call.
    void flush(std::int64_t now) noexcept;

private:
    struct Entry {
        std::shared_ptr<LgSink> sink;
        bool hasFailed = false;  // then it has been reported, once and for all
    };

    template <class Action>
    void forEach(Action action) noexcept;
    void noteFailure(Entry& entry) noexcept;

    std::vector<Entry> _entries;
    std::vector<std::string> _failures;  // to be reported
};

}  // namespace Orv
