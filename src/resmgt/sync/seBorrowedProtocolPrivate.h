#pragma once

#include "mtThread.h"
#include "mtThreadMgr.h"
#include "mtThreadProtocol.h"

namespace Orv {

/// What a thread of the engine owns in place of its protocol, which outlives the thread and can be
/// given to somebody else then.
///
/// - Ownership: borrows the protocol.
class SeBorrowedProtocol : public MtThreadProtocol {
public:
    explicit SeBorrowedProtocol(MtThreadProtocol& lender) : _lender(lender) {}

    /// What the calling thread runs, if it belongs to an engine; else null.
    static MtThreadProtocol* findCurrent() noexcept {
        const MtThread* const thread = MtThreadMgr::findCurrentThread();
        if (thread == nullptr) return nullptr;
        const auto* const borrowed = dynamic_cast<SeBorrowedProtocol*>(thread->getProtocol());
        return borrowed != nullptr ? &borrowed->_lender : nullptr;
    }

    void performAttach(MtThread* thread) override { _lender.performAttach(thread); }
    void performDetach(MtThread* thread) override { _lender.performDetach(thread); }
    void performBody(MtThread* thread) override { _lender.performBody(thread); }
    void performFinished(MtThread* thread) override { _lender.performFinished(thread); }
    void performStop(MtThread* thread) override { _lender.performStop(thread); }
    void performCanceled(MtThread* thread) override { _lender.performCanceled(thread); }

private:
    MtThreadProtocol& _lender;
};

}  // namespace Orv
