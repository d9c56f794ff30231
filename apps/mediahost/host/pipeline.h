#pragma once

#include <cstdint>
#include <filesystem>
#include <string>
#include <vector>

#include "settings.h"

namespace MediaHost {

/// What is to be played and how: devices, how their streams are connected, in which order they
/// start, and what is set. `where` tells for messages where something was asked for.
struct Pipeline {
    struct Device {
        std::string name;
        std::string kind;  ///< As listKinds() has them.
        Settings settings;
        std::string where;
    };
    struct Line {
        std::string text;
        std::string where;
    };

    std::vector<Device> devices;
    std::vector<Line> connections;  ///< Stream strings.
    Line sequence;                  ///< A tree string; empty: one that fits the connections.
    std::vector<Line> sets;         ///< "device:sets:property=value"
    std::vector<Line> watches;      ///< "device:sets:property"

    std::uint64_t cacheBytes = 64 << 20;
    std::int64_t cachePictures = 0;  ///< If not 0 the cache holds so many, whatever their size.
    std::string strategy = "lru";
    std::string timecode = "pal";
    std::string rate = "fast";  ///< "fast", "realtime" or a multiple of it
    bool isReverse = false;
    std::int64_t nbLoops = 1;
    double patienceSeconds = 10;   ///< What a stop, and then an abort, may take.
    std::filesystem::path folder;  ///< Empty: nothing is written.
    std::filesystem::path trace;   ///< Empty: none.

    void addDevice(const std::string& name, const std::string& kind, Settings settings = {});
    void connect(const std::string& text) {
        connections.push_back({text, "the connection " + text});
    }

    // Options from text; @throws MediaError that says what was expected
    void setCache(const std::string& text);  ///< "64M", "1G", "512k", "10frames"
    void setStrategy(const std::string& text);
    void setTimecode(const std::string& text);
    void setRate(const std::string& text);
    void setLoops(const std::string& text);
    void setPatience(const std::string& text);

    /// Reads a text file, of which docs/mediahost.md tells the form.
    /// @throws MediaError that names file, line and what was expected.
    static Pipeline read(const std::filesystem::path& path);
};

}  // namespace MediaHost
