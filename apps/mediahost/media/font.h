#pragma once

#include <cstdint>
#include <string_view>

namespace MediaHost {

/// A picture in memory, three bytes to a pixel, rows without padding. Borrowed.
struct RgbView {
    std::uint8_t* pixels;
    int width;
    int height;
};

struct Rgb {
    std::uint8_t red, green, blue;
};

void fillRect(const RgbView& picture, int left, int top, int width, int height, Rgb colour);

/// Characters are 5 by 7 dots with a dot between them, each of @p scale by @p scale pixels. What
/// does not fit into the picture is left out; letters are capitals.
void drawText(const RgbView& picture, int left, int top, int scale, std::string_view text,
              Rgb colour);

constexpr int getTextWidth(std::string_view text, int scale) {
    return static_cast<int>(text.size()) * 6 * scale;
}
inline constexpr int TEXT_HEIGHT = 7;

}  // namespace MediaHost
