#pragma once

#include <cstdint>
#include <filesystem>

#include "font.h"

namespace MediaHost {

/// Writes a picture as PNG (ISO/IEC 15948), 8 bits a channel. @throws MediaError
void writePng(const std::filesystem::path& path, const RgbView& picture);

}  // namespace MediaHost
