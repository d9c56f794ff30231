#include "formatText.h"
#include "lgJsonTextPrivate.h"

namespace Orv {

namespace {

unsigned byteAt(std::string_view text, std::size_t index) noexcept {
    return static_cast<unsigned char>(text[index]);
}

/// The length of the UTF-8 sequence of two to four bytes that the text begins with; 0 if there is
/// none. Overlong forms, surrogates and what lies above U+10FFFF are none (RFC 3629).
std::size_t multiByteLength(std::string_view text) noexcept {
    const unsigned lead = byteAt(text, 0);
    const std::size_t length = lead < 0xC2   ? 0
                               : lead < 0xE0 ? 2
                               : lead < 0xF0 ? 3
                               : lead < 0xF5 ? 4
                                             : 0;
    if (length == 0 || text.size() < length) return 0;
    unsigned lowest = 0x80;
    unsigned highest = 0xBF;
    if (lead == 0xE0) lowest = 0xA0;
    if (lead == 0xED) highest = 0x9F;
    if (lead == 0xF0) lowest = 0x90;
    if (lead == 0xF4) highest = 0x8F;
    if (byteAt(text, 1) < lowest || byteAt(text, 1) > highest) return 0;
    for (std::size_t index = 2; index < length; ++index) {
        if ((byteAt(text, index) & 0xC0) != 0x80) return 0;
    }
    return length;
}

}  // namespace

void appendJsonText(std::string& json, std::string_view text) {
    json += '"';
    while (!text.empty()) {
        const char character = text.front();
        std::size_t length = multiByteLength(text);
        if (length > 0) {
            json.append(text.substr(0, length));
        } else {
            const unsigned code = byteAt(text, 0);
            length = 1;
            if (character == '"' || character == '\\') {
                json.append({'\\', character});
            } else if (code < 0x20 || code >= 0x7F) {
                json += formatText("\\u%04x", code);
            } else {
                json += character;
            }
        }
        text.remove_prefix(length);
    }
    json += '"';
}

}  // namespace Orv
