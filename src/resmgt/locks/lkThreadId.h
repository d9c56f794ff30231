#pragma once

#include <compare>
#include <cstdint>
#include <iosfwd>

#include "resmgtApi.h"

namespace Orv {

/// Identity of a thread of this process: the operating system's number of it, or none.
///
/// A number tells threads apart only while they live: the system may give it out again. Ordered and
/// printed as the number.
class ORV_RESMGT_API LkThreadId {
public:
    enum ReservedId { NO_THREAD = 0, CURRENT_THREAD = 1 };

    LkThreadId() noexcept = default;  ///< No thread.
    LkThreadId(ReservedId id) noexcept;

    bool isNull() const noexcept { return _number == 0; }
    bool isCurrentThread() const noexcept;
    unsigned long getNum() const noexcept { return _number; }

    void reset() noexcept { _number = 0; }
    void setCurrentThread() noexcept;

    bool operator==(const LkThreadId&) const noexcept = default;
    auto operator<=>(const LkThreadId&) const noexcept = default;

private:
    std::uint32_t _number = 0;
};

ORV_RESMGT_API std::ostream& operator<<(std::ostream&, const LkThreadId&);

}  // namespace Orv
