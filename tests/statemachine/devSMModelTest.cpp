// Expanded machines beside an interpreter of the description they come from: whatever transitions
// and conditions do, and whatever is posted when, both go the same way.
#include <algorithm>
#include <deque>
#include <gtest/gtest.h>
#include <random>

#include "devMgrEx.h"
#include "devSMTestMachine.h"
#include "devSeqSMDescription.h"

namespace Orv {

namespace {

using Names = std::vector<std::string>;

/// What transitions and conditions do, the same for everybody who asks the same questions.
class Behaviour {
public:
    struct Action {
        std::vector<unsigned> posts;
        bool isThrowing;
    };
    struct Decision {
        std::string name;  // empty: throws
    };

    Behaviour(unsigned seed, unsigned nbEvents) : _random(seed), _nbEvents(nbEvents) {}

    Action act() {
        Action action{{}, oneIn(60)};
        while (oneIn(4)) action.posts.push_back(_random() % _nbEvents);
        return action;
    }

    Decision decide(const Names& pair) {
        if (oneIn(60)) return {""};
        if (oneIn(60)) return {"no such name"};
        return {pair[_random() % pair.size()]};
    }

    bool oneIn(unsigned number) { return _random() % number == 0; }

private:
    std::mt19937 _random;
    unsigned _nbEvents;
};

/// Runs the description itself, by its rules.
class Interpreter {
public:
    Interpreter(const DevSMDescription& machine, std::string state, Behaviour behaviour)
        : state(std::move(state)), _machine(machine), _behaviour(std::move(behaviour)) {}

    /// @return what is expected of the engine: "", "SMExecutionError" or "SMBadImp".
    std::string post(unsigned event) {
        if (isOver()) return "SMExecutionError";
        _pending.push_back(event);
        while (!_pending.empty()) {
            const unsigned next = _pending.front();
            _pending.pop_front();
            execute(_machine.events[next]);
            if (isOver()) _pending.clear();
        }
        return code == 0 ? "" : "SMBadImp";
    }

    std::string state;
    int code = 0;
    Names journal;

private:
    const DevSMDescription& _machine;
    Behaviour _behaviour;
    std::deque<unsigned> _pending;

    bool isOver() const { return code != 0 || state == "_ill" || state == "_exc"; }

    void execute(const std::string& event) {
        const DevSMDescription::Pair* const pair = _machine.findPair(state, event);
        if (pair == nullptr) {
            state = "_ill";
            return;
        }
        std::string transition = pair->transitions[0];
        if (pair->transitions.size() > 1) {
            journal.push_back(transition + "?");
            transition = _behaviour.decide(pair->transitions).name;
            if (transition.empty()) return fail();
            if (_machine.findNext(state, transition).empty()) {
                code = 4;
                return;
            }
        }
        journal.push_back(transition);
        const Behaviour::Action action = _behaviour.act();
        _pending.insert(_pending.end(), action.posts.begin(), action.posts.end());
        if (action.isThrowing) return fail();
        state = _machine.findNext(state, transition);
    }

    void fail() {
        const std::string route = _machine.findNext(state, "_exc");
        state = route.empty() ? "_exc" : route;
    }
};

/// The engine, with transitions that behave as told.
class Machine : public DevSMTransitionFactory {
public:
    Machine(const DevSMDescription& description, RCShdPtr<DevSMTable> table,
            const std::string& state, Behaviour behaviour)
        : _description(description),
          _behaviour(std::move(behaviour)),
          engine(table, *this, table->getState(state.c_str())) {}

    std::string post(unsigned event) {
        _event = event;
        try {
            engine.postEvent(event);
            return "";
        } catch (const DevMgrEx::SMExecutionError&) {
            return "SMExecutionError";
        } catch (const DevMgrEx::SMBadImp&) {
            return "SMBadImp";
        }
    }

    RCShdPtr<DevSMTransition> create(const LiString& name) override {
        return RCShdPtr<DevSMTransition>(new Transition(*this, name.getChars()));
    }

private:
    const DevSMDescription& _description;
    Behaviour _behaviour;
    unsigned _event = 0;

    class Transition : public DevSMConditionalTransition {
    public:
        Transition(Machine& machine, std::string name)
            : _machine(machine), _name(std::move(name)) {}

        void execute(unsigned) override {
            _machine.journal.push_back(_name);
            const Behaviour::Action action = _machine._behaviour.act();
            for (const unsigned event : action.posts) _machine.engine.postEvent(event);
            if (action.isThrowing) throw std::runtime_error("by chance");
        }

        LiString evaluate() override {
            _machine.journal.push_back(_name + "?");
            const std::string state = _machine.engine.getStateName().getChars();
            const Behaviour::Decision decision =
                _machine._behaviour.decide(_machine.findPair(state, _name));
            if (decision.name.empty()) throw std::runtime_error("by chance");
            return decision.name.c_str();
        }

    private:
        Machine& _machine;
        std::string _name;
    };

