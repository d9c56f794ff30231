#pragma once

#include <atomic>

#include "devMDStdFifo.h"
#include "mtThreadProtocol.h"

namespace Orv {

/// What a device's thread does: takes the requests out of the device's queue and carries them out,
/// one after the other.
///
/// A device whose thread has more to do derives from it and overrides performRun().
///
/// - Threads: consume() and tryConsume() on the device's thread.
/// - Errors: a request that throws is traced and its completion object destroyed unrun, which tells
///   who waits for it; what a completion object throws is traced. The thread lives on.
class ORV_RESMGT_API DevMDStdThreadProtocol : public MtThreadProtocol {
public:
    explicit DevMDStdThreadProtocol(RCShdPtr<DevMDStdFifo> fifo);
    ~DevMDStdThreadProtocol() override;

    /// Carries out the next request, waiting for it.
    /// @throws DevPrtclEx::ExMDStdFifoClosed, RCEx::ExNullPtr without a queue
    void consume();
    bool tryConsume();  ///< False if there is no request.

    /// For performRun(): shall the thread end? It does so after the closing request.
    bool isLeaving() const noexcept { return _isLeaving.load(std::memory_order_acquire); }
    void leave() noexcept { _isLeaving.store(true, std::memory_order_release); }

    const RCShdPtr<DevMDStdFifo>& getFifo() const noexcept { return _fifo; }

    void performBody(MtThread* thread) final;  ///< Ends with closing the queue.
    void performStop(MtThread* thread) override;

protected:
    /// By default consumes until the thread shall leave. What it throws is traced and ends the
    /// thread and thereby the device.
    virtual void performRun();

private:
    const RCShdPtr<DevMDStdFifo> _fifo;
    std::atomic<bool> _isLeaving{false};

    static void execute(DevANOQueueEntry& entry);
    static void traceDeath(MtThread& thread) noexcept;
};

}  // namespace Orv
