#include "devMDStdThreadProtocol.h"

#include <cxxabi.h>
#include <string>

#include "assertions.h"
#include "devPrtclEx.h"
#include "lgSpan.h"
#include "mtThread.h"

namespace Orv {

DevMDStdThreadProtocol::DevMDStdThreadProtocol(RCShdPtr<DevMDStdFifo> fifo)
    : _fifo(std::move(fifo)) {}

DevMDStdThreadProtocol::~DevMDStdThreadProtocol() = default;

void DevMDStdThreadProtocol::consume() {
    DevANOQueueEntry entry = _fifo->consume();
    execute(entry);
}

bool DevMDStdThreadProtocol::tryConsume() {
    DevANOQueueEntry entry;
    if (!_fifo->tryConsume(entry)) return false;
    execute(entry);
    return true;
}

void DevMDStdThreadProtocol::execute(DevANOQueueEntry& entry) {
    const ObjPtr<DevANO> ano = entry.release();
    const LgSpan span("device", "request");
    try {
        ano->performExecute();
    } catch (...) {
        Assertions::traceCurrentException("carrying out a device's request");
        return;
    }
    try {
        ano->notify();
    } catch (...) {
        Assertions::traceCurrentException("telling of a request's completion");
    }
}

void DevMDStdThreadProtocol::performBody(MtThread* thread) {
    DevMDStdFifo& fifo = *_fifo;
    const DevWaitGraph::Serving serving(fifo.getTarget());
    // However the thread ends, nobody waits for it afterwards.
    struct Closer {
        DevMDStdFifo& fifo;
        ~Closer() {
            try {
                fifo.close();
            } catch (...) {
                Assertions::traceCurrentException("closing a device's queue");
            }
        }
    } closer{fifo};
    try {
        performRun();
    } catch (const abi::__forced_unwind&) {
        throw;
    } catch (const DevPrtclEx::ExMDStdFifoClosed&) {
        if (!fifo.isClosed()) traceDeath(*thread);
    } catch (...) {
        traceDeath(*thread);
    }
}

/// At once, and not when somebody joins the thread: that may be hours later.
void DevMDStdThreadProtocol::traceDeath(MtThread& thread) noexcept {
    const std::string where =
        "running the device \"" + std::string(thread.getName().getText()) + "\", which has died";
    Assertions::traceCurrentException(where.c_str());
}

void DevMDStdThreadProtocol::performRun() {
    while (!isLeaving()) consume();
}

/// Somebody wants the thread gone without having closed the device: the process ends, perhaps.
void DevMDStdThreadProtocol::performStop(MtThread*) {
    leave();
    _fifo->close();
}

}  // namespace Orv
