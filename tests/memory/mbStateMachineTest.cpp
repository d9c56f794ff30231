// What the machine shows of itself: traces, the timeline, the picture.
#include <gtest/gtest.h>
#include <memory>
#include <sstream>

#include "lgSink.h"
#include "mbStateMachine.h"
#include "mbTestKit.h"
#include "traceManager.h"

namespace Orv {

namespace {

class EventSink : public LgSink {
public:
    explicit EventSink(bool wantsTimeline) : _wantsTimeline(wantsTimeline) {}
    void write(const LgRecord& record, const LgThread&) override {
        if ((record.kind == LgRecord::Kind::INSTANT) == _wantsTimeline) {
            texts += std::string(record.text) + '\n';
        }
    }
    bool wantsTimeline() const noexcept override { return _wantsTimeline; }
    std::string getName() const override { return "EventSink"; }

    std::string texts;

private:
    const bool _wantsTimeline;
};

/// What the log shows of loading, unloading and destroying a buffer.
std::string logLife(bool isTraced, bool wantsTimeline) {
    TraceManager& manager = TraceManager::getInstance();
    const auto sink = std::make_shared<EventSink>(wantsTimeline);
    manager.setStandardErrorOn(false);
    manager.addSink(sink);
    manager.switchLevel("memoryBuffers", true);
    {
        BufferBench bench(MbInitialState::FREED, isTraced);
        bench.buffer->rdlock();
        bench.buffer->unload();
        bench.buffer->unlock();
        bench.buffer->unload();
    }
    manager.switchLevel("memoryBuffers", false);
    manager.flush();
    manager.removeSink(*sink);
    manager.setStandardErrorOn(true);
    return sink->texts;
}

TEST(MbStateMachine, tracesEveryEventInOneSetOfStatesOnly) {
    EXPECT_EQ(logLife(true, false),
              "buffer B in Freed: rdlock()\n"
              "buffer B in RdLocked: unload (ignored)\n"
              "buffer B in RdLocked: unlock()\n"
              "buffer B in Loaded: unload()\n"
              "buffer B in Unloaded: destroy()\n");
    EXPECT_EQ(logLife(false, false), "");
}

TEST(MbStateMachine, showsTransitionsInTheTimeline) {
    EXPECT_EQ(logLife(false, true),
              "B: BeingRdLoaded\nB: RdLocked\nB: BeingUnlocked\nB: Loaded\nB: BeingUnloaded\n"
              "B: Unloaded\nB: Destroyed\n");
}

TEST(MbStateMachine, writesItsTableAsAGraph) {
    std::ostringstream stream;
    MbStateMachine::writeDot(stream);
    const std::string dot = stream.str();
    for (const char* const arrow :
         {"Freed -> BeingRdLoaded [label=\"rdlock\"]", "BeingRdLoaded -> RdLocked [style=dashed]",
          "RdLocked -> BeingUnlocked [label=\"last unlock\"]",
          "WaitAsyncSynched -> AsyncSyncFailed [label=\"asyncOpFailed\"]",
          "Synched -> Destroyed [label=\"destroy\"]"}) {
        EXPECT_NE(dot.find(arrow), std::string::npos) << arrow;
    }
}

}  // namespace

}  // namespace Orv
