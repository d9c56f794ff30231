#pragma once

#include "devANO.h"
#include "objPtr.h"
#include "rcShdPtr.h"
#include "resmgtApi.h"

namespace Orv {

/// A request of a sequence that its device has not done yet: say done() when it has. Dropped
/// without that, it tells that the device has failed to.
///
/// - Threads: one at a time, any.
class ORV_RESMGT_API DevMDSyncSeqDone {
public:
    DevMDSyncSeqDone() noexcept = default;  ///< Of no request.
    explicit DevMDSyncSeqDone(ObjPtr<DevACO> aco) noexcept : _aco(std::move(aco)) {}
    DevMDSyncSeqDone(DevMDSyncSeqDone&&) noexcept = default;
    DevMDSyncSeqDone& operator=(DevMDSyncSeqDone&&) = default;

    void done();  ///< Once; later calls do nothing.
    bool isDue() const noexcept { return !_aco.isNull(); }

private:
    ObjPtr<DevACO> _aco;
};

/// A request of a sequence that a device's function is carrying out: done when the function
/// returns, failed when it throws, unless the function takes the matter into its own hands.
class ORV_RESMGT_API DevMDSyncSeqRequest {
public:
    /// @param request  borrowed, for as long as the function runs.
    explicit DevMDSyncSeqRequest(DevANO& request) : _request(request) {}
    DevMDSyncSeqRequest(const DevMDSyncSeqRequest&) = delete;
    DevMDSyncSeqRequest& operator=(const DevMDSyncSeqRequest&) = delete;

    /// For what takes its time: the device goes on to other requests, such as to abort, meanwhile.
    [[nodiscard]] DevMDSyncSeqDone postpone();

private:
    DevANO& _request;
};

/// What a device has to say between requests. Copies are the same signals; when the last one is
/// dropped before ready(), the sequence knows that the device never will be.
///
/// - Threads: any, several at once.
class ORV_RESMGT_API DevMDSyncSeqSignals {
public:
    DevMDSyncSeqSignals() noexcept;  ///< Of no sequence: says nothing.
    DevMDSyncSeqSignals(ObjPtr<DevANO> ready, ObjPtr<DevANO> lockLost);
    DevMDSyncSeqSignals(const DevMDSyncSeqSignals&) noexcept;
    DevMDSyncSeqSignals(DevMDSyncSeqSignals&&) noexcept;
    DevMDSyncSeqSignals& operator=(const DevMDSyncSeqSignals&);
    DevMDSyncSeqSignals& operator=(DevMDSyncSeqSignals&&);
    ~DevMDSyncSeqSignals();

    void ready() const;     ///< After start; taken once.
    void lockLost() const;  ///< Fallen out of step; the device will be told to recover.

private:
    struct Signals : RCBase<LkCounter<long>> {
        ObjPtr<DevANO> ready;
        ObjPtr<DevANO> lockLost;
    };
    RCShdPtr<Signals> _signals;  // null: of no sequence
};

}  // namespace Orv
