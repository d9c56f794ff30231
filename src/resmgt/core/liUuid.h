#pragma once

#include <compare>
#include <cstdint>
#include <functional>

#include "liString.h"
#include "liUuidTypes.h"
#include "resmgtApi.h"

namespace Orv {

/// Universally unique identifier (RFC 4122), a value of 16 bytes; nil, all zero, until it is set.
///
/// Values are ordered as their texts.
///
/// - Errors: LiUuidEx::ExInternalError wherever the platform fails.
class ORV_RESMGT_API LiUuid {
public:
    enum CreateEnum { CREATE };

    LiUuid();                               ///< The nil UUID.
    explicit LiUuid(CreateEnum);            ///< A new one, as create().
    explicit LiUuid(const LiString& text);  ///< As fromString().

    void clear();   ///< Becomes the nil UUID.
    void create();  ///< Becomes one that no other call, process or machine has been given.

    /// Reads the 36 characters of toString(), in upper or lower case.
    /// @throws LiUuidEx::ExInvalidUuidString for any other text; the value stays.
    void fromString(const LiString& text);

    /// Lower-case hexadecimal in groups of 8-4-4-4-12.
    LiString toString() const;

    bool equal(const LiUuid& other) const;
    int compare(const LiUuid& other) const;  ///< -1, 0 or 1.
    bool isNil() const;

    /// A number below 65536, the same for the same UUID.
    std::uint64_t hash() const;
    explicit operator std::uint64_t() const { return hash(); }

    friend bool operator==(const LiUuid& a, const LiUuid& b) { return a.equal(b); }
    friend std::strong_ordering operator<=>(const LiUuid& a, const LiUuid& b) {
        return a.compare(b) <=> 0;
    }

private:
    LiUuidTypes::Uuid _uuid;
};

}  // namespace Orv

template <>
struct std::hash<Orv::LiUuid> {
    std::size_t operator()(const Orv::LiUuid& uuid) const { return uuid.hash(); }
};
