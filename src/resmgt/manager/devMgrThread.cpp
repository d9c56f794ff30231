#include "devMgrThread.h"

#include <utility>
#include <vector>

#include "assertions.h"
#include "devClonableANO.h"
#include "devMDStdAccessPrtcl.h"
#include "devMgrACO.h"
#include "devSenderWait.h"
#include "lgSpan.h"
#include "lkLock.h"
#include "mtThreadFactory.h"

namespace Orv {

DevMgrACO::DevMgrACO(ObjPtr<DevANO> ano, RCShdPtr<DevMgrFifo> fifo)
    : _ano(std::move(ano)), _fifo(std::move(fifo)) {}

DevMgrACO::~DevMgrACO() = default;

void DevMgrACO::performExecute() {
    _fifo->produce(DevANOQueueEntry(std::move(_ano)));
}

/// What the manager's thread does.
class DevMgrThread::ANOThreadProtocol : public MtThreadProtocol {
public:
    explicit ANOThreadProtocol(const RCShdPtr<DevMgrFifo>& fifo) : _fifo(fifo) {}

    void performBody(MtThread*) override {
        const DevWaitGraph::Serving serving(_fifo->getTarget());
        try {
            run();
        } catch (...) {
            Assertions::traceCurrentException(
                "delivering a notification; the manager's thread ends");
            _fifo->close(true);
            return;
        }
        _fifo->close(false);
    }

    /// The process comes to its end, perhaps; a manager that is closed has met the thread before.
    void performStop(MtThread*) override {
        _isStopping = true;
        if (!_isMet.load()) _fifo->close(false);
    }

    void setMet() noexcept { _isMet = true; }
    void leave() noexcept { _isStopping = true; }

private:
    const RCShdPtr<DevMgrFifo> _fifo;
    std::atomic<bool> _isStopping{false};
    std::atomic<bool> _isMet{false};

    void run() {
        ObjPtr<DevANO> ano;  // lives until the next one is there
        while (!_isStopping.load()) {
            DevANOQueueEntry entry = _fifo->consume();
            if (entry.isEmpty()) break;
            ano = entry.release();
            const LgSpan span("manager", "notification");
            ano->performExecute();
            ano->notify();
        }
    }
};

/// The last notification: holds the thread at a known point while it is told to stop.
class DevMgrThread::SynchronizedCloseANO : public DevClonableANO {
public:
    SynchronizedCloseANO() : _receiver("DevMgr SynchronizedCloseANO") {}
    ~SynchronizedCloseANO() override {
        if (!_hasRun) _receiver.post();
    }

    DevReceiverWait& getReceiver() noexcept { return _receiver; }

    void performExecute() override {
        _hasRun = true;
        _receiver.post();
        _receiver.wait();
    }

    ObjPtrRet<DevClonableANO> clone() const override {
        Assertions::throwProgramAborted("src/resmgt/devMgrThread", 83,
                                        "SynchronizedCloseANO is never cloned");
    }

private:
    DevReceiverWait _receiver;
    bool _hasRun = false;
};

namespace {

/// Threads whose manager was let go on the thread itself: they end by themselves, and are joined
/// when the next manager is made.
class AbandonedThreads {
public:
    static AbandonedThreads& getInstance() {
        static AbandonedThreads& instance = *new AbandonedThreads;
        return instance;
    }

    void add(ObjPtr<MtThread> thread, ObjPtr<PriorityRelation> relation,
             const RCShdPtr<DevMgrFifo>& fifo) {
        const LkGuard guard(_lock);
        _threads.push_back({std::move(relation), std::move(thread), fifo});
    }

    void joinEnded() {
        const LkGuard guard(_lock);
        std::erase_if(_threads, [](Abandoned& abandoned) {
            if (abandoned.thread->isCurrentThread() || !abandoned.fifo->isClosed()) return false;
            abandoned.thread->join();  // closing the queue is the last that it does
            return true;
        });
    }

private:
    struct Abandoned {
        ObjPtr<PriorityRelation> relation;
        ObjPtr<MtThread> thread;
        RCShdPtr<DevMgrFifo> fifo;
    };

    LkLock _lock{"DevMgrThread abandoned"};
    std::vector<Abandoned> _threads ORV_GUARDED_BY(_lock);
};

}  // namespace

DevMgrThread::DevMgrThread(RCShdPtr<DevMgrFifo> fifo) : _fifo(std::move(fifo)) {
    AbandonedThreads::getInstance().joinEnded();
    _thread = MtThreadFactory::getInstance().create(
        "DevMgr ANO", ObjPtr<MtThreadProtocol>(new ANOThreadProtocol(_fifo)));
    _priorityRelation.reset(
        new PriorityRelation("DevMgr ANO", _thread->getPriority(), PriorityRelation::LESS,
                             const_cast<Priority&>(DevMDStdAccessPrtcl::getPriority())));
    _thread->start();
}

DevMgrThread::~DevMgrThread() noexcept(false) {
    if (_thread->isCurrentThread()) {
        abandon();
        Assertions::reportAssertionFailed(ORV_FILE, __LINE__, "!_thread->isCurrentThread()");
        return;
    }
    try {
        close();
    } catch (...) {
        Assertions::traceCurrentException("closing a manager's thread");
    }
}

void DevMgrThread::close() {
    auto& protocol = static_cast<ANOThreadProtocol&>(*_thread->getProtocol());
    if (!_fifo->isClosed()) {
        ObjPtr<SynchronizedCloseANO> ano(new SynchronizedCloseANO);
        DevSenderWait sender(ano->getReceiver());
        const DevWaitGraph::Wait wait(DevWaitGraph::Kind::END, _fifo->getTarget(), nullptr);
        try {
            _fifo->produce(DevANOQueueEntry(ObjPtr<DevANO>(std::move(ano))));
        } catch (...) {
            Assertions::traceCurrentException("closing a manager whose thread has died");
        }
        // A thread that the system has ended, as it does while a process exits, tells nobody.
        while (!sender.timedWait(1.0)) {
            if (_thread->timedJoin(0)) break;
        }
        protocol.setMet();
        if (_thread->isRunning()) _thread->requestStop();
        sender.post();
    }
    const DevWaitGraph::Wait wait(DevWaitGraph::Kind::END, _fifo->getTarget(), nullptr);
    _thread->join();
}

void DevMgrThread::abandon() {
    static_cast<ANOThreadProtocol&>(*_thread->getProtocol()).leave();
    AbandonedThreads::getInstance().add(std::move(_thread), std::move(_priorityRelation), _fifo);
}

}  // namespace Orv
