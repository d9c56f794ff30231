#pragma once

#include <cstddef>
#include <cstdint>
#include <optional>

#include "formats.h"

namespace MediaHost {

/// Makes the units of one track, pictures or blocks of sound, which are numbered from 0.
///
/// - Threads: one at a time.
/// - Errors: MediaError. What cannot be decoded is left out and counted.
class UnitDecoder {
public:
    UnitDecoder() = default;
    virtual ~UnitDecoder() = default;
    UnitDecoder(const UnitDecoder&) = delete;
    UnitDecoder& operator=(const UnitDecoder&) = delete;

    virtual std::size_t getUnitBytes() const = 0;  ///< Header included.

    /// Goes on to the next unit. @return false if there is none.
    virtual bool next() = 0;
    virtual std::int64_t getUnit() const = 0;      ///< The number of the one at hand.
    virtual std::int64_t getNextUnit() const = 0;  ///< Of the one that next() goes to.
    virtual void copy(void* unit) = 0;             ///< The one at hand, with its header.

    /// Goes to @p unit or to one before it, from where next() leads to it.
    virtual void seek(std::int64_t unit) = 0;

    /// Whether seek() would get to a unit ahead sooner than next() does.
    virtual bool isSeekQuicker(std::int64_t unit) const = 0;

    /// How many units there are; empty while that is not known, which a run to the end changes.
    virtual std::optional<std::int64_t> getNbUnits() const = 0;

    virtual std::uint64_t getNbFaults() const { return 0; }  ///< Damaged pieces left out.
    virtual std::uint64_t getNbDecoded() const = 0;          ///< Units made, repeats included.
};

}  // namespace MediaHost
