#pragma once

#include <cstddef>

namespace Orv {

/// While it lives, operator new of this thread succeeds @p nbGranted more times, then throws.
class DaHeapShortage {
public:
    explicit DaHeapShortage(std::size_t nbGranted) noexcept;
    ~DaHeapShortage();

    DaHeapShortage(const DaHeapShortage&) = delete;
    DaHeapShortage& operator=(const DaHeapShortage&) = delete;

    std::size_t getNbRefused() const noexcept;
};

}  // namespace Orv
