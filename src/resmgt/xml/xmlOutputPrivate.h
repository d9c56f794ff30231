#pragma once

#include <array>
#include <cstddef>
#include <cstring>
#include <ostream>
#include <string_view>

#include "xmlTextPrivate.h"

namespace Orv {

/// Gathers the pieces of one operation, so that the stream is entered once and not for each piece.
/// What was gathered and not flushed is lost.
///
/// - Errors: as of std::ostream::write, which sets the stream's state and throws if it shall.
class XmlOutput {
public:
    explicit XmlOutput(std::ostream& stream) noexcept : _stream(stream) {}

    XmlOutput(const XmlOutput&) = delete;
    XmlOutput& operator=(const XmlOutput&) = delete;

    XmlOutput& put(std::string_view text) {
        if (text.size() > _chars.size() - _length) {
            flush();
            if (text.size() > _chars.size()) {
                write(text);
                return *this;
            }
        }
        std::memcpy(_chars.data() + _length, text.data(), text.size());
        _length += text.size();
        return *this;
    }

    XmlOutput& putEscaped(std::string_view text) {
        XmlText::escape(text, [this](std::string_view piece) { put(piece); });
        return *this;
    }

    void flush() {
        const std::size_t length = _length;
        _length = 0;
        if (length > 0) write({_chars.data(), length});
    }

private:
    std::ostream& _stream;
    std::size_t _length = 0;
    std::array<char, 256> _chars;  // not initialised: only what was put is read

    void write(std::string_view text) {
        _stream.write(text.data(), static_cast<std::streamsize>(text.size()));
    }
};

}  // namespace Orv
