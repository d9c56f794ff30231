#pragma once

#include "devMDStdStreamActiveEnd.h"
#include "devMDStreamSink.h"
#include "devMDStreamSource.h"

namespace Orv {

/// Active sink of a standard device, whose own thread calls pull().
///
/// - Threads: pull() by one thread at a time, the sink's; everything else by any.
class ORV_RESMGT_API DevMDStdStreamActiveSink : public DevMDStreamActiveSink {
public:
    DevMDStdStreamActiveSink(const LiString& name, const LiString& description);
    ~DevMDStdStreamActiveSink() noexcept(false) override;

    LiString getName() override { return _name; }
    LiString getDescription() override { return _description; }
    bool isAvailable() override { return _isAvailable.load(); }
    void connect(RCShdPtr<DevMDStreamPassiveSource> source) override {
        _end.connect(std::move(source));
    }
    void start() override;
    void stop() override;
    void disconnect() override { _end.disconnect(); }
    State getState() override { return _end.getState(); }
    std::exception_ptr getFailure() override { return _end.getFailure(); }
    void setEndAEO(ObjPtr<DevAEO> aeo) override { _end.setEndAEO(std::move(aeo)); }

    /// The next element, waiting for it. After a terminal one there is only STOPPED; a source that
    /// fails gives FAILED.
    ObjPtrRet<DevMDStreamElem> pull();

private:
    const LiString _name;
    const LiString _description;
    std::atomic<bool> _isAvailable{true};
    DevMDStdStreamActiveEnd<DevMDStreamPassiveSource> _end;
};

}  // namespace Orv
