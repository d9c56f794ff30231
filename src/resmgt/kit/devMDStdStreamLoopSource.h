#pragma once

#include <functional>

#include "devMDStdStreamActiveSource.h"
#include "lkMutex.h"

namespace Orv {

class MtThread;

/// Active source that runs a function on a thread of its own, as long as it is connected:
///
///     [](DevMDStdStreamLoopSource& source) {
///         while (source.push(createNextElement())) {
///         }
///     }
///
/// When the function returns the stream ends, with END; when it throws, with FAILED.
///
/// - Threads: any; see DevMDStdStreamActiveSource.
class ORV_RESMGT_API DevMDStdStreamLoopSource : public DevMDStdStreamActiveSource {
public:
    using Loop = std::function<void(DevMDStdStreamLoopSource&)>;

    DevMDStdStreamLoopSource(const LiString& name, const LiString& description, Loop loop);
    ~DevMDStdStreamLoopSource() noexcept(false) override;  ///< Disconnects.

    void start() override;
    void disconnect() override;  ///< Returns when the function has.

    /// For the function: does the stream go on?
    bool isRunning() { return getState() == State::RUNNING; }

private:
    const Loop _loop;
    LkMutex _mutex{"DevMDStdStreamLoopSource"};
    DevWaitGraph::Target _target;  // its thread
    ObjPtr<MtThread> _thread ORV_GUARDED_BY(_mutex);

    void run();
};

}  // namespace Orv