    /// The transitions among which the conditional one chooses in the state; random machines have
    /// one such pair at most.
    const Names& findPair(const std::string& state, const std::string& transition) const {
        for (const DevSMDescription::Pair& pair : _description.pairs) {
            if (pair.state == state && pair.transitions.size() > 1 &&
                pair.transitions[0] == transition)
                return pair.transitions;
        }
        throw std::logic_error("a condition was asked without need");
    }

public:
    Names journal;
    DevSMExecutionEng engine;
};

/// A random machine; about one pair in four has a condition.
DevSMDescription makeRandomMachine(std::mt19937& random) {
    const auto makeNames = [&](const char* prefix, unsigned most) {
        Names names;
        for (unsigned i = 0, count = 1 + random() % most; i < count; ++i)
            names.push_back(prefix + std::to_string(i));
        return names;
    };
    DevSMDescription machine;
    machine.states = makeNames("s", 8);
    machine.events = makeNames("e", 6);
    machine.transitions = makeNames("t", 9);
    const auto anyState = [&] { return machine.states[random() % machine.states.size()]; };
    std::set<std::string> conditional;
    for (const std::string& state : machine.states) {
        if (random() % 4 == 0) machine.nextStates.push_back({state, "_exc", anyState()});
        for (const std::string& transition : machine.transitions)
            machine.nextStates.push_back({state, transition, anyState()});
        std::set<std::string> asked;
        for (const std::string& event : machine.events) {
            if (random() % 8 == 0) continue;  // illegal
            Names names = machine.transitions;
            std::shuffle(names.begin(), names.end(), random);
            const bool isChoice = random() % 4 == 0 && asked.insert(names[0]).second;
            names.resize(isChoice ? std::min<std::size_t>(2 + random() % 3, names.size()) : 1);
            if (names.size() > 1) conditional.insert(names[0]);
            machine.pairs.push_back({state, event, names});
        }
    }
    for (const std::string& name : conditional)
        machine.conditions.push_back({name, machine.transitions});
    return machine;
}

struct Coverage {
    int nbEvents = 0, nbIllegal = 0, nbExceptions = 0, nbBadImp = 0, nbChoices = 0;
};

/// Runs one life of the machine on both and compares them after every event.
void compareLives(const DevSMDescription& description, const RCShdPtr<DevSMTable>& table,
                  std::mt19937& random, Coverage& coverage) {
    const auto nbEvents = static_cast<unsigned>(description.events.size());
    const std::string state = description.states[random() % description.states.size()];
    const Behaviour behaviour(random(), nbEvents);
    Interpreter interpreter(description, state, behaviour);
    Machine machine(description, table, state, behaviour);
    std::string result;
    for (int i = 0; i < 200 && result != "SMExecutionError"; ++i) {
        const unsigned event = random() % nbEvents;
        result = interpreter.post(event);
        ASSERT_EQ(machine.post(event), result);
        ASSERT_EQ(machine.journal, interpreter.journal);
        ASSERT_EQ(machine.engine.getStateName(), interpreter.state.c_str());
        ASSERT_EQ(machine.engine.getErrorCode(), interpreter.code);
        ++coverage.nbEvents;
    }
    coverage.nbIllegal += interpreter.state == "_ill";
    coverage.nbExceptions += interpreter.state == "_exc";
    coverage.nbBadImp += interpreter.code == 4;
    for (const std::string& entry : machine.journal) coverage.nbChoices += entry.ends_with("?");
}

TEST(DevSMModel, randomMachinesDoWhatTheirDescriptionsSay) {
    std::mt19937 random(20261121);
    Coverage coverage;
    for (int i = 0; i < 400 && !testing::Test::HasFatalFailure(); ++i) {
        const DevSMDescription description = makeRandomMachine(random);
        SCOPED_TRACE("machine " + std::to_string(i));
        const RCShdPtr<DevSMTable> table = description.build();
        for (int life = 0; life < 10; ++life)
            ASSERT_NO_FATAL_FAILURE(compareLives(description, table, random, coverage));
    }
    EXPECT_GT(coverage.nbEvents, 10'000);
    EXPECT_GT(coverage.nbIllegal, 100);
    EXPECT_GT(coverage.nbExceptions, 100);
    EXPECT_GT(coverage.nbBadImp, 20);
    EXPECT_GT(coverage.nbChoices, 1000);
}

TEST(DevSMModel, theSequenceMachineDoesWhatItsTablesSay) {
    std::mt19937 random(1);
    const DevSMDescription description = makeDevSeqSMDescription();
    const RCShdPtr<DevSMTable> table = description.build();
    Coverage coverage;
    for (int life = 0; life < 2000; ++life)
        ASSERT_NO_FATAL_FAILURE(compareLives(description, table, random, coverage));
    // And each pair once from each state, with each of its outcomes, by the data.
    int nbLegal = 0;
    for (const std::string& state : description.states) {
        for (const std::string& event : description.events) {
            const DevSMDescription::Pair* const pair = description.findPair(state, event);
            for (const std::string& chosen : pair != nullptr ? pair->transitions : Names{"none"}) {
                DevSMTestMachine node(table);
                node.decisions[pair != nullptr ? pair->transitions[0] : ""] = [&] {
                    return chosen;
                };
                node.start(state);
                node.post(event);
                EXPECT_EQ(node.getState(),
                          pair != nullptr ? description.findNext(state, chosen) : "_ill")
                    << state << ", " << event;
                nbLegal += pair != nullptr;
            }
        }
    }
    EXPECT_EQ(nbLegal, 22 + 9 + 10 + 6);
}

}  // namespace

}  // namespace Orv
