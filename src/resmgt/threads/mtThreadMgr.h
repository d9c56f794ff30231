#pragma once

#include <cstddef>
#include <iosfwd>
#include <memory>
#include <vector>

#include "liString.h"
#include "resmgtApi.h"

namespace Orv {

class MtThread;
class MtThreadFactory;
class MtThreadGroup;
class MtThreadMgrImp;

/// All threads of the process that are MtThreads, and the class in which the process is scheduled.
///
/// One for the process, never destroyed; asking for it the first time brings the packages up.
///
/// - Threads: every member may be called by any thread.
class ORV_RESMGT_API MtThreadMgr {
public:
    /// What the application has declared of real time.
    enum RealTimeParam { NOT_DECLARED = 0, REAL_TIME_OPTIONAL = 1, REAL_TIME_REQUIRED = 2 };

    /// @throws what InPackageInit::initializeAll() throws, MtEx::ExRealTimeNotEnabled included.
    static MtThreadMgr& getInstance();

    MtThreadMgr(const MtThreadMgr&) = delete;
    MtThreadMgr& operator=(const MtThreadMgr&) = delete;

    // Threads

    /// The calling thread; null if that is no MtThread.
    static MtThread* findCurrentThread() noexcept;

    /// Makes the object of the main thread, which calls this, where the package was not started on
    /// it. Asserts that it is the "first".
    MtThread& createMainThread(MtThreadFactory& factory);
    MtThread* findMainThread() const noexcept;  ///< Null if there is no object for it.

    std::size_t getNbThreads() const;              ///< Made and not destroyed yet.
    std::vector<LiString> getThreadNames() const;  ///< In order of creation.

    /// Asks every running thread to stop, the main and the calling one excepted, and waits for at
    /// most @p seconds in all. What bodies throw is left to who joins the threads.
    /// @return the names of those that have not ended.
    std::vector<LiString> stopThreads(double seconds);

    // Real time

    /// Before the packages come up: they are to switch real time on then.
    /// @param required  whether it is an error if the system refuses.
    static void indicateAppIsRealTime(bool required);
    static RealTimeParam getRealTimeParam() noexcept;

    /// Puts all threads, present and future ones, into the real-time class or back. Does nothing
    /// with `ORV_THREAD_NO_REALTIME` other than 0.
    /// @throws MtEx::ExRealTimeNotEnabled if the system refuses and real time is required; if it is
    ///   not, real time stays off.
    void setRealTime(bool isOn);
    bool isRealTime() const noexcept;

    // Processors and groups

    int getNbProcessors() const noexcept;  ///< That the process may use, or as set.
    void setNbProcessors(int number);      ///< Tells every group.

    void add(MtThreadGroup& group);     ///< MtThreadGroup does this.
    void remove(MtThreadGroup& group);  ///< MtThreadGroup does this.

    void dump(std::ostream&) const;  ///< A line for each thread.

private:
    friend class MtThread;
    friend class MtThreadGroup;
    friend class ThreadsPackage;

    MtThreadMgr();
    ~MtThreadMgr() = delete;

    static MtThreadMgr& get();  // without bringing packages up
    MtThreadMgrImp& imp() const noexcept { return *_imp; }

    const std::unique_ptr<MtThreadMgrImp> _imp;
};

}  // namespace Orv
