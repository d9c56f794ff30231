#include "devMDValue.h"

#include <charconv>

namespace Orv {

namespace {

template <class T>
LiString toShortestText(T value) {
    char buffer[40];
    const std::to_chars_result result = std::to_chars(buffer, buffer + sizeof buffer, value);
    return LiString(std::string_view(buffer, static_cast<std::size_t>(result.ptr - buffer)));
}

}  // namespace

LiString devMDToText(std::int64_t value) {
    return toShortestText(value);
}
LiString devMDToText(std::uint64_t value) {
    return toShortestText(value);
}
LiString devMDToText(double value) {
    return toShortestText(value);
}
LiString devMDToText(float value) {
    return toShortestText(value);
}
LiString devMDToText(bool value) {
    return value ? "true" : "false";
}

}  // namespace Orv
