#pragma once

#include <cstddef>
#include <cstdint>

#include "resmgtApi.h"

namespace Orv {

/// What can happen to a buffer; the numbers are the bits' in the mask of pending events.
enum class MbEvent : std::uint8_t {
    RDLOCK,
    WRLOCK,
    WRDUP,
    PREFETCH,
    ASYNC_SYNC,
    SYNC,
    UNLOCK,
    UNLOAD,
    FREE,
    DESTROY,
    ASYNC_OP_SUCCEEDED,
    ASYNC_OP_FAILED,
};

constexpr std::size_t NB_MB_EVENTS = 12;

/// The event as messages name it: "rdlock()".
ORV_RESMGT_API const char* getMbEventText(MbEvent) noexcept;

constexpr std::uint32_t getMbEventBit(MbEvent event) noexcept {
    return std::uint32_t(1) << static_cast<unsigned>(event);
}

}  // namespace Orv
