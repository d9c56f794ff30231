#pragma once

#include <deque>
#include <iosfwd>
#include <string_view>
#include <vector>

#include "devSMTable.h"
#include "devSMTransitionFactory.h"
#include "rcShdPtr.h"
#include "resmgtApi.h"

namespace Orv {

struct DevSMStep;

/// Runs one state machine: stands in a state, takes events, acts and moves on as the table says.
///
/// An event runs to its end before the next begins. An event that its state does not expect leads
/// to "_ill", an exception of a transition to "_exc" unless the description sends it elsewhere;
/// both end the machine. What contradicts the table stops it with an error code. In these cases
/// events still pending are dropped, and getFaultText() tells what happened.
///
/// - Threads: driven by one thread at a time; it has no lock. A transition does not destroy it.
/// - Ownership: shares the table and the transitions; the factory is used by the constructor only.
class ORV_RESMGT_API DevSMExecutionEng {
public:
    /// The first other than NO_ERROR_CODE stays.
    enum ErrorCode {
        NO_ERROR_CODE = 0,
        LOOKUP_FAILED = 1,             ///< The table has no such entry for the event.
        TRANSITION_FAILED = 2,         ///< A transition without a check raised an exception.
        NEXT_STATE_LOOKUP_FAILED = 3,  ///< The table has no such entry for the transition.
        BAD_IMPLEMENTATION = 4         ///< Table, transitions and conditions contradict each other.
    };

    /// Asks the factory for all declared transitions.
    /// @throws RCEx::ExNullPtr without a table, DevMgrEx::SMDomainError for a state that is none,
    ///   DevMgrEx::SMBadTransitionImp if the factory has no object for a transition, or one that
    ///   cannot decide where it has to, DevMgrEx::SMBadImp if the table contradicts itself.
    DevSMExecutionEng(RCShdPtr<DevSMTable> table, DevSMTransitionFactory&, int initialState);
    ~DevSMExecutionEng();

    DevSMExecutionEng(const DevSMExecutionEng&) = delete;
    DevSMExecutionEng& operator=(const DevSMExecutionEng&) = delete;

    /// Executes the event and all that come of it. From inside a transition: makes the event wait
    /// until the machine has got to where it is going.
    /// @throws DevMgrEx::SMExecutionError if the machine has ended or stopped,
    ///   DevMgrEx::SMDomainError for an event that is none; neither changes anything.
    ///   DevMgrEx::SMBadImp and what an unchecked transition throws, with the error code set.
    void postEvent(unsigned event);

    /// Inside a transition the state being left; between events a declared one, "_ill" or "_exc".
    int getState() const noexcept { return _state; }
    LiString getStateName() const;  ///< "?" where a bad table has led nowhere.
    int getErrorCode() const noexcept { return _errorCode; }

    /// Would postEvent() accept an event?
    bool isAlive() const noexcept { return _mode == Mode::READY || _mode == Mode::BUSY; }

    /// Why the machine has ended or stopped, or what the last exception of a transition said, and
    /// the state and event in which that was; empty and -1 if nothing of the kind has happened.
    const LiString& getFaultText() const noexcept { return _faultText; }
    int getFaultState() const noexcept { return _faultState; }
    int getFaultEvent() const noexcept { return _faultEvent; }

    const DevSMTable& getTable() const { return *_table; }

    /// State, error, pending events and transitions; those whose exceptions are events of the
    /// machine are shown as "ExEngPrimary( name )".
    void dump(std::ostream&) const;

private:
    enum class Mode : unsigned char { READY, BUSY, ENDED, FAULTED };

    RCShdPtr<DevSMTable> _table;
    std::vector<RCShdPtr<DevSMTransition>> _transitions;  // by index; null where none exists
    std::deque<unsigned> _pending;
    int _state;
    int _errorCode = NO_ERROR_CODE;
    Mode _mode = Mode::READY;

    // Of the table, at hand for the common case: a declared event in a declared state.
    unsigned _nbEvents;
    unsigned _nbDeclaredStates;
    unsigned _nbDeclaredEvents;
    const DevSMStep* _steps;

    // The event being executed, and the last fault.
    int _originState = -1;
    int _originEvent = -1;
    LiString _faultText;
    int _faultState = -1;
    int _faultEvent = -1;

    void createTransitions(DevSMTransitionFactory&);
    RCShdPtr<DevSMTransition> createTransition(DevSMTransitionFactory&, unsigned transition) const;
    void postOtherwise(unsigned event);
    void execute(unsigned event);
    void executeStepByStep(unsigned event);
    int lookUpTransition(unsigned event);
    bool take(int transition, int* chosen);
    bool run(int transition, int* chosen);
    int choose(int transition);
    void advance(int transition);
    void arrive();
    void keepFault(std::string_view text, std::string_view detail = "") noexcept;
    void keepCurrentException() noexcept;
    void stop(ErrorCode) noexcept;
    [[noreturn]] void stopAsBadImplementation(std::string_view why, std::string_view detail = "");
};

}  // namespace Orv
