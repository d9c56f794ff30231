#pragma once

#include "devMDStdStreamActiveEnd.h"
#include "devMDStreamSink.h"
#include "devMDStreamSource.h"

namespace Orv {

/// Active source of a standard device, whose own thread calls push(). For a source with a loop and
/// a thread of its own there is DevMDStdStreamLoopSource.
///
/// - Threads: push() by one thread at a time, the source's; everything else by any.
class ORV_RESMGT_API DevMDStdStreamActiveSource : public DevMDStreamActiveSource {
public:
    DevMDStdStreamActiveSource(const LiString& name, const LiString& description);
    ~DevMDStdStreamActiveSource() noexcept(false) override;

    LiString getName() override { return _name; }
    LiString getDescription() override { return _description; }
    bool isAvailable() override { return _isAvailable.load(); }
    void connect(RCShdPtr<DevMDStreamPassiveSink> sink) override { _end.connect(std::move(sink)); }
    void start() override;
    void stop() override;
    void disconnect() override { _end.disconnect(); }
    State getState() override { return _end.getState(); }
    std::exception_ptr getFailure() override { return _end.getFailure(); }
    void setEndAEO(ObjPtr<DevAEO> aeo) override { _end.setEndAEO(std::move(aeo)); }

    /// Delivers an element, waiting while the sink is full. Terminal ones end the stream, as does a
    /// sink that fails.
    /// @return whether the stream goes on; if not, elements are destroyed unseen.
    bool push(ObjPtr<DevMDStreamElem> elem);

protected:
    /// Ends the stream with FAILED, if it still runs, for the reason given.
    void fail(std::exception_ptr failure);

private:
    const LiString _name;
    const LiString _description;
    std::atomic<bool> _isAvailable{true};
    DevMDStdStreamActiveEnd<DevMDStreamPassiveSink> _end;

    bool pushAndJudge(ObjPtr<DevMDStreamElem> elem, std::exception_ptr failure);
};

}  // namespace Orv
