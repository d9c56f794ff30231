#pragma once

#include "assertions.h"
#include "devMDProperty.h"
#include "devMgrEx.h"
#include "devMgrPropertyAcc.h"

namespace Orv {

/// Reads and writes properties of the type @p T by property strings; no value is ever converted.
///
/// - Threads: any.
/// - Errors: what DevMgrPropertyAcc::getProperty() and the operations of DevMDProperty throw;
///   DevMgrEx::PropertyInvalidType if the property is of another type.
template <DevMDValue T>
class ORV_HEADER_API DevMgrPropertyValueUtil {
public:
    DevMgrPropertyValueUtil() = delete;

    static void getValue(DevMgrPropertyAcc& acc, const LiString& propertyString, T& value) {
        resolve(acc, propertyString)->get(value);
    }

    /// Gives up after @p seconds, not counting the opening of a device.
    static void getValue(DevMgrPropertyAcc& acc, const LiString& propertyString, T& value,
                         double seconds) {
        resolve(acc, propertyString)->get(value, seconds);
    }

    static void setValue(DevMgrPropertyAcc& acc, const LiString& propertyString, const T& value) {
        resolve(acc, propertyString)->set(value);
    }

    /// Returns when the device has taken the value, or throws what the device throws.
    static void setValueAndWait(DevMgrPropertyAcc& acc, const LiString& propertyString,
                                const T& value) {
        resolve(acc, propertyString)->setAndWait(value);
    }

    /// Gives up after @p seconds, not counting the opening of a device.
    static void setValueAndWait(DevMgrPropertyAcc& acc, const LiString& propertyString,
                                const T& value, double seconds) {
        resolve(acc, propertyString)->setAndWait(value, seconds);
    }

    /// The property as its type, for many calls.
    static RCShdPtr<DevMDProperty<T>> resolve(DevMgrPropertyAcc& acc,
                                              const LiString& propertyString) {
        const RCShdPtr<DevMDPropertyAny> any = acc.getProperty(propertyString);
        RCShdPtr<DevMDProperty<T>> property = RCShdPtr<DevMDProperty<T>>::dynamicCast(any);
        if (property.isNull()) {
            throw DevMgrEx::PropertyInvalidType(ORV_FILE, __LINE__, any->getName().getChars());
        }
        return property;
    }
};

}  // namespace Orv
