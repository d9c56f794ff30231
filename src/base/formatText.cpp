#include "formatText.h"

#include <cstdarg>
#include <cstdio>
#include <stdexcept>

namespace Orv {

std::string formatText(const char* format, ...) {
    std::va_list arguments;
    va_start(arguments, format);
    std::va_list measured;
    va_copy(measured, arguments);
    const int length = std::vsnprintf(nullptr, 0, format, measured);
    va_end(measured);
    std::string text;
    if (length > 0) {
        try {
            text.resize(static_cast<std::size_t>(length));
        } catch (...) {
            va_end(arguments);
            throw;
        }
        std::vsnprintf(text.data(), text.size() + 1, format, arguments);
    }
    va_end(arguments);
    if (length < 0) throw std::length_error("formatText");
    return text;
}

}  // namespace Orv
