#include "devSeqSMTable.h"

#include "assertions.h"
#include "devSMTableBuilder.h"
#include "devSeqEv.h"
#include "devSeqState.h"

namespace Orv {

namespace {

constexpr const char* STATES[] = {"init", "start",   "wsr", "ready", "wml",   "sync",
                                  "lock", "recover", "wss", "stop",  "abort", "final"};

constexpr const char* EVENTS[] = {"start",   "ready", "sready",  "proceed",  "lock",  "mlock",
                                  "recover", "stop",  "stopped", "sstopped", "abort", "aborted"};

constexpr const char* TRANSITIONS[] = {"start", "psready", "wsr",     "wsrret",  "ready",  "wml",
                                       "sync",  "lock",    "recover", "wss",     "wssret", "stop",
                                       "pstop", "stopped", "abort",   "aborted", "ignore"};

/// Of two transitions the first one decides, and the second is its alternative.
struct Pair {
    const char* state;
    const char* event;
    const char* transition;
    const char* alternative = nullptr;
};

constexpr Pair PAIRS[] = {{"init", "start", "start"},
                          {"start", "ready", "ready", "wsr"},
                          {"start", "sready", "psready"},
                          {"start", "stop", "pstop"},
                          {"wsr", "sready", "wsrret", "ready"},
                          {"wsr", "stop", "pstop"},
                          {"ready", "proceed", "sync", "wml"},
                          {"ready", "stop", "pstop"},
                          {"wml", "mlock", "sync"},
                          {"wml", "stop", "pstop"},
                          {"sync", "lock", "lock"},
                          {"sync", "stop", "pstop"},
                          {"lock", "stop", "stop", "wss"},
                          {"lock", "recover", "recover"},
                          {"lock", "sready", "lock"},
                          {"lock", "mlock", "ignore"},
                          {"recover", "ready", "ready", "wsr"},
                          {"recover", "sready", "psready"},
                          {"recover", "stop", "pstop"},
                          {"wss", "sstopped", "wssret", "stop"},
                          {"stop", "stopped", "stopped"},
                          {"abort", "aborted", "aborted"}};

struct Next {
    const char* state;
    const char* transition;
    const char* nextState;
};

constexpr Next NEXT_STATES[] = {{"init", "start", "start"},        {"start", "ready", "ready"},
                                {"start", "wsr", "wsr"},           {"start", "psready", "start"},
                                {"start", "pstop", "start"},       {"wsr", "wsrret", "wsr"},
                                {"wsr", "ready", "ready"},         {"wsr", "pstop", "wsr"},
                                {"ready", "sync", "sync"},         {"ready", "wml", "wml"},
                                {"ready", "pstop", "ready"},       {"wml", "sync", "sync"},
                                {"wml", "pstop", "wml"},           {"sync", "lock", "lock"},
                                {"sync", "pstop", "sync"},         {"lock", "wss", "wss"},
                                {"lock", "stop", "stop"},          {"lock", "recover", "recover"},
                                {"lock", "lock", "lock"},          {"lock", "ignore", "lock"},
                                {"recover", "wsr", "wsr"},         {"recover", "ready", "ready"},
                                {"recover", "psready", "recover"}, {"recover", "pstop", "recover"},
                                {"wss", "wssret", "wss"},          {"wss", "stop", "stop"},
                                {"stop", "stopped", "final"},      {"abort", "aborted", "final"}};

struct Condition {
    const char* transition;
    const char* alternative;
};

constexpr Condition CONDITIONS[] = {
    {"ready", "wsr"}, {"stop", "wss"}, {"sync", "wml"}, {"wsrret", "ready"}, {"wssret", "stop"}};

constexpr const char* WORKING_STATES[] = {"start", "wsr",     "ready", "wml", "sync",
                                          "lock",  "recover", "wss",   "stop"};

constexpr const char* IGNORED_EVENTS[] = {"ready",   "sready", "proceed", "lock",     "mlock",
                                          "recover", "stop",   "stopped", "sstopped", "abort"};

bool operator==(int index, DevSeqEv event) {
    return index == static_cast<int>(event);
}

bool operator==(int index, DevSeqState state) {
    return index == static_cast<int>(state);
}

/// The names, spelled as the checks show them.
struct EventNames {
    const char* start = "start";
    const char* ready = "ready";
    const char* sready = "sready";
    const char* proceed = "proceed";
    const char* lock = "lock";
    const char* mlock = "mlock";
    const char* recover = "recover";
    const char* stop = "stop";
    const char* stopped = "stopped";
    const char* sstopped = "sstopped";
    const char* abort = "abort";
    const char* aborted = "aborted";
};

void checkEvents(const DevSMTable* smtable) {
    const EventNames names;
    const EventNames* const e = &names;
    ORV_ASSERT(smtable->getEvent(e->start) == DevSeqEv::START);
    ORV_ASSERT(smtable->getEvent(e->ready) == DevSeqEv::READY);
    ORV_ASSERT(smtable->getEvent(e->sready) == DevSeqEv::SREADY);
    ORV_ASSERT(smtable->getEvent(e->proceed) == DevSeqEv::PROCEED);
    ORV_ASSERT(smtable->getEvent(e->lock) == DevSeqEv::LOCK);
    ORV_ASSERT(smtable->getEvent(e->mlock) == DevSeqEv::MLOCK);
    ORV_ASSERT(smtable->getEvent(e->recover) == DevSeqEv::RECOVER);
    ORV_ASSERT(smtable->getEvent(e->stop) == DevSeqEv::STOP);
    ORV_ASSERT(smtable->getEvent(e->stopped) == DevSeqEv::STOPPED);
    ORV_ASSERT(smtable->getEvent(e->sstopped) == DevSeqEv::SSTOPPED);
    ORV_ASSERT(smtable->getEvent(e->abort) == DevSeqEv::ABORT);
    ORV_ASSERT(smtable->getEvent(e->aborted) == DevSeqEv::ABORTED);
}

}  // namespace

void DevSeqSMTable::describe(DevSMTableBuilder& builder) {
    for (const char* const name : STATES) builder.addState(name);
    for (const char* const name : EVENTS) builder.addEvent(name);
    for (const char* const name : TRANSITIONS) builder.addTransition(name);
    for (const Pair& pair : PAIRS) {
        builder.associate(pair.state, pair.event, pair.transition);
        if (pair.alternative != nullptr) {
            builder.associate(pair.state, pair.event, pair.alternative);
        }
    }
    for (const Next& next : NEXT_STATES) {
        builder.associateNext(next.state, next.transition, next.nextState);
    }
    for (const Condition& condition : CONDITIONS) {
        builder.addCondition(condition.transition, {condition.transition, condition.alternative});
    }
    for (const char* const state : WORKING_STATES) {
        builder.associate(state, "abort", "abort");
        builder.associateNext(state, "abort", "abort");
    }
    for (const char* const event : IGNORED_EVENTS) builder.associate("abort", event, "ignore");
    builder.associateNext("abort", "ignore", "abort");
}

void DevSeqSMTable::check(const DevSMTable& smtable) {
    checkEvents(&smtable);
    ORV_ASSERT(smtable.getState("init") == DevSeqState::INIT);
    ORV_ASSERT(smtable.getState("final") == DevSeqState::FINAL);
    ORV_ASSERT(smtable.getState("_ill") == DevSeqState::ILLEGAL);
    ORV_ASSERT(smtable.getState("_exc") == DevSeqState::EXCEPTION);
}

const RCShdPtr<DevSMTable>& DevSeqSMTable::get() {
    // Never destroyed: machines may run while the process ends.
    static const RCShdPtr<DevSMTable>& table = *[] {
        DevSMTableBuilder builder;
        describe(builder);
        builder.expand();
        RCShdPtr<DevSMTable> built = builder.build();
        check(*built);
        return new RCShdPtr<DevSMTable>(std::move(built));
    }();
    return table;
}

}  // namespace Orv
