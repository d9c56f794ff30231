#pragma once

#include "devMDStream.h"
#include "devMgrCallbackPrivate.h"
#include "devMgrStreamAcc.h"
#include "devMgrStreamParser.h"
#include "lkLock.h"

namespace Orv {

/// A connection: two ends, whichever of them is the active one, and who wants to hear of its end.
///
/// - Threads: any, unless it says otherwise.
class DevMgrStreamLink : public DevMgrCallback {
public:
    using Connection = DevMgrStreamAcc::Connection;
    using Ended = DevMgrStreamAcc::Ended;

    const DevMgrStreamParser parsed;
    const LiString configString;
    const RCShdPtr<DevMDStream> source;
    const RCShdPtr<DevMDStream> sink;

    /// @param ended  may be empty.
    DevMgrStreamLink(RCShdPtr<DevMgrFifo> manager, const DevMgrStreamParser& parsed,
                     const LiString& configString, RCShdPtr<DevMDStream> source,
                     RCShdPtr<DevMDStream> sink, Ended ended);

    /// @throws DevMgrEx::BadMDPrtclImp
    void checkKinds() const;

    /// What fails leaves the ends as they were.
    void start() const;

    /// From now on who wants to is told of the end, at once if it has come already. Last of all: who
    /// is told may want to disconnect.
    void listen() noexcept;

    /// Stops the passive end when nothing can reach it any more, a blocked pull first. Afterwards
    /// nobody is told of anything.
    void stop() noexcept;

    Connection getConnection() const;
    bool isSame(const DevMgrStreamParser& other) const;

private:
    class EndAEO;
    class EndANO;

    const RCShdPtr<DevMgrFifo> _manager;
    const Ended _ended;
    LkLock _lock{"DevMgrStreamLink"};
    bool _isStopped ORV_GUARDED_BY(_lock) = false;
    DevMDStream::State _told = DevMDStream::State::RUNNING;  // of the manager's thread

    bool isPush() const { return parsed.getVerb() == DevMgrStreamParser::PUSH; }
    DevMDStream& getActive() const { return isPush() ? *source : *sink; }
    DevMDStream& getPassive() const { return isPush() ? *sink : *source; }
    void tell() noexcept;
};

}  // namespace Orv
