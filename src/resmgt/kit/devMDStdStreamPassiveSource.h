#pragma once

#include <deque>

#include "devMDStdFifo.h"
#include "devMDStreamSource.h"
#include "lkCondVar.h"
#include "lkMutex.h"

namespace Orv {

/// Passive source of a standard device, which puts elements into it when it has some. They wait
/// here to be pulled; when too many do, further ones are lost, and a GAP tells so.
///
/// - Threads: any; put() never waits.
class ORV_RESMGT_API DevMDStdStreamPassiveSource : public DevMDStreamPassiveSource,
                                                   private DevWaitGraph::Breaker {
public:
    static constexpr int STANDARD_CAPACITY = 25;

    /// @param fifo  of the device whose thread calls put(), or null. With it, a pull() by a thread
    ///   that this device in turn waits for throws DevPrtclEx::ExMDStdFifoClosed, where it would
    ///   wait for ever.
    DevMDStdStreamPassiveSource(const LiString& name, const LiString& description,
                                int capacity = STANDARD_CAPACITY,
                                RCShdPtr<DevMDStdFifo> fifo = nullptr);
    ~DevMDStdStreamPassiveSource() noexcept(false) override;

    LiString getName() override { return _name; }
    LiString getDescription() override { return _description; }
    bool isAvailable() override { return _isAvailable.load(); }
    State getState() override;
    void start() override;
    void stop() override;
    bool isReady() override;
    ObjPtrRet<DevMDStreamElem> pull() override;

    /// Hands an element in. Terminal ones end the stream and are never lost.
    /// @return whether the stream goes on; if not, the element was destroyed unseen.
    bool put(ObjPtr<DevMDStreamElem> elem);

private:
    const LiString _name;
    const LiString _description;
    const std::size_t _capacity;
    const RCShdPtr<DevMDStdFifo> _fifo;
    std::atomic<bool> _isAvailable{true};

    LkMutex _mutex{"DevMDStdStreamPassiveSource"};
    LkCondVar _changed{"DevMDStdStreamPassiveSource changed"};
    std::deque<ObjPtr<DevMDStreamElem>> _elems ORV_GUARDED_BY(_mutex);
    bool _isStarted ORV_GUARDED_BY(_mutex) = false;
    bool _hasLost ORV_GUARDED_BY(_mutex) = false;
    DevMDStreamElem::Ev _end ORV_GUARDED_BY(_mutex) = DevMDStreamElem::DATA;  // how it ended

    ObjPtrRet<DevMDStreamElem> take() ORV_REQUIRES(_mutex);
    void letGo() override;
};

}  // namespace Orv
