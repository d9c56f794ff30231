#include "devMgrStreamAcc.h"

#include <algorithm>
#include <utility>

#include "assertions.h"
#include "devMDStreamPrtcl.h"
#include "devMgrEx.h"
#include "devMgrStreamLinkPrivate.h"
#include "devMgrStreamParser.h"
#include "rcExUtil.h"

namespace Orv {

namespace {

using Link = RCShdPtr<DevMgrStreamLink>;

class StreamAccImp : public DevMgrStreamAcc {
public:
    explicit StreamAccImp(RCShdPtr<DevMgrMediator> mediator) : _mediator(std::move(mediator)) {
        if (_mediator.isNull()) RCExUtil::throwExNullPtr();
    }

    ~StreamAccImp() override {
        std::vector<Link> links;
        {
            const LkGuard guard(_mediator->getConfigLock());
            links.swap(_links);
        }
        for (const Link& link : links) link->stop();
    }

    void connect(const LiString& configString) override { connect(configString, nullptr); }
    void connect(const LiString& configString, Ended ended) override;
    void disconnect(const LiString& configString) override;
    std::vector<Connection> getConnections() const override;
    void registerStream(const LiString& name, RCShdPtr<DevMDStream> stream) override;
    void deregisterStream(const LiString& name) override;

private:
    const RCShdPtr<DevMgrMediator> _mediator;
    // Both under the configuration lock.
    DevNameMap<RCShdPtr<DevMDStream>> _ends;
    std::vector<Link> _links;

