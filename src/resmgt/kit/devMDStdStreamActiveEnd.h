#pragma once

#include <atomic>
#include <exception>

#include "devAEOSlot.h"
#include "devMDStream.h"
#include "devWaitGraph.h"
#include "lkCondVar.h"
#include "lkMutex.h"
#include "lkThreadId.h"
#include "objPtr.h"

namespace Orv {

/// What the standard active ends share: the partner, and whether the end's thread is just using it.
///
/// @tparam Partner  the passive end that is driven.
template <class Partner>
class ORV_HEADER_API DevMDStdStreamActiveEnd {
public:
    using State = DevMDStream::State;

    void connect(RCShdPtr<Partner> partner);
    void disconnect();
    void start() { setState(State::RUNNING); }
    void stop() { setState(State::FREE); }
    State getState() const;
    std::exception_ptr getFailure() const;
    void setEndAEO(ObjPtr<DevAEO> aeo) { _aeo.set(std::move(aeo)); }

    /// Sets how it ended, if it was running; what has ended may still turn out to have failed.
    void end(State state, std::exception_ptr failure = nullptr);
    void tellEnd() noexcept;  ///< Executes the event object, unless the end is free or running.

    /// The calling thread's use of the partner, which disconnect() waits for.
    class Use {
    public:
        explicit Use(DevMDStdStreamActiveEnd& end);
        ~Use();
        Use(const Use&) = delete;
        Use& operator=(const Use&) = delete;

        Partner* operator->() const noexcept { return _partner.get(); }
        bool isPossible() const noexcept { return !_partner.isNull(); }  ///< Running, connected.

    private:
        DevMDStdStreamActiveEnd& _end;
        const DevWaitGraph::Serving _serving;
        RCShdPtr<Partner> _partner;
    };

private:
    mutable LkMutex _mutex{"DevMDStdStream"};
    LkCondVar _idle{"DevMDStdStream idle"};
    DevWaitGraph::Target _target;  // the thread that uses the partner
    RCShdPtr<Partner> _partner ORV_GUARDED_BY(_mutex);
    State _state ORV_GUARDED_BY(_mutex) = State::FREE;
    std::exception_ptr _failure ORV_GUARDED_BY(_mutex);
    LkThreadId _user ORV_GUARDED_BY(_mutex);
    int _nbUses ORV_GUARDED_BY(_mutex) = 0;
    DevAEOSlot<DevAEO> _aeo;

    void setState(State state);
};

}  // namespace Orv

#include "devMDStdStreamActiveEnd.imp"
