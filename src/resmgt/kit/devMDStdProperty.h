#pragma once

#include <atomic>

#include "devAEOSlot.h"
#include "devMDProperty.h"
#include "devMDStdFifo.h"
#include "devMDStdPropertyANOFactory.h"
#include "devMDStdPropertyGetACO.h"

namespace Orv {

/// Property of a standard device: holds no value; every get and set becomes a request in the
/// device's queue and is carried out by the device's own thread.
///
/// - Threads: as DevMDProperty; notify() by any thread, usually the device's.
/// - Errors: RCEx::ExNullPtr without a queue.
template <DevMDValue T>
class ORV_HEADER_API DevMDStdProperty : public DevMDProperty<T> {
public:
    DevMDStdProperty(const LiString& name, const LiString& description, unsigned attributes,
                     ObjPtr<DevMDStdPropertyANOFactory<T>> factory, RCShdPtr<DevMDStdFifo> fifo,
                     RCShdPtr<DevMDPropertyDescriptor<T>> descriptor = nullptr)
        : _uuid(LiUuid::CREATE),
          _name(name),
          _description(description),
          _attributes(attributes),
          _factory(std::move(factory)),
          _fifo(std::move(fifo)),
          _descriptor(std::move(descriptor)) {}

    LiUuid getUuid() override { return _uuid; }
    LiString getName() override { return _name; }
    LiString getDescription() override { return _description; }
    unsigned getAttributes() const override { return _attributes.load(std::memory_order_relaxed); }
    bool isAvailable() const override { return true; }
    void setObserverAEO(ObjPtr<DevMDPropertyAEO> aeo) override { _observer.set(std::move(aeo)); }
    RCShdPtr<DevMDPropertyDescriptorAny> getDescriptor() const override { return _descriptor; }

    /// Tells the observer, if there is one, what has changed; for the device.
    void notify(unsigned mask) {
        _observer.tell([mask](DevMDPropertyAEO& aeo) { aeo.propertyChanged(mask); });
    }

protected:
    void performSet(const T& value) override;
    void performGet(T& value) override;
    void performTimedGet(T& value, double seconds) override;
    void performSetAndWait(const T& value, const LkTimeLimit& limit) override;
    virtual void setAttributes(unsigned attributes) { _attributes = attributes; }

private:
    /// The value of a get that may give up, apart from the caller's variable.
    struct Answer : DevMDStdGetAnswer {
        T value;
        explicit Answer(const T& initial) : value(initial) {}
    };

    const LiUuid _uuid;
    const LiString _name;
    const LiString _description;
    std::atomic<unsigned> _attributes;
    DevAEOSlot<DevMDPropertyAEO> _observer;
    const ObjPtr<DevMDStdPropertyANOFactory<T>> _factory;
    const RCShdPtr<DevMDStdFifo> _fifo;
    const RCShdPtr<DevMDPropertyDescriptor<T>> _descriptor;

    void getWithin(T& value, const LkTimeLimit& limit);
    [[noreturn]] void throwGet() const;
};

}  // namespace Orv

#include "devMDStd.imp"
