#include "devMDStdStreamLoopSource.h"

#include <utility>

#include "assertions.h"
#include "mtThreadFactory.h"

namespace Orv {

DevMDStdStreamLoopSource::DevMDStdStreamLoopSource(const LiString& name,
                                                   const LiString& description, Loop loop)
    : DevMDStdStreamActiveSource(name, description), _loop(std::move(loop)) {}

DevMDStdStreamLoopSource::~DevMDStdStreamLoopSource() noexcept(false) {
    stop();
    disconnect();
}

void DevMDStdStreamLoopSource::start() {
    DevMDStdStreamActiveSource::start();
    try {
        ObjPtr<MtThread> thread = MtThreadFactory::getInstance().create(
            getName(), MtThreadFunction::create([this](MtThread&) { run(); }));
        thread->start();
        const LkGuard guard(_mutex);
        _thread.swap(thread);
    } catch (...) {
        stop();
        throw;
    }
}

void DevMDStdStreamLoopSource::run() {
    const DevWaitGraph::Serving serving(_target);
    DevMDStreamElem::Ev ev = DevMDStreamElem::END;
    try {
        _loop(*this);
    } catch (...) {
        Assertions::traceCurrentException("running the loop of a stream's source");
        ev = DevMDStreamElem::FAILED;
    }
    push(ObjPtr<DevMDStreamElem>(new DevMDStreamElem(nullptr, ev)));  // unless it is over
}

void DevMDStdStreamLoopSource::disconnect() {
    ObjPtr<MtThread> thread;
    {
        const LkGuard guard(_mutex);
        // On the thread itself there is nothing to wait for; it goes with the next start or the end.
        if (!_thread.isNull() && !_thread->isCurrentThread()) thread.swap(_thread);
    }
    DevMDStdStreamActiveSource::disconnect();
    if (thread.isNull()) return;
    const DevWaitGraph::Wait wait(DevWaitGraph::Kind::END, _target, nullptr);
    thread->join();
}

}  // namespace Orv
