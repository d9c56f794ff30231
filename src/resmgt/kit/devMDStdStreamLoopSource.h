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
/// When the function returns the stream ends, with END; when it throws, with FAILED. What has to be
/// there before anything flows, such as an open file, is the business of a second function: start()
/// returns when that has, and throws what it throws.
///
/// - Threads: any; see DevMDStdStreamActiveSource.
class ORV_RESMGT_API DevMDStdStreamLoopSource : public DevMDStdStreamActiveSource {
public:
    using Loop = std::function<void(DevMDStdStreamLoopSource&)>;

    /// @param prepare  called on the loop's thread, before the loop; may be empty.
    /// @param stackSize  of the thread, in bytes that it has for certain; 0 for the standard.
    DevMDStdStreamLoopSource(const LiString& name, const LiString& description, Loop loop,
                             Loop prepare = nullptr, unsigned stackSize = 0);
    ~DevMDStdStreamLoopSource() noexcept(false) override;  ///< Disconnects.

    void start() override;
    void disconnect() override;  ///< Returns when the function has.

    /// For the function: does the stream go on?
    bool isRunning() { return getState() == State::RUNNING; }

private:
    class Preparation;

    const Loop _loop;
    const Loop _prepare;
    const unsigned _stackSize;
    LkMutex _mutex{"DevMDStdStreamLoopSource"};
    DevWaitGraph::Target _target;  // its thread
    ObjPtr<MtThread> _thread ORV_GUARDED_BY(_mutex);

    void run(Preparation* preparation);
    bool prepare(Preparation& preparation);
    void endThread();
};

}  // namespace Orv
