#include "envIntVar.h"

#include <charconv>
#include <string_view>

namespace Orv {

namespace {

std::optional<int> parseInt(std::string_view text) {
    constexpr const char* BLANKS = " \t\r\n";
    const std::size_t first = text.find_first_not_of(BLANKS);
    if (first == std::string_view::npos) return std::nullopt;
    text = text.substr(first, text.find_last_not_of(BLANKS) + 1 - first);
    if (text.size() > 1 && text[0] == '+' && text[1] != '-') text.remove_prefix(1);
    int value = 0;
    const char* const end = text.data() + text.size();
    const auto [rest, error] = std::from_chars(text.data(), end, value);
    if (error != std::errc() || rest != end) return std::nullopt;
    return value;
}

}  // namespace

EnvIntVar::EnvIntVar(const char* name, int defaultValue)
    : _variable(name), _default(defaultValue), _value(defaultValue) {
    refresh();
}

void EnvIntVar::refresh() {
    const std::optional<std::string> text = _variable.getText();
    const std::optional<int> number = text ? parseInt(*text) : std::nullopt;
    _value.store(number.value_or(_default), std::memory_order_relaxed);
}

}  // namespace Orv
