#include <atomic>
#include <gtest/gtest.h>
#include <mutex>

#include "devMDStdSyncSeqDevice.h"
#include "devPrtclEx.h"
#include "expectThrows.h"
#include "gate.h"
#include "rcEx.h"

namespace Orv {

namespace {

/// Counts how often it ran, and how often it was destroyed without having run.
struct Outcome {
    TestCounter run;
    TestCounter dropped;
};

class CountingACO : public DevACO {
public:
    explicit CountingACO(Outcome& outcome) : _outcome(outcome) {}
    ~CountingACO() override {
        if (!_hasRun) _outcome.dropped.add();
    }
    void performExecute() override {
        _hasRun = true;
        _outcome.run.add();
    }

private:
    Outcome& _outcome;
    bool _hasRun = false;
};

class CountingANO : public DevANO {
public:
    CountingANO(TestCounter& run, TestCounter* destroyed = nullptr)
        : _run(run), _destroyed(destroyed) {}
    ~CountingANO() override {
        if (_destroyed != nullptr) _destroyed->add();
    }
    void performExecute() override { _run.add(); }

private:
    TestCounter& _run;
    TestCounter* const _destroyed;
};

ObjPtr<DevACO> countIn(Outcome& outcome) {
    return ObjPtr<DevACO>(new CountingACO(outcome));
}

class Deck : public DevMDStdSyncSeqDevice {
public:
    explicit Deck(int capacity = STANDARD_CAPACITY) : DevMDStdSyncSeqDevice("deck", capacity) {}

    using DevMDStdDevice::isDeviceThread;

    void note(const std::string& what) {
        EXPECT_TRUE(isDeviceThread()) << what;
        const std::lock_guard guard(_mutex);
        _journal += what + " ";
    }
    std::string getJournal() {
        const std::lock_guard guard(_mutex);
        return _journal;
    }

    std::function<void(const DevMDSyncSeqSignals&)> onStart = [](auto& signals) {
        signals.ready();
    };
    std::function<void(DevMDSyncSeqRequest&)> onSync = [](auto&) {};

protected:
    void start(const DevMDSyncSeqSignals& signals) override {
        note("start");
        onStart(signals);
    }
    void syncTo(const DtTime& time, DevMDSyncSeqRequest& request) override {
        note("sync@" + std::to_string(static_cast<int>(time.getSeconds())));
        onSync(request);
    }
    void syncAt(const DtTimeMark& mark, DevMDSyncSeqRequest& request) override {
        note("sync#" + std::to_string(mark.getNanoseconds()));
        onSync(request);
    }
    void stop(DevMDSyncSeqRequest&) override { note("stop"); }
    void abort(DevMDSyncSeqRequest&) override { note("abort"); }
    void recover(DevMDSyncSeqRequest&) override { note("recover"); }

private:
    std::mutex _mutex;
    std::string _journal;
};

class DevMDStdSyncSeq : public testing::Test {
protected:
    const RCShdPtr<Deck> deck{new Deck};
    Outcome outcome;
    TestCounter ready, readyDestroyed, lockLost;

