#pragma once

#include <condition_variable>
#include <mutex>

#include "gate.h"
#include "lgRegistry.h"
#include "lgSink.h"

namespace Orv {

/// Keeps what it is given, and may be made to hold up or fail whoever writes.
class LgCollectingSink : public LgSink {
public:
    struct Entry {
        LgRecord record;  // without its text
        std::string text;
        std::uint64_t thread;
        std::string threadName;
    };

    std::function<void(const LgRecord&)> onWrite;  // set before the sink is added
    std::atomic<int> nbFlushes{0};
    bool takesTimeline = false;

    void write(const LgRecord& record, const LgThread& thread) override {
        if (onWrite) onWrite(record);
        const std::lock_guard guard(_mutex);
        _entries.push_back({record, std::string(record.text), thread.number, thread.name});
        _entries.back().record.text = {};
        _changed.notify_all();
    }

    void flush() override { ++nbFlushes; }
    bool wantsTimeline() const noexcept override { return takesTimeline; }
    std::string getName() const override { return "collector"; }

    std::vector<Entry> take() {
        const std::lock_guard guard(_mutex);
        return std::exchange(_entries, {});
    }

    std::vector<std::string> takeTexts() {
        std::vector<std::string> texts;
        for (const Entry& entry : take()) texts.push_back(entry.text);
        return texts;
    }

    /// Waits until that many entries are there.
    void waitFor(std::size_t nbEntries) {
        std::unique_lock guard(_mutex);
        _changed.wait(guard, [&] { return _entries.size() >= nbEntries; });
    }

private:
    std::mutex _mutex;
    std::condition_variable _changed;
    std::vector<Entry> _entries;
};

/// The log writes to one collecting sink for the time of a test, and not to standard error.
class LgLogTest : public testing::Test {
protected:
    LgLogTest() { registry.setStandardErrorOn(false); }

    ~LgLogTest() override {
        if (_isAdded) registry.removeSink(*sink);
        registry.setStandardErrorOn(true);
    }

    void addSink() {
        registry.addSink(sink);
        _isAdded = true;
    }

    LgRegistry& registry = LgRegistry::getInstance();
    const std::shared_ptr<LgCollectingSink> sink = std::make_shared<LgCollectingSink>();

private:
    bool _isAdded = false;
};

/// Holds up a sink until it is opened.
struct LgTestGate {
    TestCounter reached;
    Gate opened;

    void pass() {
        reached.add();
        opened.wait();
    }
};

}  // namespace Orv
