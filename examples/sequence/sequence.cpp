// Two decks and an effect that follow a clock: from the tree string to the end of the sequence.
// With the argument "graph" it writes the machine that drives each of them, for Graphviz.
#include <cstring>
#include <iostream>
#include <orv/devMDStdSyncSeqDevice.h>
#include <orv/devMgr.h>
#include <orv/devRegistry.h>
#include <orv/devRegistryDeviceEntry.h>
#include <orv/devSeqSMTable.h>

namespace {

/// A tape deck: the tape needs its time to get into step.
class Deck : public Orv::DevMDStdSyncSeqDevice {
public:
    explicit Deck(const Orv::LiString& name) : DevMDStdSyncSeqDevice(name) {}

protected:
    void start(const Orv::DevMDSyncSeqSignals& signals) override {
        _signals = signals;  // for lockLost(), whenever that may be
        _signals.ready();
    }
    void syncAt(const Orv::DtTimeMark&, Orv::DevMDSyncSeqRequest& request) override {
        _inStep = request.postpone();  // so that a stop or an abort gets through meanwhile
        post([this] { _inStep.done(); });
    }
    void stop(Orv::DevMDSyncSeqRequest&) override { _inStep = {}; }
    void abort(Orv::DevMDSyncSeqRequest&) override { _inStep = {}; }

private:
    Orv::DevMDSyncSeqSignals _signals;
    Orv::DevMDSyncSeqDone _inStep;
};

void show(const Orv::DevMgrSyncSeqAcc& sequence, const char* when) {
    std::cout << when << ":";
    for (const char* const name : {"clock", "deckA", "deckB", "fx"}) {
        std::cout << " " << name << " " << sequence.getState(name);
    }
    std::cout << "\n";
}

int run() {
    Orv::DevRegistry& registry = Orv::DevRegistry::getInstance();
    for (const char* const name : {"clock", "deckA", "deckB", "fx"}) {
        registry.addEntry(Orv::DevRegistryDeviceEntry::create<Deck>(name, "a deck"));
    }
    Orv::ObjPtr<Orv::DevMgr> manager = Orv::DevMgr::create();

    Orv::ObjPtr<Orv::DevMgrSyncSeqAcc> sequence = manager->createSyncSeqAcc();
    sequence->configure("(clock (deckA deckB (fx)))");
    show(*sequence, "configured");

    sequence->start();
    if (!sequence->waitFor("ready", 5.0)) return 1;
    show(*sequence, "started");

    sequence->sync(Orv::DtTimeMark::now() + 0.1);
    if (!sequence->waitFor("lock", 5.0)) return 1;
    show(*sequence, "in step");

    sequence->stop();
    if (!sequence->waitFor("final", 5.0)) return 1;
    show(*sequence, "stopped");
    return 0;
}

}  // namespace

int main(int argc, char** argv) {
    if (argc > 1 && std::strcmp(argv[1], "graph") == 0) {
        Orv::DevSeqSMTable::get()->toDot(std::cout);
        return 0;
    }
    return run();
}