    void start() {
        deck->performStart(countIn(outcome),
                           ObjPtr<DevANO>(new CountingANO(ready, &readyDestroyed)),
                           ObjPtr<DevANO>(new CountingANO(lockLost)));
    }
};

TEST_F(DevMDStdSyncSeq, carriesItsRequestsOutInOrderOnTheDevicesThread) {
    deck->performOpen();
    start();
    deck->performSync(countIn(outcome), DtTime(7.0));
    deck->performSync(countIn(outcome), DtTimeMark::fromNanoseconds(9));
    deck->performRecover(countIn(outcome));
    deck->performStop(countIn(outcome));
    deck->performAbort(countIn(outcome));
    EXPECT_TRUE(outcome.run.waitFor(6));
    EXPECT_EQ(deck->getJournal(), "start sync@7 sync#9 recover stop abort ");
    EXPECT_EQ(ready.get(), 1);
    EXPECT_EQ(outcome.dropped.get(), 0);
    deck->performClose();
}

TEST_F(DevMDStdSyncSeq, whatTheBaseClassDoesIsEnoughForADeviceWithNothingToDo) {
    const RCShdPtr<DevMDStdSyncSeqDevice> plain(new DevMDStdSyncSeqDevice("plain"));
    plain->performOpen();
    plain->performStart(countIn(outcome), ObjPtr<DevANO>(new CountingANO(ready)),
                        ObjPtr<DevANO>(new CountingANO(lockLost)));
    plain->performSync(countIn(outcome), DtTime());
    plain->performStop(countIn(outcome));
    EXPECT_TRUE(outcome.run.waitFor(3));
    EXPECT_EQ(ready.get(), 1);
    plain->performClose();
}

TEST_F(DevMDStdSyncSeq, canStopWhenItsInputsHaveEnded) {
    class Recorder : public DevMDStdSyncSeqDevice {
    public:
        Recorder() : DevMDStdSyncSeqDevice("recorder") {
            input = addSink("input", "", [](const ObjPtr<DevMDStreamElem>& elem) {
                if (!elem->isTerminal()) throw std::runtime_error("the disk is full");
            });
        }
        RCShdPtr<DevMDStdStreamPassiveSink> input;
        TestCounter nbStops, nbFinished;

    protected:
        void inputsEnded() override { nbFinished.add(); }
        void stop(DevMDSyncSeqRequest& request) override {
            stopWhenInputsEnd(request);
            nbStops.add();
        }
    };
    const RCShdPtr<Recorder> recorder(new Recorder);
    recorder->performOpen();
    recorder->performStop(countIn(outcome));
    EXPECT_TRUE(outcome.run.waitFor(1)) << "nothing is on its way";
    recorder->input->start();
    recorder->performStop(countIn(outcome));
    recorder->nbStops.waitFor(2);
    EXPECT_EQ(outcome.run.get(), 1);
    recorder->input->stop();
    EXPECT_TRUE(outcome.run.waitFor(2));
    EXPECT_EQ(recorder->nbFinished.get(), 1) << "before the stop is done";
    // One that has failed has ended once its source hears of it, whether disconnected or not.
    DevMDStdStreamActiveSource source("video", "");
    source.connect(recorder->input);
    recorder->input->start();
    source.start();
    while (
        source.push(ObjPtr<DevMDStreamElem>(new DevMDStreamElem(nullptr, DevMDStreamElem::GAP)))) {
    }
    recorder->performStop(countIn(outcome));
    EXPECT_TRUE(outcome.run.waitFor(3));
    source.disconnect();
    recorder->input->stop();
    recorder->input->start();
    recorder->performStop(countIn(outcome));
    recorder->nbStops.waitFor(4);
    recorder->performClose();
    EXPECT_EQ(outcome.dropped.get(), 1) << "it would lead back to the device";
}

TEST_F(DevMDStdSyncSeq, goesOnToOtherRequestsWhileOneIsPostponed) {
    DevMDSyncSeqDone done;
    Outcome later;
    deck->onSync = [&](DevMDSyncSeqRequest& request) {
        done = request.postpone();
        EXPECT_FALSE(request.postpone().isDue()) << "there is only one";
    };
    deck->performOpen();
    deck->performSync(countIn(later), DtTime());
    deck->performAbort(countIn(outcome));
    EXPECT_TRUE(outcome.run.waitFor(1));
    EXPECT_EQ(later.run.get(), 0);
    done.done();
    done.done();
    EXPECT_EQ(later.run.get(), 1);
    // And one that is dropped.
    deck->performSync(countIn(later), DtTime());
    deck->performStop(countIn(outcome));
    EXPECT_TRUE(outcome.run.waitFor(2));
    EXPECT_EQ(later.dropped.get(), 0);
    done = DevMDSyncSeqDone();
    EXPECT_EQ(later.dropped.get(), 1);
    deck->performClose();
}

TEST_F(DevMDStdSyncSeq, dropsWhatItsFunctionsThrowAt) {
    deck->onStart = [](auto&) { throw std::runtime_error("no tape"); };
    deck->onSync = [](auto&) { throw 7; };
    deck->performOpen();
    start();
    deck->performSync(countIn(outcome), DtTime());
    EXPECT_TRUE(outcome.dropped.waitFor(2));
    EXPECT_TRUE(readyDestroyed.waitFor(1));
    deck->performStop(countIn(outcome));
    EXPECT_TRUE(outcome.run.waitFor(1));
    EXPECT_EQ(outcome.dropped.get(), 2);
    deck->performClose();
}

TEST_F(DevMDStdSyncSeq, keepsItsSignalsForAsLongAsTheDeviceDoes) {
    DevMDSyncSeqSignals kept;
    deck->onStart = [&](const DevMDSyncSeqSignals& signals) { kept = signals; };
    deck->performOpen();
    start();
    EXPECT_TRUE(outcome.run.waitFor(1));
    EXPECT_EQ(readyDestroyed.get(), 0);
    kept.ready();
    kept.lockLost();
    kept.lockLost();
    EXPECT_EQ(ready.get(), 1);
    EXPECT_EQ(lockLost.get(), 2);
    kept = DevMDSyncSeqSignals();
    EXPECT_EQ(readyDestroyed.get(), 1);
    kept.ready();
    deck->onStart = [](auto&) {};
    start();
    EXPECT_TRUE(readyDestroyed.waitFor(2)) << "a device that does not want them says it never will";
    EXPECT_EQ(ready.get(), 1);
    deck->performClose();
}

TEST_F(DevMDStdSyncSeq, takesRequestsPastTheCapacityWhileTheDeviceHangs) {
    const RCShdPtr<Deck> small(new Deck(1));
    Gate gate;
    small->onSync = [&](auto&) { gate.wait(); };
    small->performOpen();
    constexpr int nbRequests = 20;
    for (int i = 0; i < nbRequests; ++i) small->performSync(countIn(outcome), DtTime());
    EXPECT_EQ(outcome.run.get(), 0);
    gate.open();
    EXPECT_TRUE(outcome.run.waitFor(nbRequests));
    small->performClose();
    expectThrows<DevPrtclEx::ExMDStdFifoClosed>("Device request queue is closed.",
                                                [&] { small->performAbort(countIn(outcome)); });
    EXPECT_EQ(outcome.dropped.get(), 1);
}

TEST_F(DevMDStdSyncSeq, needsAQueue) {
    class NoRequests : public DevMDStdSyncSeqANOFactory {
        ObjPtr<DevANO> createStartANO(ObjPtr<DevANO>, ObjPtr<DevANO>) override { return make(); }
        ObjPtr<DevANO> createStopANO() override { return make(); }
        ObjPtr<DevANO> createSyncANO(const DtTime&) override { return make(); }
        ObjPtr<DevANO> createSyncANO(const DtTimeMark&) override { return make(); }
        ObjPtr<DevANO> createAbortANO() override { return make(); }
        ObjPtr<DevANO> createRecoverANO() override { return make(); }

        TestCounter _run;
        ObjPtr<DevANO> make() { return ObjPtr<DevANO>(new CountingANO(_run)); }
    };
    const RCShdPtr<DevMDStdSyncSeqPrtcl> prtcl(new DevMDStdSyncSeqPrtcl(
        "loose", nullptr, ObjPtr<DevMDStdSyncSeqANOFactory>(new NoRequests)));
    expectThrows<RCEx::ExNullPtr>("Dereferencing a null pointer",
                                  [&] { prtcl->performStop(countIn(outcome)); });
    EXPECT_EQ(outcome.dropped.get(), 1);
}

}  // namespace

}  // namespace Orv
