#pragma once

#include <exception>
#include <functional>
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
        DevMDStream::State state;    ///< RUNNING, ENDED or FAILED, as far as the ends know.
        std::exception_ptr failure;  ///< What it failed with, if that is known; else null.
    };

    /// Hears that a connection has ENDED, its source having delivered everything, or FAILED; and of
    /// the one after the other, if a sink fails at what came last. Called on the manager's thread;
    /// it may disconnect and connect. What it throws is traced.
    using Ended = std::function<void(const Connection&)>;

    static ObjPtrRet<DevMgrStreamAcc> create(RCShdPtr<DevMgrMediator> mediator);
    virtual ~DevMgrStreamAcc();

    /// Opens the devices if nobody has yet. What fails leaves both ends as they were.
    /// @throws DevMgrEx::ConfigSyntaxError; DevPrtclEx::ExNameNotRegistered for a device,
    ///   DevMgrEx::NameNotRegistered for a stream; DevMgrEx::StreamNotAvailable with the source's
    ///   id if either end is in use; DevMgrEx::StreamsNotCompatible with the string;
    ///   DevMgrEx::BadMDPrtclImp if an end is of the wrong kind.
    virtual void connect(const LiString& configString) = 0;

    /// Returns when nothing flows any more and nobody is being told of it; on the manager's thread
    /// the one who is runs on.
    /// @throws DevMgrEx::ConfigSyntaxError; DevMgrEx::NameNotRegistered if it is not connected.
    virtual void disconnect(const LiString& configString) = 0;

    virtual std::vector<Connection> getConnections() const = 0;  ///< In order of connection.

    /// Makes a stream of the application known as ":" and the name.
    /// @throws DevMgrEx::NameNotUnique
    virtual void registerStream(const LiString& name, RCShdPtr<DevMDStream> stream) = 0;

    /// @throws DevMgrEx::NameNotRegistered; DevMgrEx::StreamNotAvailable if it is connected.
    virtual void deregisterStream(const LiString& name) = 0;

    /// Like connect(configString), with somebody who is told how it ends.
    virtual void connect(const LiString& configString, Ended ended) = 0;
};

}  // namespace Orv
