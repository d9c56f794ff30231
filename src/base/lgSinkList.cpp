#include <algorithm>
#include <utility>

#include "currentException.h"
#include "lgSinkListPrivate.h"

namespace Orv {

template <class Action>
void LgSinkList::forEach(Action action) noexcept {
    for (Entry& entry : _entries) {
        try {
            action(*entry.sink);
        } catch (...) {
            noteFailure(entry);
        }
    }
}

void LgSinkList::noteFailure(Entry& entry) noexcept {
    if (entry.hasFailed) return;
    entry.hasFailed = true;
    try {
        _failures.push_back("The log's " + entry.sink->getName() +
                            " has failed: " + describeCurrentException());
    } catch (...) {
        // No memory for the report: the sinks that work still get the records.
    }
}

void LgSinkList::add(std::shared_ptr<LgSink> sink) {
    _entries.push_back({std::move(sink)});
}

std::shared_ptr<LgSink> LgSinkList::remove(const LgSink& sink) noexcept {
    const auto found =
        std::ranges::find(_entries, &sink, [](const Entry& entry) { return entry.sink.get(); });
    if (found == _entries.end()) return nullptr;
    std::shared_ptr<LgSink> removed = std::move(found->sink);
    _entries.erase(found);
    return removed;
}

bool LgSinkList::wantTimeline() const noexcept {
    return std::ranges::any_of(_entries,
                               [](const Entry& entry) { return entry.sink->wantsTimeline(); });
}

void LgSinkList::write(const LgRecord& record, const LgThread& thread) noexcept {
    forEach([&](LgSink& sink) { sink.write(record, thread); });
}

void LgSinkList::threadEnded(const LgThread& thread) noexcept {
    forEach([&](LgSink& sink) { sink.threadEnded(thread); });
}

void LgSinkList::flush(std::int64_t now) noexcept {
    forEach([](LgSink& sink) { sink.flush(); });
    while (!_failures.empty()) {  // ends, since each sink fails for the first time but once
        const std::vector<std::string> failures = std::exchange(_failures, {});
        for (const std::string& failure : failures) {
            write({.severity = LgSeverity::FAILURE,
                   .category = "log",
                   .text = failure,
                   .nanoseconds = now},
                  LgThread{.name = "log"});
        }
        forEach([](LgSink& sink) { sink.flush(); });
    }
}

}  // namespace Orv
