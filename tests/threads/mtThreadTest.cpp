// The life of a thread: start, join, what the body throws, cancellation, destruction.
#include <condition_variable>
#include <gtest/gtest.h>
#include <mutex>

#include "eventually.h"
#include "expectThrows.h"
#include "gate.h"
#include "lgCollectingSink.h"
#include "mtEx.h"
#include "mtLogger.h"
#include "mtSpecificData.h"
#include "processUsage.h"
#include "threadTesting.h"
#include "trace.h"

namespace Orv {

namespace {

TEST(MtThread, theBodyFindsItselfRunningNamedPlacedAtItsLevelAndNotCancelled) {
    const ObjPtr<MtThread> thread = makeThread("decoder", [&](MtThread& self) {
        EXPECT_TRUE(self.isRunning());
        EXPECT_FALSE(self.isCancelRequested());
        EXPECT_TRUE(self.getThreadId().isCurrentThread());
        EXPECT_EQ(MtThreadMgr::findCurrentThread(), &self);
        EXPECT_EQ(self.getPriorityLevel(), 1);
    });
    thread->setPriorityLevel(1);
    for (int round = 0; round < 3; ++round) {
        thread->requestCancel(false);
        thread->start();
        EXPECT_FALSE(thread->getThreadId().isNull());
        thread->join();
        EXPECT_FALSE(thread->isRunning());
        EXPECT_TRUE(thread->getThreadId().isNull());
    }
}

TEST(MtThread, aThreadWithoutProtocolEndsAtOnce) {
    const ObjPtr<MtThread> thread = MtThreadFactory::getInstance().create("empty", nullptr);
    thread->start();
    EXPECT_TRUE(thread->timedJoin(30));
}

TEST(MtThread, startsOnlyWhenItMay) {
    const ErrandThread running;
    expectAsserts("!isRunningNoLock()", [&] { running->start(); });
    const ObjPtr<MtThread> thread = makeThread("late", [](MtThread&) {});
    MtThread::allowStart(false);
    expectAsserts("canStart()", [&] { thread->start(); });
    MtThread::allowStart();
    thread->start();
    thread->join();
}

TEST(MtThread, ofTwoStartsAtOnceOneSucceeds) {
    for (int round = 0; round < 50; ++round) {
        Gate leave;
        const ObjPtr<MtThread> thread = makeThread("wanted", [&](MtThread&) { leave.wait(); });
        std::atomic<int> nbStarted{0}, nbRefused{0};
        std::vector<std::jthread> starters;
        for (int i = 0; i < 4; ++i) {
            starters.emplace_back([&] {
                try {
                    thread->start();
                    ++nbStarted;
                } catch (const AssertionFailed&) {
                    ++nbRefused;
                }
            });
        }
        starters.clear();
        EXPECT_EQ(nbStarted, 1);
        EXPECT_EQ(nbRefused, 3);
        leave.open();
        thread->join();
    }
}

TEST(MtThread, aBodyMayUseAllOfTheStackThatItWasPromised) {
    const auto use = [](std::size_t nbBytes) {
        volatile char* const stack = static_cast<volatile char*>(__builtin_alloca(nbBytes));
        for (std::size_t i = 0; i < nbBytes; i += 512) stack[i] = 1;
    };
    constexpr std::size_t callers = 16 * 1024;  // what the calls up to here have taken
    for (const unsigned size : {0u, 3000001u, 64u << 20}) {
        const ObjPtr<MtThread> thread = makeThread(
            "deep",
            [&](MtThread& self) {
                use(std::max<std::size_t>(self.getStackSize(), size == 0 ? 900000 : 0) - callers);
            },
            false, size);
        EXPECT_EQ(thread->getStackSize(), size == 0 ? 65536 : size);
        thread->start();
        thread->join();
    }
}

// What the body throws

struct NoException {};

template <class Thrown>
MtThreadFunction::Body throws(Thrown thrown) {
    return [thrown](MtThread&) { throw thrown; };
}

TEST(MtThread, whateverTheBodyThrowsReachesTheJoinerOnce) {
    const auto join = [](MtThreadFunction::Body body) {
        const ObjPtr<MtThread> thread = makeThread("50%s", std::move(body));
        thread->start();
        std::exception_ptr joined;
        try {
            thread->join();
        } catch (...) {
            joined = std::current_exception();
        }
        thread->join();  // the exception was delivered
        if (joined) std::rethrow_exception(joined);
    };
    const std::string prefix = "Thread \"50%s\" ended with an exception: ";

    const auto throwsOwn = throws(MtEx::ExNoContent("src/resmgt/x", 7, "slot"));
    expectThrows<MtEx::ExThrownException>(prefix + "Thread data \"slot\" has no content.",
                                          [&] { join(throwsOwn); });
    try {
        join(throwsOwn);
    } catch (const MtEx::ExThrownException& exception) {
        const std::unique_ptr<ExBase> copy(exception.clone());
        const auto& thrown = dynamic_cast<const MtEx::ExThrownException&>(*copy).getThrown();
        EXPECT_NE(dynamic_cast<const MtEx::ExNoContent*>(&thrown), nullptr);
        EXPECT_EQ(thrown.getLine(), 7);
    }
    expectThrows<MtEx::ExStdThrownException>(prefix + "no room",
                                             [&] { join(throws(std::length_error("no room"))); });
    expectThrows<MtEx::ExStdThrownException>(prefix + "an exception of type int",
                                             [&] { join(throws(7)); });
    try {
        join(throws(NoException()));
        ADD_FAILURE() << "nothing was thrown";
    } catch (const MtEx::ExStdThrownException& exception) {
        EXPECT_THROW(std::rethrow_exception(exception.getThrown()), NoException);
    }
}

/// Writes down what happens to it.
class RecordingProtocol : public MtThreadProtocol {
public:
    explicit RecordingProtocol(std::vector<std::string>& events) : _events(events) {}
    ~RecordingProtocol() override { add("destroyed"); }

