#pragma once

#include <functional>
#include <gtest/gtest.h>
#include <map>
#include <memory>
#include <set>
#include <string>
#include <utility>
#include <vector>

#include "devSMConditionalTransition.h"
#include "devSMDescription.h"
#include "devSMExecutionEng.h"

namespace Orv {

/// A running machine whose transitions write down that they ran and do what a test tells them.
class DevSMTestMachine : public DevSMTransitionFactory {
public:
    using Journal = std::vector<std::string>;

    explicit DevSMTestMachine(RCShdPtr<DevSMTable> table) : table(std::move(table)) {}

    void start(const std::string& state) { start(table->getState(state.c_str())); }
    void start(int state) { engine = std::make_unique<DevSMExecutionEng>(table, *this, state); }

    void post(const std::string& event) { engine->postEvent(getEvent(event)); }
    unsigned getEvent(const std::string& event) const {
        return static_cast<unsigned>(table->getEvent(event.c_str()));
    }
    std::string getState() const { return engine->getStateName().getChars(); }
    std::string getFault() const { return engine->getFaultText().getChars(); }

    Journal takeJournal() { return std::exchange(journal, {}); }

    RCShdPtr<DevSMTransition> create(const LiString& transition) override {
        const std::string name = transition.getChars();
        asked.push_back(name);
        if (missing.contains(name)) return nullptr;
        if (undecided.contains(name)) return RCShdPtr<DevSMTransition>(new Plain(*this, name));
        return RCShdPtr<DevSMTransition>(new Conditional(*this, name));
    }

    const RCShdPtr<DevSMTable> table;
    std::unique_ptr<DevSMExecutionEng> engine;
    std::map<std::string, std::function<void()>> actions;           // by transition
    std::map<std::string, std::function<std::string()>> decisions;  // by conditional transition
    std::set<std::string> missing;    // the factory has nothing for these
    std::set<std::string> undecided;  // for these no conditional object
    Journal journal;                  // "transition@state", "transition?@state"
    Journal asked;                    // of the factory

private:
    void perform(const std::string& name, unsigned transition) {
        EXPECT_STREQ(table->getTransitions()[transition].getChars(), name.c_str());
        journal.push_back(name + "@" + getState());
        if (const auto action = actions.find(name); action != actions.end()) action->second();
    }

    class Plain : public DevSMTransition {
    public:
        Plain(DevSMTestMachine& machine, std::string name)
            : _machine(machine), _name(std::move(name)) {}
        void execute(unsigned transition) override { _machine.perform(_name, transition); }

    private:
        DevSMTestMachine& _machine;
        std::string _name;
    };

    class Conditional : public DevSMConditionalTransition {
    public:
        Conditional(DevSMTestMachine& machine, std::string name)
            : _machine(machine), _name(std::move(name)) {}
        void execute(unsigned transition) override { _machine.perform(_name, transition); }
        LiString evaluate() override {
            _machine.journal.push_back(_name + "?@" + _machine.getState());
            const auto decision = _machine.decisions.find(_name);
            return decision == _machine.decisions.end() ? _name.c_str()
                                                        : decision->second().c_str();
        }

    private:
        DevSMTestMachine& _machine;
        std::string _name;
    };
};

}  // namespace Orv
