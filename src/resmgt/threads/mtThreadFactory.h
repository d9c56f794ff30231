#pragma once

#include "liString.h"
#include "mtThread.h"
#include "mtThreadProtocol.h"
#include "objPtr.h"
#include "resmgtApi.h"

namespace Orv {

class MtThreadGroup;

/// Makes the threads of the process. Asking for it the first time brings the packages up.
///
/// - Threads: every member may be called by any thread.
class ORV_RESMGT_API MtThreadFactory {
public:
    /// @throws what InPackageInit::initializeAll() throws.
    static MtThreadFactory& getInstance();

    MtThreadFactory(const MtThreadFactory&) = delete;
    MtThreadFactory& operator=(const MtThreadFactory&) = delete;

    /// A thread that has not been started.
    /// @param name  also the system's name of the thread, cut to what that takes.
    /// @param protocol  may be null: a thread that ends at once.
    /// @param terminatesOnUnhandled  an exception that leaves the body is logged and ends the
    ///   process.
    /// @param stackSize  bytes that the body has for certain; 0 is MtThread::DEFAULT_STACK_SIZE.
    ObjPtrRet<MtThread> create(const LiString& name, ObjPtr<MtThreadProtocol> protocol,
                               bool terminatesOnUnhandled = false, unsigned stackSize = 0);

    /// The same in a group, which must outlive the thread.
    ObjPtrRet<MtThread> create(MtThreadGroup& group, const LiString& name,
                               ObjPtr<MtThreadProtocol> protocol,
                               bool terminatesOnUnhandled = false, unsigned stackSize = 0);

private:
    friend class MtThreadMgrImp;
    friend class ThreadsPackage;

    MtThreadFactory() = default;

    static MtThreadFactory& get();  // without bringing packages up

    bool isOnMainThread() const;
    ObjPtrRet<MtThread> createMainThread();
};

}  // namespace Orv
