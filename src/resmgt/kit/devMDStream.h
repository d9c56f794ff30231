#pragma once

#include <exception>

#include "devMDStreamElem.h"
#include "liString.h"
#include "objPtr.h"

namespace Orv {

/// One end of a stream of a device. An end is a source or a sink, active (it acts on its own
/// thread) or passive (the other end drives it); a connection has one active end.
///
/// - Threads: any, unless an operation says otherwise.
/// - Its description says what flows: "type/subtype;key=value;...".
class ORV_RESMGT_API DevMDStream : public RCBase<LkCounter<long>> {
public:
    enum class State { FREE, RUNNING, ENDED, FAILED };

    ~DevMDStream() noexcept(false) override;

    virtual LiString getName() = 0;
    virtual LiString getDescription() = 0;

    /// Can this end work with a partner of that description? Sinks are asked. By default they take
    /// what areCompatible() says of their own description.
    virtual bool isCompatible(const LiString& description);

    virtual bool isAvailable() = 0;  ///< Not in use.
    virtual void start() = 0;        ///< From now on in use.
    virtual void stop() = 0;         ///< Free again. An active end is asked, and not waited for.

    /// How the connection fares, as far as this end knows.
    virtual State getState() { return isAvailable() ? State::FREE : State::RUNNING; }
    virtual std::exception_ptr getFailure();  ///< Why it FAILED; null if that is not known.

    /// Replaces the one event object that is executed when the state has become ENDED or FAILED, on
    /// the thread that made it so; null for none. An end that does not keep it tells nobody.
    virtual void setEndAEO(ObjPtr<DevAEO> aeo);

    /// Whether a sink that describes itself as @p sink takes what a source describes: an empty sink
    /// takes everything; else type and subtype are equal or "*" in the sink's, and keys that both
    /// name have equal values. A text without a slash matches only the equal text.
    static bool areCompatible(const LiString& sink, const LiString& source);
};

}  // namespace Orv
