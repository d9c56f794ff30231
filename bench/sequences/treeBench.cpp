// A sequence of devices, each with a thread of its own, from its start over being in step to its
// end; beside it the same requests to the same devices, sent without a tree: all at once, and
// counted as they are done.
#include <atomic>
#include <benchmark/benchmark.h>
#include <memory>
#include <orv/devMDStdSyncSeqDevice.h>
#include <orv/devMgr.h>
#include <orv/devRegistry.h>
#include <orv/devRegistryDeviceEntry.h>
#include <orv/lkSema.h>
#include <string>
#include <vector>

namespace {

constexpr double LIMIT_SECONDS = 60;
constexpr int NB_CHILDREN = 3;

class Member : public Orv::DevMDStdSyncSeqDevice {
public:
    explicit Member(const Orv::LiString& name) : DevMDStdSyncSeqDevice(name) {
        setStackSize(64 * 1024);
    }
};

Orv::LiString nameOf(int number) {
    return Orv::LiString(std::string("member").append(std::to_string(number)));
}

/// A manager with devices that are open already; kept until the program ends.
class Stage {
public:
    static Stage& get(int nbNodes) {
        static Stage& stage = *new Stage;
        stage.open(nbNodes);
        return stage;
    }

    Orv::DevMgr& getManager() { return *_manager; }
    Orv::DevMDSyncSeqPrtcl& getDevice(int number) {
        return dynamic_cast<Orv::DevMDSyncSeqPrtcl&>(*_devices[static_cast<std::size_t>(number)]);
    }

private:
    Orv::ObjPtr<Orv::DevMgr> _manager{Orv::DevMgr::create()};
    std::vector<Orv::RCShdPtr<Orv::DevMDPrtcl>> _devices;

    void open(int nbNodes) {
        for (auto i = static_cast<int>(_devices.size()); i < nbNodes; ++i) {
            Orv::DevRegistry::getInstance().addEntry(
                Orv::DevRegistryDeviceEntry::create<Member>(nameOf(i), ""));
            _devices.push_back(_manager->getPrtcl(nameOf(i)));
        }
    }
};

/// Of a tree in which each node has a few children: "member0 (member1 (...) member2 ...)".
std::string describeGroup(int first, int nbNodes) {
    std::string text(nameOf(first).getText());
    const int firstChild = first * NB_CHILDREN + 1;
    if (firstChild >= nbNodes) return text;
    text += " (";
    for (int i = firstChild; i < firstChild + NB_CHILDREN && i < nbNodes; ++i) {
        text.append(describeGroup(i, nbNodes)).append(" ");
    }
    return text.append(")");
}

void runTree(benchmark::State& state, int nbNodes) {
    Stage& stage = Stage::get(nbNodes);
    const Orv::LiString tree(std::string("(").append(describeGroup(0, nbNodes)).append(")"));
    for (auto _ : state) {
        state.PauseTiming();
        Orv::ObjPtr<Orv::DevMgrSyncSeqAcc> acc = stage.getManager().createSyncSeqAcc();
        acc->configure(tree);
        state.ResumeTiming();
        acc->start();
        acc->sync(Orv::DtTime());
        const bool isLocked = acc->waitFor("lock", LIMIT_SECONDS);
        acc->stop();
        if (!isLocked || !acc->waitFor("final", LIMIT_SECONDS)) {
            state.SkipWithError("the sequence did not come to its end");
        }
        state.PauseTiming();
        acc.reset();
        state.ResumeTiming();
    }
    state.counters["nsPerNode"] =
        benchmark::Counter(1e-9 * nbNodes, benchmark::Counter::kIsIterationInvariantRate |
                                               benchmark::Counter::kInvert);
}

/// Counts requests that are done, and tells when all are.
struct Countdown {
    std::atomic<int> nbLeft{0};
    Orv::LkSema isOver{"countdown", 0};

    void expect(int count) { nbLeft = count; }
    void countDown() {
        if (--nbLeft == 0) isOver.post();
    }
};

class CountingACO : public Orv::DevACO {
public:
    explicit CountingACO(Countdown& countdown) : _countdown(countdown) {}
    void performExecute() override { _countdown.countDown(); }

private:
    Countdown& _countdown;
};

class CountingANO : public Orv::DevANO {
public:
    explicit CountingANO(Countdown* countdown) : _countdown(countdown) {}
    void performExecute() override {
        if (_countdown != nullptr) _countdown->countDown();
    }

private:
    Countdown* const _countdown;
};

void runRequests(benchmark::State& state, int nbNodes) {
    using Orv::DevACO;
    using Orv::DevANO;
    using Orv::ObjPtr;
    Stage& stage = Stage::get(nbNodes);
    Countdown countdown;
    const auto count = [&] { return ObjPtr<DevACO>(new CountingACO(countdown)); };
    const auto run = [&](int nbReports, auto request) {
        countdown.expect(nbReports * nbNodes);
        for (int i = 0; i < nbNodes; ++i) request(stage.getDevice(i));
        countdown.isOver.wait();
    };
    for (auto _ : state) {
        run(2, [&](Orv::DevMDSyncSeqPrtcl& device) {
            device.performStart(count(), ObjPtr<DevANO>(new CountingANO(&countdown)),
                                ObjPtr<DevANO>(new CountingANO(nullptr)));
        });
        run(1, [&](auto& device) { device.performSync(count(), Orv::DtTime()); });
        run(1, [&](auto& device) { device.performStop(count()); });
    }
    state.counters["nsPerNode"] =
        benchmark::Counter(1e-9 * nbNodes, benchmark::Counter::kIsIterationInvariantRate |
                                               benchmark::Counter::kInvert);
}

const bool isRegistered = [] {
    for (const int size : {10, 100, 1000}) {
        const std::string name =
            std::string("start+stop ").append(std::to_string(size)).append(" nodes/");
        benchmark::RegisterBenchmark((name + "DevMgrSyncSeqAcc").c_str(), runTree, size)
            ->UseRealTime();
        benchmark::RegisterBenchmark((name + "bare requests").c_str(), runRequests, size)
            ->UseRealTime();
    }
    return true;
}();

}  // namespace
