#include <algorithm>
#include <utility>

#include "assertions.h"
#include "devMgrEx.h"
#include "devMgrObserversPrivate.h"
#include "devMgrPropertyObserver.h"
#include "lkLock.h"

namespace Orv {

DevMgrPropertyObserver::~DevMgrPropertyObserver() noexcept(false) = default;

DevMgrPropertyFunctionObserver::DevMgrPropertyFunctionObserver(Function function)
    : _function(std::move(function)) {}

DevMgrPropertyFunctionObserver::~DevMgrPropertyFunctionObserver() noexcept(false) = default;

RCShdPtr<DevMgrPropertyObserver> DevMgrPropertyFunctionObserver::create(Function function) {
    return RCShdPtr<DevMgrPropertyObserver>(
        new DevMgrPropertyFunctionObserver(std::move(function)));
}

void DevMgrPropertyFunctionObserver::performNotify(const DevMgrPropertyObserverHint& hint) {
    _function(hint);
}

namespace {

/// News of a property, on its way to the manager's thread.
class PropertyANO : public DevANO {
public:
    PropertyANO(const RCShdPtr<DevMgrObserverList>& list, unsigned mask)
        : _list(list), _mask(mask) {}
    void performExecute() override { _list->deliver(_mask); }

private:
    const RCShdPtr<DevMgrObserverList> _list;
    const unsigned _mask;
};

/// Sends it there. Holds nothing that holds a property, so that nothing owns itself in a circle
/// when the last observer has gone.
class PropertyAEO : public DevMDPropertyAEO {
public:
    PropertyAEO(const RCShdPtr<DevMgrFifo>& fifo, const RCShdPtr<DevMgrObserverList>& list)
        : _fifo(fifo), _list(list) {}

    void propertyChanged(unsigned mask) override {
        _fifo->produce(DevANOQueueEntry(ObjPtr<DevANO>(new PropertyANO(_list, mask))));
    }

private:
    const RCShdPtr<DevMgrFifo> _fifo;
    const RCShdPtr<DevMgrObserverList> _list;
};

}  // namespace

// --- one property ---

void DevMgrObserverList::Entry::tell(unsigned mask) noexcept {
    call("telling an observer of a property's change",
         [&] { observer->performNotify(DevMgrPropertyObserverHint(property, mask)); });
}

void DevMgrObserverList::add(const RCShdPtr<Entry>& entry) {
    const LkGuard guard(_lock);
    for (const RCShdPtr<Entry>& other : _entries) {
        if (other->owner == entry->owner && other->observer == entry->observer) return;
    }
    _entries.push_back(entry);
}

RCShdPtr<DevMgrObserverList::Entry> DevMgrObserverList::remove(
    const void* owner, const DevMgrPropertyObserver& observer) {
    const LkGuard guard(_lock);
    const auto found = std::find_if(_entries.begin(), _entries.end(), [&](const auto& entry) {
        return entry->owner == owner && entry->observer.get() == &observer;
    });
    if (found == _entries.end()) return nullptr;
    RCShdPtr<Entry> entry = std::move(*found);
    _entries.erase(found);
    return entry;
}

bool DevMgrObserverList::isEmpty() const {
    const LkGuard guard(_lock);
    return _entries.empty();
}

void DevMgrObserverList::deliver(unsigned mask) noexcept {
    try {
        std::vector<RCShdPtr<Entry>> entries;
        {
            const LkGuard guard(_lock);
            entries = _entries;
        }
        for (const RCShdPtr<Entry>& entry : entries) entry->tell(mask);
    } catch (...) {
        Assertions::traceCurrentException("delivering a property's change");
    }
}

// --- all of them ---

void DevMgrObservers::attach(const void* owner, const RCShdPtr<DevMDPropertyAny>& property,
                             const RCShdPtr<DevMgrPropertyObserver>& observer) {
    const LiUuid uuid = property->getUuid();
    const RCShdPtr<DevMgrObserverList::Entry> entry(
        new DevMgrObserverList::Entry(_fifo, owner, property, observer));
    const LkGuard guard(_lock);
    RCShdPtr<DevMgrObserverList>& list = _lists[uuid];
    if (!list.isNull()) {
        list->add(entry);
        return;
    }
    try {
        list = RCShdPtr<DevMgrObserverList>(new DevMgrObserverList);
        list->add(entry);
        property->setObserverAEO(ObjPtr<DevMDPropertyAEO>(new PropertyAEO(_fifo, list)));
    } catch (...) {
        _lists.erase(uuid);
        throw;
    }
}

void DevMgrObservers::detach(const void* owner, DevMDPropertyAny& property,
                             const DevMgrPropertyObserver& observer) {
    RCShdPtr<DevMgrObserverList> list;
    RCShdPtr<DevMgrObserverList::Entry> entry;
    {
        const LkGuard guard(_lock);
        const auto found = _lists.find(property.getUuid());
        if (found != _lists.end()) {
            list = found->second;
            entry = list->remove(owner, observer);
        }
        if (entry.isNull()) {
            throw DevMgrEx::NameNotRegistered(ORV_FILE, __LINE__, property.getName());
        }
        if (list->isEmpty()) {
            _lists.erase(found);
            property.setObserverAEO(nullptr);
        }
    }
    entry->detach();
}

}  // namespace Orv
