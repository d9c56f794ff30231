#include "assertions.h"
#include "envIntVar.h"
#include "inPackageInit.h"
#include "mtLogger.h"
#include "mtThread.h"
#include "mtThreadFactory.h"
#include "mtThreadMgr.h"
#include "resmgtInit.h"
#include "trace.h"

namespace Orv {

/// Threads may be started from its start to its shutdown, which sees to it that they end.
class ThreadsPackage : public InPackageInit {
public:
    ThreadsPackage() : InPackageInit("threads", InInit<OrvInit::threads>::getType()) {
        registerPackage();
        addDependency(InInit<OrvInit::literals>::getType());
        addDependency(InInit<OrvInit::smartPtrs>::getType());
        addDependency(InInit<OrvInit::locks>::getType());
        addDependency(InInit<OrvInit::base>::getType());
    }

private:
    static constexpr double LONGEST_SHUTDOWN_SECONDS = 10.0;

    void performInitialize() override {
        makeMainThread();
        enableRealTime();
        MtThread::allowStart();
        startLogger();
    }

    void performShutdown() override {
        MtThread::allowStart(false);
        for (const LiString& name : MtThreadMgr::get().stopThreads(LONGEST_SHUTDOWN_SECONDS)) {
            ORV_TRACE(TraceLevel::getMain())
                << "Thread \"" << name << "\" did not end when it was asked to.";
        }
        MtThreadMgr::get().setRealTime(false);
    }

    static void makeMainThread() {
        MtThreadFactory& factory = MtThreadFactory::get();
        if (MtThreadMgr::get().findMainThread() == nullptr && factory.isOnMainThread()) {
            MtThreadMgr::get().createMainThread(factory);
        }
    }

    static void enableRealTime() {
        static EnvIntVar forceRealTime("ORV_THREAD_FORCE_REALTIME", 0);
        if (MtThreadMgr::getRealTimeParam() == MtThreadMgr::NOT_DECLARED) {
            forceRealTime.refresh();
            if (forceRealTime.getValue() > 0) MtThreadMgr::indicateAppIsRealTime(false);
        }
        if (MtThreadMgr::getRealTimeParam() != MtThreadMgr::NOT_DECLARED) {
            MtThreadMgr::get().setRealTime(true);
        }
    }

    /// A program without the thread gets its log, too.
    static void startLogger() {
        try {
            MtLogger::start();
        } catch (...) {
            Assertions::traceCurrentException("starting the logger");
        }
    }
};

namespace {

const ThreadsPackage threadsPackage;

const InPlainPackage<OrvInit::threadExtensions, OrvInit::threads, OrvInit::literals,
                     OrvInit::smartPtrs, OrvInit::locks, OrvInit::base>
    threadExtensionsPackage("threadExtensions");

}  // namespace

}  // namespace Orv
