#pragma once

#include <memory>
#include <orv/seSourceClock.h>
#include <orv/seSyncEngine.h>

#include "mediaDevice.h"
#include "settings.h"

namespace MediaHost {

/// Beats time for all devices of the host, by the sync engine; leads the sequence. With a host that
/// is not paced it only gives the start. Setting: rate, in beats per second.
class ClockDevice : public MediaDevice {
public:
    ClockDevice(const Orv::LiString& name, HostContext& context, Settings settings);
    ~ClockDevice() noexcept(false) override;

protected:
    void syncTo(const Orv::DtTime& time, Orv::DevMDSyncSeqRequest& request) override;
    void stop(Orv::DevMDSyncSeqRequest& request) override;
    void abort(Orv::DevMDSyncSeqRequest& request) override;
    void close() override;

private:
    class Client;

    double _beatsPerSecond;                       // of the setting, or 0
    std::unique_ptr<Orv::SeSourceClock> _source;  // null: does not beat
    Orv::SeSyncEngine _engine;
    Orv::RCShdPtr<Orv::DevMDStdProperty<std::uint64_t>> _beatProperty;

    void beginBeating();
    void endBeating();
};

}  // namespace MediaHost
