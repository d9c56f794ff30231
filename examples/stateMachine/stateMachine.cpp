// A recorder as a state machine: described, run, and drawn for docs/stateMachines.md.
#include <iostream>
#include <orv/devSMConditionalTransition.h>
#include <orv/devSMExecutionEng.h>
#include <orv/devSMTableBuilder.h>
#include <stdexcept>
#include <string_view>

namespace {

/// What the machine works on.
struct Recorder {
    int nbTakes = 0;
    bool hasRoom = true;
    bool isJammed = false;
};

// [table]
Orv::RCShdPtr<Orv::DevSMTable> makeTable() {
    Orv::DevSMTableBuilder builder;
    for (const char* const state : {"idle", "armed", "recording"}) builder.addState(state);
    for (const char* const event : {"arm", "start", "stop"}) builder.addEvent(event);
    for (const char* const transition : {"prepare", "record", "refuse", "finish"})
        builder.addTransition(transition);

    builder.associate("idle", "arm", "prepare");
    builder.associateNext("idle", "prepare", "armed");

    // A choice: "record" decides whether it is taken, or "refuse" instead.
    builder.associate("armed", "start", "record");
    builder.associate("armed", "start", "refuse");
    builder.addCondition("record", {"record", "refuse"});
    builder.associateNext("armed", "record", "recording");
    builder.associateNext("armed", "refuse", "idle");

    builder.associate("recording", "stop", "finish");
    builder.associateNext("recording", "finish", "idle");
    builder.associateNext("recording", "_exc", "armed");  // what "finish" throws ends nothing

    builder.expand();
    return builder.build();
}
// [table]

// [transitions]
class Prepare : public Orv::DevSMTransition {
public:
    void execute(unsigned) override { std::cout << "  ready\n"; }
};

class Record : public Orv::DevSMConditionalTransition {
public:
    explicit Record(Recorder& recorder) : _recorder(recorder) {}
    void execute(unsigned) override { std::cout << "  take " << ++_recorder.nbTakes << "\n"; }
    Orv::LiString evaluate() override { return _recorder.hasRoom ? "record" : "refuse"; }

private:
    Recorder& _recorder;
};
// [transitions]

class Refuse : public Orv::DevSMTransition {
public:
    void execute(unsigned) override { std::cout << "  no room\n"; }
};

class Finish : public Orv::DevSMTransition {
public:
    explicit Finish(Recorder& recorder) : _recorder(recorder) {}
    void execute(unsigned) override {
        if (_recorder.isJammed) throw std::runtime_error("the tape is jammed");
        std::cout << "  saved\n";
    }

private:
    Recorder& _recorder;
};

// [factory]
class Factory : public Orv::DevSMTransitionFactory {
public:
    explicit Factory(Recorder& recorder) : _recorder(recorder) {}

    Orv::RCShdPtr<Orv::DevSMTransition> create(const Orv::LiString& name) override {
        using Ptr = Orv::RCShdPtr<Orv::DevSMTransition>;
        if (name == "prepare") return Ptr(new Prepare);
        if (name == "record") return Ptr(new Record(_recorder));
        if (name == "refuse") return Ptr(new Refuse);
        if (name == "finish") return Ptr(new Finish(_recorder));
        return nullptr;
    }

private:
    Recorder& _recorder;
};
// [factory]

// [run]
void run(const Orv::RCShdPtr<Orv::DevSMTable>& table) {
    Recorder recorder;
    Factory factory(recorder);
    Orv::DevSMExecutionEng engine(table, factory, table->getState("idle"));
    const auto post = [&](const char* event) {
        std::cout << engine.getStateName() << ", " << event << "\n";
        engine.postEvent(static_cast<unsigned>(table->getEvent(event)));
    };
    for (const char* const event : {"arm", "start", "stop"}) post(event);
    recorder.hasRoom = false;
    for (const char* const event : {"arm", "start"}) post(event);
    recorder.hasRoom = recorder.isJammed = true;
    for (const char* const event : {"arm", "start", "stop"}) post(event);
    std::cout << engine.getStateName() << ", because " << engine.getFaultText() << "\n";
    post("stop");  // not expected in "armed"
    std::cout << engine.getStateName() << ", the end\n";
}
// [run]

}  // namespace

int main(int argc, char** argv) {
    const Orv::RCShdPtr<Orv::DevSMTable> table = makeTable();
    if (argc > 1 && std::string_view(argv[1]) == "graph") {
        table->toDot(std::cout);
    } else {
        run(table);
    }
    return 0;
}