    Link makeLink(const LiString& configString, Ended ended);
    RCShdPtr<DevMDStream> getEnd(const LiString& device, const LiString& stream);
    RCShdPtr<DevMDStream> findInDevice(const LiString& device, const LiString& stream);
    void reserveEnds(const DevMgrStreamLink& link);
    bool isRegisteredNoGuard(const StreamId& id) const { return _ends.find(id.getId()) != nullptr; }
};

void StreamAccImp::connect(const LiString& configString, Ended ended) {
    makeLink(configString, std::move(ended))->listen();
}

Link StreamAccImp::makeLink(const LiString& configString, Ended ended) {
    const DevMgrStreamParser parsed(configString);
    const StreamId sourceStreamId(parsed.getSourceDevice(), parsed.getSourceStream());
    const StreamId sinkStreamId(parsed.getSinkDevice(), parsed.getSinkStream());
    const RCShdPtr<DevMDStream> source = getEnd(parsed.getSourceDevice(), parsed.getSourceStream());
    const RCShdPtr<DevMDStream> sink = getEnd(parsed.getSinkDevice(), parsed.getSinkStream());
    Link link(new DevMgrStreamLink(_mediator->getFifo(), parsed, configString, source, sink,
                                   std::move(ended)));
    {
        const LkGuard guard(_mediator->getConfigLock());
        ORV_ASSERT_TEXT(isRegisteredNoGuard(sourceStreamId),
                        "isRegisteredNoGuard( sourceStreamId )");
        ORV_ASSERT_TEXT(isRegisteredNoGuard(sinkStreamId), "isRegisteredNoGuard( sinkStreamId )");
        _links.reserve(_links.size() + 1);
        reserveEnds(*link);
    }
    // The ends are started with the lock free: what devices do then may need it.
    struct Reservation {
        DevMgrMediator& mediator;
        const DevMgrStreamLink& link;
        ~Reservation() {
            const LkGuard guard(mediator.getConfigLock());
            mediator.release(*link.source);
            mediator.release(*link.sink);
        }
    } const reservation{*_mediator, *link};
    link->checkKinds();
    if (!sink->isCompatible(source->getDescription())) {
        throw DevMgrEx::StreamsNotCompatible(ORV_FILE, __LINE__, configString.getChars());
    }
    link->start();
    try {
        const LkGuard guard(_mediator->getConfigLock());
        _links.push_back(link);
    } catch (...) {
        link->stop();
        throw;
    }
    return link;
}

/// The end of that name; what lies in a device is registered when it is first named.
RCShdPtr<DevMDStream> StreamAccImp::getEnd(const LiString& device, const LiString& stream) {
    const StreamId id(device, stream);
    {
        const LkGuard guard(_mediator->getConfigLock());
        if (const RCShdPtr<DevMDStream>* const found = _ends.find(id.getId())) return *found;
    }
    if (device.isEmpty()) throw DevMgrEx::NameNotRegistered(ORV_FILE, __LINE__, id.getId());
    const RCShdPtr<DevMDStream> end = findInDevice(device, stream);
    const LkGuard guard(_mediator->getConfigLock());
    _ends.insert(id.getId(), end);
    return end;
}

RCShdPtr<DevMDStream> StreamAccImp::findInDevice(const LiString& device, const LiString& stream) {
    const RCShdPtr<DevMDPrtcl> prtcl = _mediator->getPrtcl(device);
    auto* const streams = dynamic_cast<DevMDStreamPrtcl*>(prtcl.get());
    if (streams == nullptr) throw DevMgrEx::BadMDPrtclImp(ORV_FILE, __LINE__, device);
    for (auto iter = streams->performGetStreams(); !iter.atEnd(); iter.next()) {
        if (iter.item()->getName() == stream) return iter.item();
    }
    throw DevMgrEx::NameNotRegistered(ORV_FILE, __LINE__, StreamId(device, stream).getId());
}

void StreamAccImp::reserveEnds(const DevMgrStreamLink& link) {
    const StreamId id(link.parsed.getSourceDevice(), link.parsed.getSourceStream());
    const auto refuse = [&] {
        throw DevMgrEx::StreamNotAvailable(ORV_FILE, __LINE__, id.getId().getChars());
    };
    if (!link.source->isAvailable() || !_mediator->reserve(*link.source)) refuse();
    if (link.sink->isAvailable() && _mediator->reserve(*link.sink)) return;
    _mediator->release(*link.source);
    refuse();
}

void StreamAccImp::disconnect(const LiString& configString) {
    const DevMgrStreamParser parsed(configString);
    Link found;
    {
        const LkGuard guard(_mediator->getConfigLock());
        const auto link = std::find_if(_links.begin(), _links.end(),
                                       [&](const Link& item) { return item->isSame(parsed); });
        if (link == _links.end()) {
            throw DevMgrEx::NameNotRegistered(ORV_FILE, __LINE__, configString);
        }
        found = *link;
        _links.erase(link);
    }
    found->stop();
}

std::vector<DevMgrStreamAcc::Connection> StreamAccImp::getConnections() const {
    std::vector<Connection> result;
    const LkGuard guard(_mediator->getConfigLock());
    result.reserve(_links.size());
    for (const Link& link : _links) result.push_back(link->getConnection());
    return result;
}

void StreamAccImp::registerStream(const LiString& name, RCShdPtr<DevMDStream> stream) {
    if (stream.isNull()) RCExUtil::throwExNullPtr();
    const LkGuard guard(_mediator->getConfigLock());
    if (!_ends.insert(StreamId(LiString(), name).getId(), std::move(stream))) {
        throw DevMgrEx::NameNotUnique(ORV_FILE, __LINE__, StreamId(LiString(), name).getId());
    }
}

void StreamAccImp::deregisterStream(const LiString& name) {
    const StreamId id(LiString(), name);
    RCShdPtr<DevMDStream> stream;
    const LkGuard guard(_mediator->getConfigLock());
    if (const RCShdPtr<DevMDStream>* const found = _ends.find(id.getId())) stream = *found;
    if (stream.isNull()) throw DevMgrEx::NameNotRegistered(ORV_FILE, __LINE__, id.getId());
    const bool isConnected = std::any_of(_links.begin(), _links.end(), [&](const Link& link) {
        return link->source == stream || link->sink == stream;
    });
    if (isConnected) {
        throw DevMgrEx::StreamNotAvailable(ORV_FILE, __LINE__, id.getId().getChars());
    }
    _ends.erase(id.getId());
}

}  // namespace

DevMgrStreamAcc::~DevMgrStreamAcc() = default;

ObjPtrRet<DevMgrStreamAcc> DevMgrStreamAcc::create(RCShdPtr<DevMgrMediator> mediator) {
    return ObjPtrRet<DevMgrStreamAcc>(new StreamAccImp(std::move(mediator)));
}

}  // namespace Orv
