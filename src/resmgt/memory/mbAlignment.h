#pragma once

#include <cstdint>

#include "resmgtApi.h"

namespace Orv {

/// Where in memory a buffer's data may start: which low bits of the address are zero and which
/// follow a pattern.
///
/// An address fits when its bits under the alignment mask are zero and its bits under the offset
/// mask equal the pattern's. Where both masks cover a bit, the alignment mask rules; bits of the
/// pattern outside the offset mask count for nothing. Masks are powers of two minus one.
///
///     MbAlignment(0xFFF, 0, 0)     starts of 4 KiB pages
///     MbAlignment(0, 0x3F, 0x10)   16 bytes behind the start of a cache line
///
/// - Errors: MbEx::ExInvalidArgument for a mask that is none, the object being unchanged.
class ORV_RESMGT_API MbAlignment {
public:
    MbAlignment() noexcept = default;  ///< Any address.
    MbAlignment(std::uint64_t alignmentMask, std::uint64_t offsetMask, std::uint64_t offsetPattern);

    std::uint64_t getAlignmentMask() const noexcept { return _alignmentMask; }
    std::uint64_t getOffsetMask() const noexcept { return _offsetMask; }
    std::uint64_t getOffsetPattern() const noexcept { return _offsetPattern; }

    void setAlignmentMask(std::uint64_t mask);
    void setOffsetMask(std::uint64_t mask);
    void setOffsetPattern(std::uint64_t pattern) noexcept { _offsetPattern = pattern; }

    /// From now on also what @p other demands.
    /// @throws MbEx::ExInvalidArgument if no address fits both; the object is unchanged then.
    void compound(const MbAlignment& other);

    bool isAligned(std::uint64_t address) const noexcept;

    /// The nearest address that fits, at or above, at or below @p address.
    /// @throws MbEx::ExOutOfRange if there is none before the numbers end.
    std::uint64_t roundUpToAlignment(std::uint64_t address) const;
    std::uint64_t roundDownToAlignment(std::uint64_t address) const;

    /// The most bytes that rounding can put before, or behind, @p nbBytes; none for no bytes.
    std::uint64_t getRoundUpMax(std::uint64_t nbBytes) const noexcept;
    std::uint64_t getRoundDownMax(std::uint64_t nbBytes) const noexcept;

    /// @throws MbEx::ExInvalidArgument
    static void checkPow2Minus1(std::uint64_t mask);

    bool operator==(const MbAlignment&) const noexcept = default;

private:
    std::uint64_t _alignmentMask = 0;
    std::uint64_t _offsetMask = 0;
    std::uint64_t _offsetPattern = 0;

    std::uint64_t getMask() const noexcept { return _alignmentMask | _offsetMask; }
    std::uint64_t getBits() const noexcept {
        return _offsetPattern & _offsetMask & ~_alignmentMask;
    }
};

}  // namespace Orv
