#include "mbAlignment.h"

#include "mbEx.h"
#include "sourceFile.h"

namespace Orv {

MbAlignment::MbAlignment(std::uint64_t alignmentMask, std::uint64_t offsetMask,
                         std::uint64_t offsetPattern)
    : _alignmentMask(alignmentMask), _offsetMask(offsetMask), _offsetPattern(offsetPattern) {
    checkPow2Minus1(alignmentMask);
    checkPow2Minus1(offsetMask);
}

void MbAlignment::setAlignmentMask(std::uint64_t mask) {
    checkPow2Minus1(mask);
    _alignmentMask = mask;
}

void MbAlignment::setOffsetMask(std::uint64_t mask) {
    checkPow2Minus1(mask);
    _offsetMask = mask;
}

void MbAlignment::checkPow2Minus1(std::uint64_t mask) {
    const std::uint64_t power = mask + 1;
    if (power == 0) {
        throw MbEx::ExInvalidArgument(ORV_FILE, __LINE__, "Zero is not a power of two");
    }
    if ((power & mask) != 0) {
        throw MbEx::ExInvalidArgument(ORV_FILE, __LINE__, "Argument is not a power of 2 minus 1");
    }
}

void MbAlignment::compound(const MbAlignment& other) {
    // What both say about a bit must be the same: of those under both masks they differ in none.
    const std::uint64_t differences = (getBits() ^ other.getBits()) & getMask() & other.getMask();
    if (differences != 0) {
        throw MbEx::ExInvalidArgument(ORV_FILE, __LINE__, "Incompatible offsets.");
    }
    const std::uint64_t pattern = getBits() | other.getBits();
    _alignmentMask |= other._alignmentMask;
    _offsetMask |= other._offsetMask;
    _offsetPattern = pattern;
}

bool MbAlignment::isAligned(std::uint64_t address) const noexcept {
    return (address & getMask()) == getBits();
}

std::uint64_t MbAlignment::roundUpToAlignment(std::uint64_t address) const {
    std::uint64_t candidate = (address & ~getMask()) | getBits();
    if (candidate >= address) return candidate;
    candidate += getMask() + 1;
    if (candidate < address) {
        throw MbEx::ExOutOfRange(ORV_FILE, 123,
                                 "Can't roundUpToAlignment() because of wrap-around");
    }
    return candidate;
}

std::uint64_t MbAlignment::roundDownToAlignment(std::uint64_t address) const {
    std::uint64_t candidate = (address & ~getMask()) | getBits();
    if (candidate <= address) return candidate;
    candidate -= getMask() + 1;
    if (candidate > address) {
        throw MbEx::ExOutOfRange(ORV_FILE, __LINE__,
                                 "Can't roundDownToAlignment() because of wrap-around");
    }
    return candidate;
}

std::uint64_t MbAlignment::getRoundUpMax(std::uint64_t nbBytes) const noexcept {
    return nbBytes > 0 ? getMask() : 0;
}

std::uint64_t MbAlignment::getRoundDownMax(std::uint64_t nbBytes) const noexcept {
    return nbBytes > 0 ? getMask() : 0;
}

}  // namespace Orv
