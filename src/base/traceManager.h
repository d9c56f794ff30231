#pragma once

#include <map>
#include <memory>
#include <mutex>
#include <string>
#include <string_view>
#include <vector>

#include "baseApi.h"

namespace Orv {

class LgSink;
class TraceLevel;

/// The trace levels of the process and where their lines go. Code traces with ORV_TRACE.
///
/// - Threads: every member may be called by any thread, before main() and after it.
class ORV_BASE_API TraceManager {
public:
    static TraceManager& getInstance();

    // Levels

    /// Switches all levels of that name, also those that come later with another library.
    /// @return false if there is none yet.
    bool switchLevel(std::string_view name, bool isOn);

    /// Switches the levels that there are, "main" excepted.
    void switchAll(bool isOn);

    bool isOn(std::string_view name) const;          ///< Whether a level of that name is on.
    std::vector<std::string> getLevelNames() const;  ///< Sorted, each once.

    // Lines

    /// Writes a line, whether or not the level is on. Never blocks, see LgRegistry::log().
    void print(const TraceLevel& level, std::string_view text) noexcept;

    /// Writes out what was printed before the call; for instance ahead of an abort.
    /// @return false if a sink kept another thread busy for a second, or when called by a sink.
    bool flush() noexcept;

    // Sinks, see LgRegistry

    void addSink(std::shared_ptr<LgSink> sink);
    bool removeSink(const LgSink& sink);
    void setStandardErrorOn(bool isOn);

private:
    friend class TraceLevel;

    TraceManager() = default;
    ~TraceManager() = delete;  // lives as long as the process

    void add(const TraceLevel& level);
    void remove(const TraceLevel& level) noexcept;

    mutable std::mutex _mutex;
    // Guarded by _mutex:
    std::vector<const TraceLevel*> _levels;
    std::map<std::string, bool, std::less<>> _wishes;  // by level name
};

}  // namespace Orv
