#pragma once

#include <utility>

#include "devMDPropertyAny.h"

namespace Orv {

/// What an observer is told: which property has changed, and what about it.
class DevMgrPropertyObserverHint {
public:
    DevMgrPropertyObserverHint(RCShdPtr<DevMDPropertyAny> property, unsigned event)
        : _property(std::move(property)), _event(event) {}

    const RCShdPtr<DevMDPropertyAny>& getProperty() const noexcept { return _property; }
    unsigned getEvent() const noexcept { return _event; }  ///< The mask the device gave.

private:
    RCShdPtr<DevMDPropertyAny> _property;
    unsigned _event;
};

}  // namespace Orv
