#include "pipeline.h"

#include <algorithm>
#include <charconv>
#include <fstream>
#include <functional>
#include <map>
#include <utility>

#include "mediaError.h"

namespace MediaHost {

namespace {

using Words = std::vector<std::string>;

[[noreturn]] void expect(const std::string& expected, const std::string& got) {
    throw MediaError("expected " + expected +
                     (got.empty() ? ", got nothing" : ", got \"" + got + '"'));
}

template <class T>
bool parseAll(std::string_view text, T& number) {
    const auto [end, error] = std::from_chars(text.data(), text.data() + text.size(), number);
    return error == std::errc() && end == text.data() + text.size();
}

void checkOneOf(const std::string& text, const std::vector<std::string>& choices) {
    if (std::find(choices.begin(), choices.end(), text) != choices.end()) return;
    std::string expected = "one of";
    for (const std::string& choice : choices) expected += ' ' + choice;
    expect(expected, text);
}

// Words are parted by blanks; those between double quotes stay together; "#" begins a comment.
Words splitLine(const std::string& line) {
    Words words;
    std::string word;
    bool isQuoted = false;
    bool hasWord = false;
    for (const char c : line) {
        if (c == '"') {
            isQuoted = !isQuoted;
            hasWord = true;
        } else if (!isQuoted && c == '#' && !hasWord) {
            break;
        } else if (!isQuoted && (c == ' ' || c == '\t' || c == '\r')) {
            if (hasWord) words.push_back(std::exchange(word, {}));
            hasWord = false;
        } else {
            word += c;
            hasWord = true;
        }
    }
    if (isQuoted) expect("a closing quote", line);
    if (hasWord) words.push_back(word);
    return words;
}

std::string join(const Words& words, std::size_t first) {
    std::string text;
    for (std::size_t i = first; i < words.size(); ++i) {
        text += (i > first ? " " : "") + words[i];
    }
    return text;
}

class Reader {
public:
    explicit Reader(const std::filesystem::path& path) : _path(path) {}

    Pipeline read() {
        std::ifstream file(_path);
        if (!file) throw MediaError("cannot open the pipeline \"" + _path.string() + '"');
        std::string line;
        for (_number = 1; std::getline(file, line); ++_number) {
            try {
                takeLine(splitLine(line));
            } catch (const MediaError&) {
                throwBecause(where());
            }
        }
        if (_pipeline.devices.empty()) {
            throw MediaError(_path.string() + ": expected at least one line \"device NAME KIND\"");
        }
        return std::move(_pipeline);
    }

private:
    const std::filesystem::path _path;
    int _number = 0;
    Pipeline _pipeline;

    std::string where() const { return _path.string() + ':' + std::to_string(_number); }

    static const std::string& only(const Words& words, const char* expected) {
        if (words.size() != 2) expect(expected, join(words, 1));
        return words[1];
    }

    void takeLine(const Words& words) {
        using Take = std::function<void(Reader&, const Words&)>;
        static const std::map<std::string, Take> TAKES = {
            {"device", [](Reader& r, const Words& w) { r.takeDevice(w); }},
            {"connect", [](Reader& r, const Words& w) { r.takeConnection(w); }},
            {"sequence", [](Reader& r, const Words& w) { r.takeSequence(w); }},
            {"set",
             [](Reader& r, const Words& w) {
                 const std::string& text = only(w, "DEVICE:PROPERTY=VALUE");
                 if (text.find('=') == std::string::npos) expect("DEVICE:PROPERTY=VALUE", text);
                 r._pipeline.sets.push_back({text, r.where()});
             }},
            {"watch",
             [](Reader& r, const Words& w) {
                 r._pipeline.watches.push_back({only(w, "DEVICE:PROPERTY"), r.where()});
             }},
            {"cache", [](Reader& r, const Words& w) { r._pipeline.setCache(only(w, "a size")); }},
            {"strategy",
             [](Reader& r, const Words& w) { r._pipeline.setStrategy(only(w, "a strategy")); }},
            {"timecode",
             [](Reader& r, const Words& w) { r._pipeline.setTimecode(only(w, "a timecode")); }},
            {"rate", [](Reader& r, const Words& w) { r._pipeline.setRate(only(w, "a rate")); }},
            {"loops", [](Reader& r, const Words& w) { r._pipeline.setLoops(only(w, "a number")); }},
            {"patience",
             [](Reader& r, const Words& w) { r._pipeline.setPatience(only(w, "a number")); }},
            {"reverse",
             [](Reader& r, const Words& w) {
                 if (w.size() != 1) expect("nothing behind \"reverse\"", join(w, 1));
                 r._pipeline.isReverse = true;
             }},
            {"out", [](Reader& r, const Words& w) { r._pipeline.folder = only(w, "a folder"); }},
            {"trace", [](Reader& r, const Words& w) { r._pipeline.trace = only(w, "a file"); }},
        };
        if (words.empty()) return;
        const auto found = TAKES.find(words[0]);
        if (found == TAKES.end()) {
            expect(
                "device, connect, sequence, set, watch, cache, strategy, timecode, rate, loops, "
                "patience, reverse, out or trace",
                words[0]);
        }
        found->second(*this, words);
    }

