// Idle means idle: threads in every kind of wait, each after an earlier round, use no processor.
#include <gtest/gtest.h>

#include "cpuTime.h"
#include "eventually.h"
#include "gate.h"
#include "lkCondVar.h"
#include "lkEvent.h"
#include "lkGate.h"
#include "lkGateKeeperGuard.h"
#include "lkNamedSema.h"
#include "lkPulse.h"
#include "lkRwLock.h"
#include "lkSema.h"
#include "lkTicket.h"
#include "lkUnnamedSema.h"

namespace Orv {

namespace {

/// One object of every kind, and a thread in every wait that they offer.
class EveryWait {
public:
    EveryWait() {
        park([this] { _unnamed.wait(); });
        park([this] { _sema.wait(); });
        park([this] { EXPECT_TRUE(_sema.timedWait(1000)); });
        park([this] { _named.wait(); });
        park([this] { _event.wait(); });
        park([this] { waitFor(_one); });
        park([this] { waitFor(_all); });
        park([this] { waitFor(_condVar); });
        park([this] { _gate.ready(); });
        park([this] { _keptGate.ready(); });
        park([this] { _observedGate.observeGateReady(); });
        park([this] { _ticket.waitForTicket(_ticket.getTicket() + 1); });
        park([this] { const LkReadGuard reader(_rwLock); });
        park([this] { const LkWriteGuard writer(_rwLock); });
    }

    /// Keeps releasing until every thread has been through its wait, and leaves nothing pending.
    void letAllThrough() ORV_NO_THREAD_SAFETY_ANALYSIS {
        ++_nbRounds;
        const int nbThreads = static_cast<int>(_threads.size());
        _writer.unlock();
        std::jthread gatee([this] { _gate.ready(); });
        std::jthread keeper([this] { const LkGateKeeperGuard guard(_keptGate); });
        eventually("every thread is through", [&] {
            _unnamed.post();
            _sema.post();
            _named.post();
            _event.set();
            _one.pulse();
            _all.pulse();
            _condVar.signal();
            _observedGate.ready();
            _ticket.next();
            return _nbThrough.get() == _nbRounds * nbThreads;
        });
        while (_unnamed.tryWait() || _sema.tryWait() || _named.tryWait()) continue;
        _event.reset();
        _one.reset();
        _all.reset();
        _writer.lock();
    }

    void beginSecondRound() { _secondRound.open(); }

private:
    LkUnnamedSema _unnamed{"unnamed", 0};
    LkSema _sema{"sema"};
    LkNamedSema _named{nullptr, 0, LkSemaTypes::CREATE_OR_OPEN, "named"};
    LkEvent _event{"event", false};
    LkMutex _mutex{"mutex"};
    LkPulse _one{"one", LkPulse::WAKE_ONE};
    LkPulse _all{"all", LkPulse::WAKE_ALL};
    LkCondVar _condVar{"condition"};
    LkGate _gate{"gate", 2, false};
    LkGate _keptGate{"kept", 1, true};
    LkGate _observedGate{"observed", 1, false};
    LkTicket _ticket{"ticket"};
    LkRwLock _rwLock{"lock"};
    LkWriteGuard _writer{_rwLock};
    TestCounter _nbThrough;
    int _nbRounds = 0;
    Gate _secondRound;
    std::vector<std::jthread> _threads;

    template <class Wait>
    void park(Wait wait) {
        _threads.emplace_back([this, wait] {
            wait();
            _nbThrough.add();
            _secondRound.wait();
            wait();
            _nbThrough.add();
        });
    }

    void waitFor(LkWaitable& waitable) {
        const LkGuard guard(_mutex);
        waitable.wait(guard);
    }
};

TEST(Waits, leaveAnIdleProcessIdle) {
    EveryWait waits;
    waits.letAllThrough();
    waits.beginSecondRound();
    std::this_thread::sleep_for(std::chrono::milliseconds(100));
    const double before = getProcessCpuSeconds();
    std::this_thread::sleep_for(std::chrono::seconds(1));
    EXPECT_LT(getProcessCpuSeconds() - before, 0.1);
    waits.letAllThrough();
}

}  // namespace

}  // namespace Orv
