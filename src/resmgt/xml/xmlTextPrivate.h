#pragma once

#include <cstddef>
#include <string_view>

#include "liString.h"

namespace Orv {

/// How texts come to be XML, for both ways of writing it.
class XmlText {
public:
    XmlText() = delete;

    /// The characters that are written: up to the first NUL, none for null.
    static std::string_view viewOf(const char* text) noexcept {
        return text != nullptr ? text : "";
    }
    static std::string_view viewOf(const LiString& text) { return text.getChars(); }

    /// Calls @p put with the pieces, in order, of @p text as it stands in an attribute's value.
    template <class Put>
    static void escape(std::string_view text, Put put) {
        std::size_t begin = 0;
        for (std::size_t i = 0; i < text.size(); ++i) {
            if (!mayBeSpecial(text[i])) continue;
            const std::string_view entity = entityOf(text[i]);
            if (entity.empty()) continue;
            put(text.substr(begin, i - begin));
            put(entity);
            begin = i + 1;
        }
        put(text.substr(begin));
    }

private:
    /// True for all of `"&'<>` and few others; nearly every character is done with here.
    static constexpr bool mayBeSpecial(char character) noexcept {
        return character <= '>' && character >= '"';
    }

    static constexpr std::string_view entityOf(char character) noexcept {
        switch (character) {
            case '"':
                return "&quot;";
            case '&':
                return "&amp;";
            case '\'':
                return "&apos;";
            case '<':
                return "&lt;";
            case '>':
                return "&gt;";
            default:
                return {};
        }
    }
};

}  // namespace Orv
