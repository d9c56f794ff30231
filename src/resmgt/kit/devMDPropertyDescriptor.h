#pragma once

#include <optional>
#include <vector>

#include "devMDValue.h"
#include "liString.h"
#include "rcBase.h"
#include "rcShdPtr.h"
#include "resmgtApi.h"

namespace Orv {

/// What a device says about the values of one of its properties, for programs that show it or want
/// to know before they set it. The values themselves are in DevMDPropertyDescriptor.
///
/// - Threads: fill it before the property gets it; afterwards it is only read.
class ORV_RESMGT_API DevMDPropertyDescriptorAny : public RCBase<LkCounter<long>> {
public:
    ~DevMDPropertyDescriptorAny() noexcept(false) override;

    LiString getUnit() const { return _unit; }  ///< Such as "dB"; empty if there is none.

    /// The values that may be set, as text: "-60 to 12 by 0.5", "one of 24, 25, 30"; empty: all.
    virtual LiString getRangeText() const = 0;
    virtual LiString getDefaultText() const = 0;  ///< Empty if there is none.

protected:
    LiString _unit;
};

/// Unit, range, step, allowed values and default of a property of type @p T. For a vector they are
/// those of each of its items.
///
///     auto descriptor = DevMDPropertyDescriptor<double>::create();
///     descriptor->setUnit("dB").setRange(-60, 12).setStep(0.5).setDefault(0);
template <DevMDValue T>
class ORV_HEADER_API DevMDPropertyDescriptor : public DevMDPropertyDescriptorAny {
public:
    using Item = typename DevMDValueTraits<T>::Item;

    static RCShdPtr<DevMDPropertyDescriptor> create() {
        return RCShdPtr<DevMDPropertyDescriptor>(new DevMDPropertyDescriptor);
    }

    DevMDPropertyDescriptor& setUnit(const LiString& unit) { return _unit = unit, *this; }
    DevMDPropertyDescriptor& setRange(Item lowest, Item highest);  ///< Both included.
    /// Only lowest + n * step may be set; for floating point, within rounding errors.
    DevMDPropertyDescriptor& setStep(Item step) { return _step = step, *this; }
    DevMDPropertyDescriptor& setAllowed(std::vector<Item> values);
    DevMDPropertyDescriptor& setDefault(const T& value) { return _default = value, *this; }

    const std::optional<Item>& getLowest() const noexcept { return _lowest; }
    const std::optional<Item>& getHighest() const noexcept { return _highest; }
    const std::optional<Item>& getStep() const noexcept { return _step; }
    const std::vector<Item>& getAllowed() const noexcept { return _allowed; }  ///< Empty: all.
    const std::optional<T>& getDefault() const noexcept { return _default; }

    /// Whether @p value may be set. NaN may not where anything is restricted.
    bool isAllowed(const T& value) const;

    LiString getRangeText() const override;
    LiString getDefaultText() const override;

private:
    std::optional<Item> _lowest, _highest, _step;
    std::vector<Item> _allowed;
    std::optional<T> _default;

    bool isItemAllowed(Item item) const;
    bool isOnStep(Item item) const;
};

}  // namespace Orv

#include "devMDPropertyDescriptor.imp"
