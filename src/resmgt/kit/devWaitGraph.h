#pragma once

#include <atomic>

#include "resmgtApi.h"

namespace Orv {

/// Who waits for whom, among the threads that others wait for: keeps them from waiting for one
/// another in a circle, for ever.
///
/// A thread that empties a queue, opens a device or drives a stream is Serving a target meanwhile.
/// Each of its waits for the server of a target is a Wait. Threads that serve nobody can stand in
/// no circle, and their waits cost one look at a thread-local pointer.
///
/// - Threads: every class by any thread; objects are used by the thread that made them.
/// - Locks: none of the caller's may be held that a Breaker takes.
class ORV_RESMGT_API DevWaitGraph {
public:
    class Serving;
    class Wait;

    /// A thread that others may wait for.
    struct Party {
        Wait* wait = nullptr;  // what it waits at, innermost; guarded by the graph's lock
    };

    /// What threads wait at; has at most one server at a time.
    class ORV_RESMGT_API Target {
    public:
        Target() noexcept = default;
        Target(const Target&) = delete;
        Target& operator=(const Target&) = delete;

    private:
        friend class DevWaitGraph;
        Party* _server = nullptr;  // guarded by the graph's lock
    };

    /// Ends a wait that closes a circle. Called under the graph's lock.
    class ORV_RESMGT_API Breaker {
    public:
        virtual void letGo() = 0;

    protected:
        ~Breaker() = default;
    };

    enum class Kind {
        ROOM,    ///< For room in a queue: can be ended by going past its capacity.
        ANSWER,  ///< For an answer: can fail.
        END      ///< For another thread to come to an end: can neither fail nor be cut short.
    };

    static bool isServing() noexcept;  ///< Does anybody wait for the calling thread, perhaps?
};

/// For its lifetime the calling thread is the one that serves @p target.
class ORV_RESMGT_API DevWaitGraph::Serving {
public:
    explicit Serving(Target& target);
    ~Serving();
    Serving(const Serving&) = delete;
    Serving& operator=(const Serving&) = delete;

private:
    Target& _target;
    Party _own;      // if this is the thread's outermost
    Party* _party;   // the thread's
    Party* _before;  // who served the target
};

/// A wait of the calling thread, from before it begins until it is over.
///
/// Where it would close a circle, a wait for room in that is let past, the new one first. If there
/// is none, a new wait for an answer isRefused(); one for an end breaks a wait for an answer.
class ORV_RESMGT_API DevWaitGraph::Wait {
public:
    /// @param breaker  borrowed; for ROOM and ANSWER.
    Wait(Kind kind, Target& target, Breaker* breaker) {
        if (isServing()) enter(kind, target, breaker);
    }
    ~Wait() {
        if (_party != nullptr) leave();
    }
    Wait(const Wait&) = delete;
    Wait& operator=(const Wait&) = delete;

    bool isRefused() const noexcept { return _isRefused; }     ///< Nobody would ever end it.
    bool isLetGo() const noexcept { return _isLetGo.load(); }  ///< Do not wait any longer.

private:
    friend class DevWaitGraph;

    Party* _party = nullptr;  // null: not in the graph
    Kind _kind = Kind::END;
    Target* _target = nullptr;
    Breaker* _breaker = nullptr;
    Wait* _outer = nullptr;
    bool _isRefused = false;
    std::atomic<bool> _isLetGo{false};

    void enter(Kind kind, Target& target, Breaker* breaker);
    void leave();
};

}  // namespace Orv