    std::function<void(MtThread&)> body, finished, detach;

    void add(const char* event) {
        const std::lock_guard guard(mutex);
        _events.push_back(event);
    }

private:
    static inline std::mutex mutex;
    std::vector<std::string>& _events;

    void performAttach(MtThread*) override { add("attached"); }
    void performDetach(MtThread* thread) override {
        add("detached");
        if (detach) detach(*thread);
    }
    void performBody(MtThread* thread) override {
        add("body");
        if (body) body(*thread);
    }
    void performFinished(MtThread* thread) override {
        add("finished");
        if (finished) finished(*thread);
    }
    void performStop(MtThread* thread) override {
        add("stop");
        MtThreadProtocol::performStop(thread);
    }
    void performCanceled(MtThread*) override { add("canceled"); }
};

using Events = std::vector<std::string>;

struct Recorded {
    Events events;
    RecordingProtocol* protocol = new RecordingProtocol(events);
    ObjPtr<MtThread> thread =
        MtThreadFactory::getInstance().create("recorded", ObjPtr<MtThreadProtocol>(protocol));
};

struct ThrowingValue {
    ~ThrowingValue() noexcept(false) { throw std::runtime_error("deleter"); }
};

TEST(MtThread, endHooksAndDeletersCountAsTheBodyDoesAndTheFirstWins) {
    const MtSpecificData<ThrowingValue> slot("slot");
    for (const bool doesBodyThrow : {true, false}) {
        for (const bool doesHookThrow : {true, false}) {
            Recorded recorded;
            recorded.protocol->body = [&](MtThread&) {
                slot.get();
                if (doesBodyThrow) throw std::runtime_error("body");
            };
            recorded.protocol->finished = [&](MtThread& self) {
                EXPECT_EQ(MtThreadMgr::findCurrentThread(), &self);
                if (doesHookThrow) throw std::runtime_error("hook");
            };
            recorded.thread->start();
            const std::string first = doesBodyThrow ? "body" : doesHookThrow ? "hook" : "deleter";
            expectThrows<MtEx::ExStdThrownException>(
                "Thread \"recorded\" ended with an exception: " + first,
                [&] { recorded.thread->join(); });
        }
    }
}

using MtThreadDeathTest = testing::Test;

TEST(MtThreadDeathTest, anUnhandledExceptionIsLoggedAndEndsTheProcessWhereThatIsWanted) {
    const auto story = [] {
        const ObjPtr<MtThread> thread =
            makeThread("fatal", throws(std::runtime_error("the disk is full")), true);
        thread->start();
        thread->join();
    };
    EXPECT_DEATH(story(), "Terminating on unhandled exception\\..*fatal.*the disk is full");
}

class MtThreadLogTest : public LgLogTest {};

TEST_F(MtThreadLogTest, theLogKnowsTheThreadByItsName) {
    MtThreadMgr::getInstance();
    addSink();
    const ObjPtr<MtThread> thread =
        makeThread("decoder", [](MtThread&) { ORV_TRACE(TraceLevel::getMain()) << "hello"; });
    thread->start();
    thread->join();
    registry.flush();
    const auto entries = sink->take();
    ASSERT_EQ(entries.size(), 1u);
    EXPECT_EQ(entries[0].threadName, "decoder");
}

TEST_F(MtThreadLogTest, whatNobodyJoinsIsTraced) {
    MtThreadMgr::getInstance();
    addSink();
    Gate isOver;
    {
        const ObjPtr<MtThread> thread = makeThread("lost", throws(std::runtime_error("one")));
        thread->start();
        MtThreadMgr::getInstance().stopThreads(30);
        thread->start();  // a second run hides the first one's exception from joiners
        EXPECT_TRUE(eventually("the log has it", [&] {
            registry.flush();
            return !sink->takeTexts().empty();
        }));
        MtLogger::start();  // was stopped, too
    }
    registry.flush();
    const std::vector<std::string> texts = sink->takeTexts();
    ASSERT_EQ(texts.size(), 1u);
    EXPECT_NE(texts[0].find("one"), std::string::npos);
}

// Joining

TEST(MtThread, aTimedJoinGivesUpAndAnotherOneTakesOver) {
    Gate leave;
    const ObjPtr<MtThread> thread = makeThread("slow", [&](MtThread&) { leave.wait(); });
    thread->start();
    EXPECT_FALSE(thread->timedJoin(-1));
    EXPECT_FALSE(thread->timedJoin(0.02));
    TestCounter nbBegun;
    std::atomic<int> nbJoined{0};
    std::jthread patient([&] {
        nbBegun.add();
        thread->join();
        ++nbJoined;
    });
    std::vector<std::jthread> impatient;
    for (int i = 0; i < 4; ++i) {
        impatient.emplace_back([&] {
            nbBegun.add();
            EXPECT_FALSE(thread->timedJoin(0.02));
        });
    }
    ASSERT_TRUE(nbBegun.waitFor(5));
    impatient.clear();
    EXPECT_EQ(nbJoined, 0);
    leave.open();
    patient.join();
    EXPECT_EQ(nbJoined, 1);
    EXPECT_FALSE(thread->isRunning());
}

TEST(MtThread, ofManyJoinersAllReturnAndOneGetsTheException) {
    for (int round = 0; round < 30; ++round) {
        Gate leave;
        const ObjPtr<MtThread> thread = makeThread("joined", [&](MtThread&) {
            leave.wait();
            throw std::runtime_error("once");
        });
        thread->start();
        std::atomic<int> nbThrown{0}, nbReturned{0};
        std::vector<std::jthread> joiners;
        for (int i = 0; i < 8; ++i) {
            joiners.emplace_back([&, i] {
                try {
                    i % 2 == 0 ? thread->join() : static_cast<void>(thread->timedJoin(30));
                    ++nbReturned;
                } catch (const MtEx::ExStdThrownException&) {
                    ++nbThrown;
                }
            });
        }
        leave.open();
        joiners.clear();
        EXPECT_EQ(nbThrown, 1);
        EXPECT_EQ(nbReturned, 7);
    }
}

TEST(MtThread, joinersOfOneRunLeaveTheNextOneAlone) {
    constexpr int nbRounds = 300;
    int round = 0;
    const ObjPtr<MtThread> thread =
        makeThread("restarted", [&](MtThread&) { throw std::runtime_error("again"); });
    std::atomic<int> nbThrown{0};
    std::atomic<bool> isOver{false};
    const auto join = [&] {
        try {
            thread->join();
        } catch (const MtEx::ExStdThrownException&) {
            ++nbThrown;
        }
    };
    std::vector<std::jthread> joiners;
    for (int i = 0; i < 3; ++i) {
        joiners.emplace_back([&] {
            while (!isOver) join();
        });
    }
    for (; round < nbRounds; ++round) {
        thread->start();
        join();
    }
    isOver = true;
    joiners.clear();
    EXPECT_EQ(nbThrown, nbRounds);
}

TEST(MtThread, aThreadCannotJoinItselfNorAnybodyTheMainThread) {
    const ErrandThread errand;
    errand.run([&] { expectAsserts("!isCurrentThread()", [&] { errand->join(); }); });
    MtThread* const mainThread = MtThreadMgr::getInstance().findMainThread();
    ASSERT_NE(mainThread, nullptr);
    expectAsserts("!_isMainThread", [&] { mainThread->join(); });
}

// Cancellation

TEST(MtThread, cancellationIsAFlagThatTheBodyPolls) {
    Recorded recorded;
    Gate isSeen;
    recorded.protocol->body = [&](MtThread& self) {
        while (!self.isCancelRequested()) std::this_thread::yield();
        isSeen.open();
        while (self.isCancelRequested()) std::this_thread::yield();
    };
    MtThread& thread = *recorded.thread;
    expectAsserts("!check || isRunningNoLock()", [&] { thread.requestCancel(); });
    expectAsserts("isRunning()", [&] { static_cast<void>(thread.isCancelRequested()); });
    EXPECT_TRUE(recorded.events == Events{"attached"});
    thread.start();
    EXPECT_TRUE(thread.requestCancel());
    EXPECT_FALSE(thread.requestCancel());
    ASSERT_TRUE(isSeen.wait());
    EXPECT_TRUE(thread.clearCancel());
    EXPECT_FALSE(thread.clearCancel());
    thread.join();
    EXPECT_EQ(std::count(recorded.events.begin(), recorded.events.end(), "canceled"), 1);
}

// Destruction

TEST(MtThread, destroyingARunningThreadStopsItJoinsItAndThenLetsTheProtocolGo) {
    Recorded recorded;
    recorded.protocol->body = [](MtThread& self) {
        while (!self.isCancelRequested()) std::this_thread::yield();
        throw std::runtime_error("traced");
    };
    recorded.protocol->detach = [&](MtThread& thread) {
        EXPECT_FALSE(thread.isRunning());
        EXPECT_NO_THROW(thread.getPriority().getPriority());
        throw std::runtime_error("traced, too");
    };
    recorded.thread->start();
    EXPECT_NO_THROW(recorded.thread.reset());
    EXPECT_EQ(std::count(recorded.events.begin(), recorded.events.end(), "body"), 1);
    std::erase(recorded.events, "body");  // beside the stop
    EXPECT_EQ(recorded.events,
              (Events{"attached", "stop", "canceled", "finished", "detached", "destroyed"}));
}

/// Opens a gate when the thread's own objects go.
struct OpensAtEnd {
    Gate* gate = nullptr;
    ~OpensAtEnd() {
        if (gate != nullptr) gate->open();
    }
};
thread_local OpensAtEnd opensAtEnd;

TEST(MtThread, destroyingItselfIsAnAssertionThatTheThreadSurvives) {
    const std::size_t nbBefore = MtThreadMgr::getInstance().getNbThreads();
    const MtSpecificData<std::unique_ptr<int>> slot("slot");
    Recorded recorded;
    Gate isGone;
    recorded.protocol->body = [&](MtThread&) {
        opensAtEnd.gate = &isGone;
        slot.get() = std::make_unique<int>(1);
        expectAsserts("!isOnItself", [&] { recorded.thread.reset(); });
        EXPECT_EQ(MtThreadMgr::findCurrentThread(), nullptr);
        EXPECT_EQ(recorded.events.back(), "detached");
        EXPECT_EQ(MtThreadMgr::getInstance().getNbThreads(), nbBefore);
    };
    recorded.thread->start();
    ASSERT_TRUE(isGone.wait());
    EXPECT_EQ(recorded.events.back(), "destroyed");
}

class RefusesProtocol : public MtThreadProtocol {
    void performAttach(MtThread*) override { throw std::runtime_error("refused"); }
    void performBody(MtThread*) override {}
};

TEST(MtThread, aThreadWhoseProtocolRefusesItLeavesNothingBehind) {
    MtThreadMgr& mgr = MtThreadMgr::getInstance();
    const std::size_t nbBefore = mgr.getNbThreads();
    EXPECT_THROW(MtThreadFactory::getInstance().create(
                     "refused", ObjPtr<MtThreadProtocol>(new RefusesProtocol)),
                 std::runtime_error);
    EXPECT_EQ(mgr.getNbThreads(), nbBefore);
}

// Many

TEST(MtThread, threadsThatOthersStartedAreNoMtThreads) {
    for (int round = 0; round < 200; ++round) {  // the system gives numbers out again
        const ObjPtr<MtThread> thread = makeThread(
            "own", [](MtThread& self) { EXPECT_EQ(MtThreadMgr::findCurrentThread(), &self); });
        thread->start();
        thread->join();
        std::jthread([] { EXPECT_EQ(MtThreadMgr::findCurrentThread(), nullptr); }).join();
    }
}

TEST(MtThread, sixtyFourThreadsAtOnceKeepTheirDataAndThemselvesApart) {
    constexpr int nbThreads = 64;
    const MtSpecificData<int> slot("slot");
    TestCounter nbReady;
    Gate leave;
    std::vector<ObjPtr<MtThread>> threads(nbThreads);
    for (int i = 0; i < nbThreads; ++i) {
        threads[i] = makeThread("many", [&, i](MtThread& self) {
            slot.get() = i;
            nbReady.add();
            leave.wait();
            EXPECT_EQ(slot.get(), i);
            EXPECT_EQ(MtThreadMgr::findCurrentThread(), &self);
            EXPECT_EQ(&self, threads[i].get());
        });
        threads[i]->start();
    }
    ASSERT_TRUE(nbReady.waitFor(nbThreads));
    leave.open();
    for (auto& thread : threads) thread->join();
}

TEST(MtThread, canBeAskedForAnythingWhileItStartsAndEnds) {
    std::atomic<bool> isOver{false};
    MtThreadMgr& mgr = MtThreadMgr::getInstance();
    ObjPtr<MtThread> lasting = makeThread("lasting", [](MtThread&) {});
    std::vector<std::jthread> watchers;
    for (int i = 0; i < 3; ++i) {
        watchers.emplace_back([&] {
            while (!isOver) {
                std::ostringstream text;
                mgr.dump(text);
                mgr.getThreadNames();
                lasting->getPriorityLevel();
                lasting->getBasePriority();
                lasting->getThreadId();
                lasting->setPriorityLevel(2);
                lasting->requestCancel(false);
                EXPECT_NE(text.str().find("lasting"), std::string::npos);
            }
        });
    }
    for (int round = 0; round < 100; ++round) {
        lasting->start();
        const ObjPtr<MtThread> passing = makeThread("passing", [](MtThread&) {});
        passing->start();
        lasting->join();
    }
    isOver = true;
}

TEST(MtThread, tenThousandThreadsOneAfterAnotherLeaveNothingBehind) {
    const int nbThreads = IS_SANITIZED ? 1000 : 10000;
    const MtSpecificData<std::vector<char>> slot("slot");
    std::atomic<int> nbRun{0};
    const auto run = [&](int nbRounds) {
        const ObjPtr<MtThread> again = makeThread("again", [&](MtThread&) { ++nbRun; });
        for (int i = 0; i < nbRounds / 2; ++i) {
            const ObjPtr<MtThread> once = makeThread("once", [&](MtThread&) {
                slot->resize(1000);
                ++nbRun;
            });
            once->start();
            once->join();
            again->start();
            again->join();
        }
    };
    run(200);
    const ProcessUsage before = ProcessUsage::take();
    run(nbThreads);
    const ProcessUsage after = ProcessUsage::take();
    EXPECT_EQ(nbRun, nbThreads + 200);
    EXPECT_LE(after.nbHandles, before.nbHandles + 2);
    EXPECT_LE(after.nbThreads, before.nbThreads);
    EXPECT_LT(after.nbHeapBytes, before.nbHeapBytes + 20 * nbThreads);  // not 20 bytes per thread
}

}  // namespace

}  // namespace Orv
