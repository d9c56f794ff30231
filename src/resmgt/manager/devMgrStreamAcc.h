#pragma once

#include <vector>

#include "devMDStream.h"
#include "devMgrMediator.h"
#include "objPtr.h"

namespace Orv {

/// Connects streams of a manager's devices by stream strings: "camera:video push display:input"
/// lets the camera push into the display, with "pull" the display fetches. Made by
/// DevMgr::createStreamAcc().
///
/// - Threads: any.
/// - Ownership: keeps the manager's devices open. Destroying it disconnects what it connected.
class ORV_RESMGT_API DevMgrStreamAcc {
public:
    /// Identity of one end: "camera:video".
    class StreamId {
    public:
        StreamId() = default;
        explicit StreamId(const LiString& id) : _id(id) {}
        StreamId(const LiString& device, const LiString& stream) : _id(device + ':' + stream) {}

        const LiString& getId() const noexcept { return _id; }

    private:
        LiString _id;
    };

    struct Connection {
        LiString configString;
        DevMDStream::State state;  ///< RUNNING, ENDED or FAILED, as the active end knows.
    };

    static ObjPtrRet<DevMgrStreamAcc> create(RCShdPtr<DevMgrMediator> mediator);
    virtual ~DevMgrStreamAcc();

    /// Opens the devices if nobody has yet. What fails leaves both ends as they were.
    /// @throws DevMgrEx::ConfigSyntaxError; DevPrtclEx::ExNameNotRegistered for a device,
    ///   DevMgrEx::NameNotRegistered for a stream; DevMgrEx::StreamNotAvailable with the source's
    ///   id if either end is in use; DevMgrEx::StreamsNotCompatible with the string;
    ///   DevMgrEx::BadMDPrtclImp if an end is of the wrong kind.
    virtual void connect(const LiString& configString) = 0;

    /// Returns when nothing flows any more.
    /// @throws DevMgrEx::ConfigSyntaxError; DevMgrEx::NameNotRegistered if it is not connected.
    virtual void disconnect(const LiString& configString) = 0;

    virtual std::vector<Connection> getConnections() const = 0;  ///< In order of connection.

    /// Makes a stream of the application known as ":" and the name.
    /// @throws DevMgrEx::NameNotUnique
    virtual void registerStream(const LiString& name, RCShdPtr<DevMDStream> stream) = 0;

    /// @throws DevMgrEx::NameNotRegistered; DevMgrEx::StreamNotAvailable if it is connected.
    virtual void deregisterStream(const LiString& name) = 0;
};

}  // namespace Orv
