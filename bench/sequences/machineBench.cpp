// The engine of state machines beside a table written by hand, and how the time to build a machine
// grows with its size. Boost's machines are in machineBoostBench.cpp.
#include <orv/devSMExecutionEng.h>
#include <orv/devSMTableBuilder.h>
#include <string>

#include "machinePath.h"

namespace machine {

Count count;
Action* action = &count;

}  // namespace machine

namespace {

using machine::SIZE;

/// Transitions that count, as the actions of the peers do.
class CountingFactory : public Orv::DevSMTransitionFactory {
public:
    Orv::RCShdPtr<Orv::DevSMTransition> create(const Orv::LiString&) override {
        return Orv::RCShdPtr<Orv::DevSMTransition>(new CountingTransition);
    }

private:
    class CountingTransition : public Orv::DevSMTransition {
    public:
        void execute(unsigned) override { ++machine::count.number; }
    };
};

Orv::LiString makeName(const char* prefix, int number) {
    return (prefix + std::to_string(number)).c_str();
}

/// The machine of the path, with any number of states.
void describe(Orv::DevSMTableBuilder& builder, int nbStates) {
    std::vector<Orv::LiString> states, events;
    for (int i = 0; i < nbStates; ++i) states.push_back(makeName("state", i));
    for (int i = 0; i < SIZE; ++i) events.push_back(makeName("event", i));
    for (const Orv::LiString& name : states) builder.addState(name);
    for (const Orv::LiString& name : events) builder.addEvent(name);
    builder.addTransition("next");
    builder.addTransition("hop");
    const auto at = [](const std::vector<Orv::LiString>& names, int index) {
        return names[static_cast<std::size_t>(index) % names.size()];
    };
    for (int i = 0; i < nbStates; ++i) {
        builder.associate(at(states, i), at(events, i), "next");
        builder.associate(at(states, i), at(events, i + 3), "hop");
        builder.associateNext(at(states, i), "next", at(states, i + 1));
        builder.associateNext(at(states, i), "hop", at(states, i + 5));
    }
}

class Engine {
public:
    Engine() : _engine(makeTable(), _factory, 0) {}

    void start() {}
    bool fire(int event) {
        _engine.postEvent(static_cast<unsigned>(event));
        return true;
    }

private:
    CountingFactory _factory;
    Orv::DevSMExecutionEng _engine;

    static Orv::RCShdPtr<Orv::DevSMTable> makeTable() {
        Orv::DevSMTableBuilder builder;
        describe(builder, SIZE);
        builder.expand();
        return builder.build();
    }
};

/// The same by hand: no exceptions, no pending events, no errors.
class HandWritten {
public:
    HandWritten() {
        for (int state = 0; state < SIZE; ++state) {
            _cells[state][state] = {(state + 1) % SIZE, machine::action};
            _cells[state][(state + 3) % SIZE] = {(state + 5) % SIZE, machine::action};
        }
    }

    void start() {}
    bool fire(int event) {
        const Cell& cell = _cells[_state][event];
        if (cell.next < 0) return false;
        cell.action->run();
        _state = cell.next;
        return true;
    }

private:
    struct Cell {
        int next = -1;
        machine::Action* action = nullptr;
    };
    Cell _cells[SIZE][SIZE];
    int _state = 0;
};

void build(benchmark::State& state, int nbStates) {
    for (auto _ : state) {
        Orv::DevSMTableBuilder builder;
        describe(builder, nbStates);
        builder.expand();
        const Orv::RCShdPtr<Orv::DevSMTable> table = builder.build();
        if (table->getStates().size() != static_cast<std::size_t>(3 * nbStates + 2))
            state.SkipWithError("states were lost");
    }
    state.counters["nsPerAssociation"] =
        benchmark::Counter(4e-9 * nbStates, benchmark::Counter::kIsIterationInvariantRate |
                                                benchmark::Counter::kInvert);
}

BENCHMARK(machine::follow<Engine>)->Name("event/DevSMExecutionEng");
BENCHMARK(machine::follow<HandWritten>)->Name("event/hand-written table");

const bool isRegistered = [] {
    for (const int size : {10, 100, 1000}) {
        const std::string name = "build/" + std::to_string(size) + " states";
        benchmark::RegisterBenchmark(name.c_str(), build, size);
    }
    return true;
}();

}  // namespace
