#include "mtThreadPool.h"

#include <cstdlib>
#include <exception>

#include "assertions.h"
#include "formatText.h"
#include "mtPriorityMgr.h"
#include "mtThreadFactory.h"
#include "priorityRelation.h"
#include "trace.h"
#include "traceManager.h"

namespace Orv {

/// What a worker's thread runs.
class MtThreadPool::PoolWorker : public MtThreadProtocol {
public:
    PoolWorker(MtThreadPool& pool, unsigned index) : _pool(pool), _index(index) {}

    void performAttach(MtThread* thread) override {
        _relation.reset(new PriorityRelation("equalGroup", thread->getPriority(),
                                             PriorityRelation::EQUAL, _pool._priority));
    }
    void performDetach(MtThread*) override { _relation.reset(); }
    void performStop(MtThread*) override { _pool.askToStop(); }

    void performBody(MtThread*) override {
        _current = this;
        _pool.runWorker(_index);
    }
    void performFinished(MtThread*) override { _current = nullptr; }

    /// The number that the calling thread has in the pool.
    static unsigned findIn(const MtThreadPool& pool) noexcept {
        return _current != nullptr && &_current->_pool == &pool ? _current->_index : NO_WORKER;
    }

private:
    static constinit thread_local const PoolWorker* _current;

    MtThreadPool& _pool;
    const unsigned _index;
    ObjPtr<PriorityRelation> _relation;
};

constinit thread_local const MtThreadPool::PoolWorker* MtThreadPool::PoolWorker::_current = nullptr;

MtThreadPool::MtThreadPool(const LiString& name, unsigned nbThreads, bool placeOnProcessors,
                           unsigned stackSize)
    : _name(name),
      _placesOnProcessors(placeOnProcessors),
      _priority(name, MtPriorityMgr::getInstance()) {
    MtThreadFactory& factory = MtThreadFactory::getInstance();
    _threads.reserve(nbThreads);
    for (unsigned i = 0; i < nbThreads; ++i) {
        const LiString threadName(formatText("%s %u", name.getChars(), i).c_str());
        ObjPtr<MtThreadProtocol> worker(new PoolWorker(*this, i));
        _threads.emplace_back(factory.create(threadName, worker, false, stackSize));
    }
}

MtThreadPool::~MtThreadPool() {
    const LkGuard guard(_control);
    if (_hasStarted) abortDestroyed();
}

/// The derived class, whose functions the workers call, is gone. Destructor and workers meet here in
/// any order.
void MtThreadPool::abortDestroyed() const {
    ORV_TRACE(TraceLevel::getMain()) << "Thread pool \"" << _name
                                     << "\" is destroyed while it runs: stop it in the destructor "
                                        "of the derived class.";
    TraceManager::getInstance().flush();
    std::abort();
}

void MtThreadPool::start() {
    if (findWorker() != NO_WORKER && isRunning()) return;
    ORV_ASSERT_TEXT(findWorker() == NO_WORKER, "!isWorker()");
    const LkGuard guard(_control);
    if (_hasStarted) {
        if (isRunning()) return;
        stopNoLock();
    }
    startNoLock();
}

void MtThreadPool::startNoLock() {
    prepareThreads();
    _hasStarted = true;
    _isRunning.store(true, std::memory_order_release);
    try {
        for (unsigned i = 0; i < getNbThreads(); ++i) {
            const int processor = static_cast<int>(i);
            if (_placesOnProcessors && _threads[i]->isProcessorPlaceable(processor)) {
                _threads[i]->setProcessorNb(processor);
            }
            _threads[i]->start();
        }
        threadsStarted();
    } catch (...) {
        try {
            stopNoLock();
        } catch (...) {
            Assertions::traceCurrentException("stopping a thread pool that could not be started");
        }
        throw;
    }
}

void MtThreadPool::stop() {
    ORV_ASSERT_TEXT(findWorker() == NO_WORKER, "!isWorker()");
    const LkGuard guard(_control);
    if (_hasStarted) stopNoLock();
}

void MtThreadPool::stopNoLock() {
    std::exception_ptr first;
    const auto keepFirst = [&first](auto action) {
        try {
            action();
        } catch (...) {
            if (first == nullptr) {
                first = std::current_exception();
            } else {
                Assertions::traceCurrentException("stopping a thread pool");
            }
        }
    };
    keepFirst([this] { askToStop(); });
    for (const ObjPtr<MtThread>& thread : _threads) keepFirst([&] { thread->join(); });
    _hasStarted = false;
    if (first != nullptr) std::rethrow_exception(first);
}

void MtThreadPool::askToStop() {
    const LkGuard guard(_stopping);
    if (_isRunning.exchange(false, std::memory_order_acq_rel)) stopThreads();
}

void MtThreadPool::runWorker(unsigned worker) {
    do {
        obtainTask(worker);
        performTask(worker);
        doneTask(worker);
    } while (isRunning());
}

unsigned MtThreadPool::findWorker() const noexcept {
    return PoolWorker::findIn(*this);
}

void MtThreadPool::obtainTask(unsigned) {}
void MtThreadPool::performTask(unsigned) {
    abortDestroyed();
}
void MtThreadPool::doneTask(unsigned) {}
void MtThreadPool::stopThreads() {}
void MtThreadPool::prepareThreads() {}
void MtThreadPool::threadsStarted() {}

}  // namespace Orv
