#include "devMDStdCall.h"

#include <atomic>
#include <cxxabi.h>
#include <exception>
#include <utility>

#include "assertions.h"
#include "devMDStdANO.h"
#include "lkSema.h"
#include "rcBase.h"
#include "rcShdPtr.h"

namespace Orv {

namespace {

/// What the two sides share; outlives the one that gives up.
class Outcome : public RCBase<LkCounter<long>>, public DevWaitGraph::Breaker {
public:
    /// For the device's thread, once.
    void tell(bool isDone, std::exception_ptr thrown) noexcept {
        _isDone = isDone;
        _thrown = std::move(thrown);
        State expected = State::PENDING;
        if (_state.compare_exchange_strong(expected, State::TOLD)) {
            _changed.post();
        } else if (_thrown) {
            traceThrown();
        }
    }

    /// For the sender: whether the request was carried out. Throws what it threw.
    bool await(const LkTimeLimit& limit) {
        if (limit.isInfinite()) {
            _changed.wait();
        } else {
            static_cast<void>(_changed.timedWait(limit.getRemainingMilliseconds() * 1e-3));
        }
        State expected = State::PENDING;
        if (_state.compare_exchange_strong(expected, State::GIVEN_UP)) return false;
        if (_thrown) std::rethrow_exception(std::exchange(_thrown, nullptr));
        return _isDone;
    }

    void letGo() override { _changed.post(); }

private:
    enum class State { PENDING, TOLD, GIVEN_UP };

    std::atomic<State> _state{State::PENDING};
    LkSema _changed{"DevMDStdCall", 0};
    bool _isDone = false;        // before TOLD
    std::exception_ptr _thrown;  // before TOLD

    void traceThrown() noexcept {
        try {
            std::rethrow_exception(std::exchange(_thrown, nullptr));
        } catch (...) {
            Assertions::traceCurrentException("carrying out a request that was given up");
        }
    }
};

/// The request, with what it throws caught for the sender.
class CallANO : public DevMDStdANO {
public:
    CallANO(ObjPtr<DevANO> request, const RCShdPtr<Outcome>& outcome)
        : _request(std::move(request)), _outcome(outcome) {}
    ~CallANO() override { tell(false, nullptr); }

    void performExecute() override {
        std::exception_ptr thrown;
        try {
            _request->performExecute();
            _request->notify();
        } catch (const abi::__forced_unwind&) {
            throw;
        } catch (...) {
            thrown = std::current_exception();
        }
        // The sender is the last to hold the exception.
        const bool isDone = thrown == nullptr;
        tell(isDone, std::move(thrown));
    }

private:
    const ObjPtr<DevANO> _request;
    RCShdPtr<Outcome> _outcome;  // null: told

    void tell(bool isDone, std::exception_ptr thrown) noexcept {
        if (_outcome.isNull()) return;
        _outcome->tell(isDone, std::move(thrown));
        _outcome.reset();
    }
};

}  // namespace

bool DevMDStdCall::perform(DevMDStdFifo& fifo, ObjPtr<DevANO> request, const LkTimeLimit& limit) {
    const RCShdPtr<Outcome> outcome(new Outcome);
    DevANOQueueEntry entry(ObjPtr<DevANO>(new CallANO(std::move(request), outcome)));
    // From before the request goes out: the device's own thread never asks itself.
    const DevWaitGraph::Wait wait(DevWaitGraph::Kind::ANSWER, fifo.getTarget(), outcome.get());
    if (wait.isRefused() || !fifo.timedProduce(entry, limit)) return false;
    return outcome->await(limit);
}

}  // namespace Orv
