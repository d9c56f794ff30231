#pragma once

#include <cstdint>

#include "liString.h"
#include "liUuidTypes.h"

namespace Orv {

/// The platform's part of LiUuid: the RPC runtime on Windows, the kernel's random numbers on Linux.
///
/// Each raises LiUuidEx::ExInternalError where a call of the platform fails.
class LiUuidUtil {
private:
    friend class LiUuid;
    using Uuid = LiUuidTypes::Uuid;

    static constexpr int TEXT_LENGTH = 36;

    static Uuid createNil();
    static Uuid create();
    static Uuid fromString(const LiString& text);
    static LiString toString(const Uuid&);
    static bool equal(const Uuid&, const Uuid&);
    static int compare(const Uuid&, const Uuid&);
    static bool isNil(const Uuid&);
    static std::uint16_t hash(const Uuid&);

    /// Whether the text has the form of a UUID; platforms differ in what else they would take.
    static bool isWellFormed(const LiString& text);
    static bool isGroupBorder(int position) noexcept;
    static int findHexValue(char digit) noexcept;  // -1 for what is no digit, whatever the locale
};

}  // namespace Orv
