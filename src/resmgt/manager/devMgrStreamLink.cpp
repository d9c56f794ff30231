#include <utility>

#include "devMDStreamSink.h"
#include "devMDStreamSource.h"
#include "devMgrEx.h"
#include "devMgrStreamLinkPrivate.h"

namespace Orv {

namespace {

using State = DevMDStream::State;

/// Calls every action, whatever some of them throw.
template <class... Actions>
void performAll(Actions... actions) noexcept {
    const auto perform = [](auto action) {
        try {
            action();
        } catch (...) {
            Assertions::traceCurrentException("connecting or disconnecting a stream");
        }
    };
    (perform(actions), ...);
}

template <class Active, class Passive>
void startEnds(Active& active, const RCShdPtr<Passive>& passive) {
    active.connect(passive);
    try {
        passive->start();
        try {
            active.start();
        } catch (...) {
            performAll([&] { passive->stop(); });
            throw;
        }
    } catch (...) {
        performAll([&] { active.disconnect(); });
        throw;
    }
}

/// The end as a @p T, which its kind must be.
template <class T>
RCShdPtr<T> as(const RCShdPtr<DevMDStream>& end) {
    RCShdPtr<T> result = RCShdPtr<T>::dynamicCast(end);
    if (result.isNull()) throw DevMgrEx::BadMDPrtclImp(ORV_FILE, __LINE__, end->getName());
    return result;
}

}  // namespace

/// News of an end on its way to the manager's thread, which looks how things stand by then.
class DevMgrStreamLink::EndANO : public DevANO {
public:
    explicit EndANO(const RCShdPtr<DevMgrStreamLink>& link) : _link(link) {}
    void performExecute() override { _link->tell(); }

private:
    const RCShdPtr<DevMgrStreamLink> _link;
};

/// Sends it there; held by each end until the link is stopped.
class DevMgrStreamLink::EndAEO : public DevAEO {
public:
    explicit EndAEO(const RCShdPtr<DevMgrStreamLink>& link) : _link(link) {}
    void performExecute() override {
        _link->_manager->produce(DevANOQueueEntry(ObjPtr<DevANO>(new EndANO(_link))));
    }

private:
    const RCShdPtr<DevMgrStreamLink> _link;
};

DevMgrStreamLink::DevMgrStreamLink(RCShdPtr<DevMgrFifo> manager, const DevMgrStreamParser& parts,
                                   const LiString& text, RCShdPtr<DevMDStream> from,
                                   RCShdPtr<DevMDStream> to, Ended ended)
    : DevMgrCallback(manager),
      parsed(parts),
      configString(text),
      source(std::move(from)),
      sink(std::move(to)),
      _manager(std::move(manager)),
      _ended(std::move(ended)) {}

void DevMgrStreamLink::checkKinds() const {
    as<DevMDStreamSource>(source);
    as<DevMDStreamSink>(sink);
}

void DevMgrStreamLink::start() const {
    if (isPush()) {
        startEnds(*as<DevMDStreamActiveSource>(source), as<DevMDStreamPassiveSink>(sink));
    } else {
        startEnds(*as<DevMDStreamActiveSink>(sink), as<DevMDStreamPassiveSource>(source));
    }
}

void DevMgrStreamLink::listen() noexcept {
    if (!_ended) return;
    const RCShdPtr<DevMgrStreamLink> self(this);
    performAll([&] {
        {
            const LkGuard guard(_lock);
            if (_isStopped) return;
            source->setEndAEO(ObjPtr<DevAEO>(new EndAEO(self)));
            sink->setEndAEO(ObjPtr<DevAEO>(new EndAEO(self)));
        }
        if (getConnection().state != State::RUNNING) EndAEO(self).performExecute();
    });
}

void DevMgrStreamLink::stop() noexcept {
    DevMDStream& active = getActive();
    DevMDStream& passive = getPassive();
    const auto stopPassive = [&] { passive.stop(); };
    const auto stopActive = [&] { active.stop(); };
    if (isPush()) {
        auto& end = dynamic_cast<DevMDStreamActiveSource&>(active);
        performAll(stopActive, [&] { end.disconnect(); }, stopPassive);
    } else {
        auto& end = dynamic_cast<DevMDStreamActiveSink&>(active);
        performAll(stopActive, stopPassive, [&] { end.disconnect(); });
    }
    if (!_ended) return;
    {
        const LkGuard guard(_lock);
        _isStopped = true;
    }
    performAll([&] { source->setEndAEO(nullptr); }, [&] { sink->setEndAEO(nullptr); },
               [&] { detach(); });
}

DevMgrStreamAcc::Connection DevMgrStreamLink::getConnection() const {
    const State active = getActive().getState();
    const bool hasPassiveFailed = getPassive().getState() == State::FAILED;
    std::exception_ptr failure;
    if (hasPassiveFailed) failure = getPassive().getFailure();
    if (!failure && active == State::FAILED) failure = getActive().getFailure();
    const bool hasFailed = hasPassiveFailed && active != State::FREE;
    return {configString, hasFailed ? State::FAILED : active, failure};
}

bool DevMgrStreamLink::isSame(const DevMgrStreamParser& other) const {
    return parsed.getVerb() == other.getVerb() &&
           parsed.getSourceDevice() == other.getSourceDevice() &&
           parsed.getSourceStream() == other.getSourceStream() &&
           parsed.getSinkDevice() == other.getSinkDevice() &&
           parsed.getSinkStream() == other.getSinkStream();
}

void DevMgrStreamLink::tell() noexcept {
    call("telling of the end of a connection", [this] {
        const Connection connection = getConnection();
        if (connection.state == _told) return;
        if (connection.state != State::ENDED && connection.state != State::FAILED) return;
        _told = connection.state;
        _ended(connection);
    });
}

}  // namespace Orv
