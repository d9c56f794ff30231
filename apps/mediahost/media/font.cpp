#include "font.h"

#include <algorithm>
#include <cctype>

namespace MediaHost {

namespace {

struct Glyph {
    char character;
    std::uint8_t rows[TEXT_HEIGHT];  // bit 4 is the leftmost dot
};

constexpr Glyph GLYPHS[] = {
    {'0', {14, 17, 19, 21, 25, 17, 14}}, {'1', {4, 12, 4, 4, 4, 4, 14}},
    {'2', {14, 17, 1, 2, 4, 8, 31}},     {'3', {31, 2, 4, 2, 1, 17, 14}},
    {'4', {2, 6, 10, 18, 31, 2, 2}},     {'5', {31, 16, 30, 1, 1, 17, 14}},
    {'6', {6, 8, 16, 30, 17, 17, 14}},   {'7', {31, 1, 2, 4, 8, 8, 8}},
    {'8', {14, 17, 17, 14, 17, 17, 14}}, {'9', {14, 17, 17, 15, 1, 2, 12}},
    {':', {0, 12, 12, 0, 12, 12, 0}},    {';', {0, 12, 12, 0, 12, 4, 8}},
    {'.', {0, 0, 0, 0, 0, 12, 12}},      {'-', {0, 0, 0, 31, 0, 0, 0}},
    {'/', {0, 1, 2, 4, 8, 16, 0}},       {'A', {14, 17, 17, 17, 31, 17, 17}},
    {'B', {30, 17, 17, 30, 17, 17, 30}}, {'C', {14, 17, 16, 16, 16, 17, 14}},
    {'D', {28, 18, 17, 17, 17, 18, 28}}, {'E', {31, 16, 16, 30, 16, 16, 31}},
    {'F', {31, 16, 16, 30, 16, 16, 16}}, {'G', {14, 17, 16, 23, 17, 17, 15}},
    {'H', {17, 17, 17, 31, 17, 17, 17}}, {'I', {14, 4, 4, 4, 4, 4, 14}},
    {'J', {7, 2, 2, 2, 2, 18, 12}},      {'K', {17, 18, 20, 24, 20, 18, 17}},
    {'L', {16, 16, 16, 16, 16, 16, 31}}, {'M', {17, 27, 21, 21, 17, 17, 17}},
    {'N', {17, 17, 25, 21, 19, 17, 17}}, {'O', {14, 17, 17, 17, 17, 17, 14}},
    {'P', {30, 17, 17, 30, 16, 16, 16}}, {'Q', {14, 17, 17, 17, 21, 18, 13}},
    {'R', {30, 17, 17, 30, 20, 18, 17}}, {'S', {15, 16, 16, 14, 1, 1, 30}},
    {'T', {31, 4, 4, 4, 4, 4, 4}},       {'U', {17, 17, 17, 17, 17, 17, 14}},
    {'V', {17, 17, 17, 17, 17, 10, 4}},  {'W', {17, 17, 17, 21, 21, 21, 10}},
    {'X', {17, 17, 10, 4, 10, 17, 17}},  {'Y', {17, 17, 17, 10, 4, 4, 4}},
    {'Z', {31, 1, 2, 4, 8, 16, 31}},
};

const Glyph* findGlyph(char character) {
    const char wanted = static_cast<char>(std::toupper(static_cast<unsigned char>(character)));
    const auto* found = std::find_if(std::begin(GLYPHS), std::end(GLYPHS),
                                     [wanted](const Glyph& g) { return g.character == wanted; });
    return found != std::end(GLYPHS) ? found : nullptr;
}

}  // namespace

void fillRect(const RgbView& picture, int left, int top, int width, int height, Rgb colour) {
    const int right = std::min(left + width, picture.width);
    const int bottom = std::min(top + height, picture.height);
    for (int y = std::max(top, 0); y < bottom; ++y) {
        std::uint8_t* row = picture.pixels + static_cast<std::ptrdiff_t>(y) * picture.width * 3;
        for (int x = std::max(left, 0); x < right; ++x) {
            row[x * 3] = colour.red;
            row[x * 3 + 1] = colour.green;
            row[x * 3 + 2] = colour.blue;
        }
    }
}

void drawText(const RgbView& picture, int left, int top, int scale, std::string_view text,
              Rgb colour) {
    for (const char character : text) {
        if (const Glyph* glyph = findGlyph(character)) {
            for (int y = 0; y < TEXT_HEIGHT; ++y) {
                for (int x = 0; x < 5; ++x) {
                    if ((glyph->rows[y] >> (4 - x) & 1) == 0) continue;
                    fillRect(picture, left + x * scale, top + y * scale, scale, scale, colour);
                }
            }
        }
        left += 6 * scale;
    }
}

}  // namespace MediaHost
