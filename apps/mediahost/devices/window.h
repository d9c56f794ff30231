#pragma once

#include <memory>

#include "formats.h"

namespace MediaHost {

/// A window that shows pictures.
///
/// - Threads: made, used and destroyed by one.
class Window {
public:
    virtual ~Window() = default;

    virtual void show(const PictureFormat& format, const std::byte* picture) = 0;

    /// @throws MediaError if there is no display, or the program was built without SDL.
    static std::unique_ptr<Window> create();
};

}  // namespace MediaHost
