#pragma once

#include <atomic>
#include <exception>
#include <string>
#include <unordered_map>

#include "devMDPropertyAny.h"
#include "devMDPropertySet.h"
#include "devMDPrtcl.h"
#include "devWaitGraph.h"
#include "lkEvent.h"
#include "lkMutex.h"

namespace Orv {

class DevMgrPropertyParser;

/// A device of one manager, from the moment that its name was first asked for.
///
/// - Threads: any.
class DevMgrDevice : public RCBase<LkCounter<long>> {
public:
    explicit DevMgrDevice(const LiString& name) : _name(name) {}

    /// For whoever made this object, once: makes the protocol and opens it.
    void open();

    /// For all others: the protocol, once it is open.
    /// @throws what open() threw there, DevMgrEx::BadMDPrtclImp if the opener waits for the caller.
    const RCShdPtr<DevMDPrtcl>& await();

    void close() noexcept;

    /// @throws DevMgrEx::BadMDPrtclImp, DevMgrEx::NameNotRegistered
    RCShdPtr<DevMDPropertyAny> getProperty(const DevMgrPropertyParser& path);

    DevWaitGraph::Target& getOpener() noexcept { return _opener; }
    bool isOpen() const noexcept { return _isOpen.load(std::memory_order_acquire); }
    int getQueueLength() const;

private:
    const LiString _name;
    RCShdPtr<DevMDPrtcl> _prtcl;  // before _isReady
    std::exception_ptr _failure;  // before _isReady
    std::atomic<bool> _isOpen{false};
    LkEvent _ready{"DevMgrDevice ready", false};
    DevWaitGraph::Target _opener;

    // Properties by the names on their way, each with a blank behind it; made when first needed.
    std::atomic<bool> _isIndexed{false};
    LkMutex _indexMutex{"DevMgrDevice index"};
    std::unordered_map<std::string, RCShdPtr<DevMDPropertyAny>> _index;

    void makeIndex();
    void addToIndex(const std::string& path, DevMDPropertySet::Properties properties,
                    DevMDPropertySet::Sets sets);
};

}  // namespace Orv
