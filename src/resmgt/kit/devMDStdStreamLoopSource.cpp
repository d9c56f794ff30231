#include "devMDStdStreamLoopSource.h"

#include <cxxabi.h>
#include <utility>

#include "assertions.h"
#include "devMDStdStreamNewsPrivate.h"
#include "lkSema.h"
#include "mtThreadFactory.h"

namespace Orv {

/// Where the starter waits for the loop's thread to be prepared. Lies on the starter's stack.
class DevMDStdStreamLoopSource::Preparation {
public:
    /// For the loop's thread: the last it does with this object.
    void tell(std::exception_ptr thrown) noexcept {
        _thrown = std::move(thrown);
        _told.post();
    }

    /// For the starter. Throws what the preparation threw.
    void await(MtThread& thread) {
        // A thread that the system has ended, as it does while a process exits, tells nobody.
        while (!_told.timedWait(1.0)) {
            if (thread.timedJoin(0)) return;
        }
        if (_thrown) std::rethrow_exception(std::exchange(_thrown, nullptr));
    }

private:
    LkSema _told{"DevMDStdStreamLoopSource", 0};
    std::exception_ptr _thrown;
};

DevMDStdStreamLoopSource::DevMDStdStreamLoopSource(const LiString& name,
                                                   const LiString& description, Loop loop,
                                                   Loop prepare, unsigned stackSize)
    : DevMDStdStreamActiveSource(name, description),
      _loop(std::move(loop)),
      _prepare(std::move(prepare)),
      _stackSize(stackSize) {}

DevMDStdStreamLoopSource::~DevMDStdStreamLoopSource() noexcept(false) {
    stop();
    disconnect();
}

void DevMDStdStreamLoopSource::start() {
    DevMDStdStreamActiveSource::start();
    try {
        Preparation preparation;
        Preparation* const told = _prepare ? &preparation : nullptr;
        ObjPtr<MtThread> thread = MtThreadFactory::getInstance().create(
            getName(), MtThreadFunction::create([this, told](MtThread&) { run(told); }), false,
            _stackSize);
        thread->start();
        MtThread& running = *thread;
        {
            const LkGuard guard(_mutex);
            _thread.swap(thread);
        }
        if (told == nullptr) return;
        // What it asks of the starter's device, which waits here, is refused.
        const DevWaitGraph::Wait wait(DevWaitGraph::Kind::END, _target, nullptr);
        preparation.await(running);
    } catch (...) {
        stop();
        endThread();
        throw;
    }
}

void DevMDStdStreamLoopSource::run(Preparation* preparation) {
    const DevWaitGraph::Serving serving(_target);
    if (preparation != nullptr && !prepare(*preparation)) return;
    try {
        _loop(*this);
    } catch (const abi::__forced_unwind&) {
        throw;
    } catch (...) {
        Assertions::traceCurrentException(
            DevMDStdStreamNews::describe("running the loop of", getName()).c_str());
        fail(std::current_exception());
        return;
    }
    push(ObjPtr<DevMDStreamElem>(
        new DevMDStreamElem(nullptr, DevMDStreamElem::END)));  // unless it is over
}

/// Whether the loop may run.
bool DevMDStdStreamLoopSource::prepare(Preparation& preparation) {
    std::exception_ptr thrown;
    try {
        _prepare(*this);
    } catch (const abi::__forced_unwind&) {
        preparation.tell(nullptr);
        throw;
    } catch (...) {
        thrown = std::current_exception();
    }
    const bool isPrepared = thrown == nullptr;
    preparation.tell(std::move(thrown));
    return isPrepared;
}

void DevMDStdStreamLoopSource::disconnect() {
    DevMDStdStreamActiveSource::disconnect();
    endThread();
}

void DevMDStdStreamLoopSource::endThread() {
    ObjPtr<MtThread> thread;
    {
        const LkGuard guard(_mutex);
        // On the thread itself there is nothing to wait for; it goes with the next start or the end.
        if (!_thread.isNull() && !_thread->isCurrentThread()) thread.swap(_thread);
    }
    if (thread.isNull()) return;
    const DevWaitGraph::Wait wait(DevWaitGraph::Kind::END, _target, nullptr);
    thread->join();
}

}  // namespace Orv
