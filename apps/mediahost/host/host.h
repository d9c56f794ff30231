#pragma once

#include <memory>
#include <orv/devMgr.h>
#include <orv/devMgrPropertyAcc.h>
#include <orv/devMgrStreamAcc.h>
#include <orv/devMgrSyncSeqAcc.h>
#include <string>
#include <vector>

#include "hostContext.h"
#include "mediaDevice.h"
#include "mediaError.h"
#include "pipeline.h"

namespace MediaHost {

struct DeviceKind {
    const char* name;
    const char* description;
};
const std::vector<DeviceKind>& listKinds();

/// A device is stuck in a call that does not return; the host that it belongs to cannot go.
class DevicesHang : public MediaError {
public:
    using MediaError::MediaError;
};

/// Builds what a pipeline describes, on a device manager, and plays it.
///
/// - Threads: one.
/// - Errors: what the library and the devices throw, nested in a MediaError that says what was
///   asked for.
class Host {
public:
    explicit Host(Pipeline pipeline);
    ~Host();  ///< Gives up what still plays; files that are not whole go.

    Host(const Host&) = delete;
    Host& operator=(const Host&) = delete;

    void open();     ///< Makes the devices, sets what is to be set.
    void connect();  ///< Connects them, and arranges their sequence.

    /// Plays to the end, or until an interrupt; the files are finished either way.
    /// @return false if it was interrupted.
    /// @throws DevicesHang if it does not stop in time: then leave the host where it is.
    bool play();

    const Pipeline& getPipeline() const { return _pipeline; }
    const HostContext& getContext() const { return _context; }
    const std::vector<std::string>& getConnections() const { return _connections; }
    const std::string& getTree() const { return _tree; }
    bool isInSequence(const std::string& device) const;
    double getPlayedSeconds() const { return _playedSeconds; }  ///< From the start to the last end.

    Orv::RCShdPtr<Orv::DevMDPrtcl> getDevice(const std::string& name);
    Orv::DevMgr& getManager() { return *_manager; }
    Orv::DevMgrPropertyAcc& getProperties() { return *_properties; }
    Orv::DevMgrSyncSeqAcc& getSequence() { return *_sequence; }

    std::string getProperty(const std::string& property);  ///< As text.
    void setProperty(const std::string& property, const std::string& value);
    void watch(const std::string& property);  ///< Prints it whenever it changes.

private:
    class Watch;

    Pipeline _pipeline;
    HostContext _context;
    std::vector<std::string> _registered;
    Orv::ObjPtr<Orv::DevMgr> _manager;
    Orv::ObjPtr<Orv::DevMgrPropertyAcc> _properties;
    Orv::ObjPtr<Orv::DevMgrPropertyAcc> _watches;  // goes first: observers use the other
    Orv::ObjPtr<Orv::DevMgrStreamAcc> _streams;
    Orv::ObjPtr<Orv::DevMgrSyncSeqAcc> _sequence;
    std::vector<std::shared_ptr<Watch>> _watched;
    std::vector<std::string> _connections;
    std::string _tree;
    double _playedSeconds = 0;

    void applyOptions();
    void registerDevices();
    void createFolder();
    void noteRate();
    void connectStandard();
    std::string makeTree() const;
    bool waitFor(const char* state, double seconds);
    bool waitInStep();
    bool waitForEnd();
    void stop();
};

}  // namespace MediaHost
