#pragma once

#include <cstddef>
#include <iosfwd>
#include <memory>

#include "liString.h"
#include "mtGroupCommand.h"
#include "resmgtApi.h"

namespace Orv {

class MtThread;
class MtThreadList;

/// A named set of threads, to do something with all of them, or to learn that the number of
/// processors has changed. Threads are made in it by MtThreadFactory.
///
/// - Threads: every member may be called by any thread.
/// - Ownership: borrows its threads, which must be gone before it; else its destructor asserts
///   "_threads.size() == 0".
class ORV_RESMGT_API MtThreadGroup {
public:
    explicit MtThreadGroup(const LiString& name);
    virtual ~MtThreadGroup() noexcept(false);

    MtThreadGroup(const MtThreadGroup&) = delete;
    MtThreadGroup& operator=(const MtThreadGroup&) = delete;

    const LiString& getName() const noexcept { return _name; }
    std::size_t getNbThreads() const;

    /// Runs the command with each thread, on the calling thread and without a lock, in order of
    /// creation. What it throws ends the round. A thread that is destroyed meanwhile waits until
    /// the command is done with it.
    void execute(const MtGroupCommand& command);

    /// The process may use another number of processors now. Called under the manager's lock.
    virtual void performNbProcessorsChanged(int) {}

    void dump(std::ostream&) const;  ///< A line for each thread.

private:
    friend class MtThread;

    const LiString _name;
    const std::unique_ptr<MtThreadList> _threads;

    void add(MtThread& thread);
    void remove(MtThread& thread);
};

}  // namespace Orv