    void takeDevice(const Words& words) {
        if (words.size() < 3) expect("device NAME KIND [SETTING=VALUE]...", join(words, 0));
        for (const Pipeline::Device& device : _pipeline.devices) {
            if (device.name == words[1]) expect("a name that no other device has", words[1]);
        }
        Pipeline::Device device{words[1], words[2], {}, where()};
        for (std::size_t i = 3; i < words.size(); ++i) {
            const std::size_t equals = words[i].find('=');
            if (equals == std::string::npos || equals == 0) expect("SETTING=VALUE", words[i]);
            device.settings.set(words[i].substr(0, equals), words[i].substr(equals + 1));
        }
        _pipeline.devices.push_back(std::move(device));
    }

    void takeConnection(const Words& words) {
        if (words.size() != 4 || (words[2] != "push" && words[2] != "pull")) {
            expect("connect DEVICE:STREAM push|pull DEVICE:STREAM", join(words, 0));
        }
        _pipeline.connections.push_back({join(words, 1), where()});
    }

    void takeSequence(const Words& words) {
        if (!_pipeline.sequence.text.empty()) expect("one line \"sequence\"", join(words, 0));
        if (words.size() < 2) expect("sequence (LEADER (DEVICE...))", join(words, 0));
        _pipeline.sequence = {join(words, 1), where()};
    }
};

}  // namespace

void Pipeline::addDevice(const std::string& name, const std::string& kind, Settings settings) {
    devices.push_back({name, kind, std::move(settings), "the device \"" + name + '"'});
}

void Pipeline::setCache(const std::string& text) {
    const std::string expected = "a size such as 64M, 1G or 10frames";
    std::uint64_t number = 0;
    const auto [end, error] = std::from_chars(text.data(), text.data() + text.size(), number);
    const std::string unit(end, text.data() + text.size());
    static const std::map<std::string, int> SHIFTS = {
        {"", 0}, {"k", 10}, {"K", 10}, {"M", 20}, {"G", 30}};
    if (error != std::errc() || number == 0 || number > (std::uint64_t{1} << 30))
        expect(expected, text);
    if (unit == "frames" || unit == "frame") {
        cachePictures = static_cast<std::int64_t>(number);
        return;
    }
    const auto shift = SHIFTS.find(unit);
    if (shift == SHIFTS.end()) expect(expected, text);
    cacheBytes = number << shift->second;
    cachePictures = 0;
}

void Pipeline::setStrategy(const std::string& text) {
    checkOneOf(text, {"lru", "random"});
    strategy = text;
}

void Pipeline::setTimecode(const std::string& text) {
    checkOneOf(text, {"film24", "pal", "ntsc-nd", "ntsc-df"});
    timecode = text;
}

void Pipeline::setRate(const std::string& text) {
    double number = 0;
    if (text != "fast" && text != "realtime" &&
        (!parseAll(text, number) || !(number >= 0.01) || !(number <= 100))) {
        expect("fast, realtime, or a multiple of real time from 0.01 to 100", text);
    }
    rate = text;
}

void Pipeline::setLoops(const std::string& text) {
    if (!parseAll(text, nbLoops) || nbLoops < 0) {
        expect("how often to play, from 1 on, or 0 for ever", text);
    }
}

void Pipeline::setPatience(const std::string& text) {
    if (!parseAll(text, patienceSeconds) || !(patienceSeconds >= 0) || !(patienceSeconds <= 1e6)) {
        expect("seconds", text);
    }
}

Pipeline Pipeline::read(const std::filesystem::path& path) {
    return Reader(path).read();
}

}  // namespace MediaHost
