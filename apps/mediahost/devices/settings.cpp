#include "settings.h"

#include <charconv>
#include <cstdio>

#include "mediaError.h"

namespace MediaHost {

namespace {

[[noreturn]] void fail(const std::string& name, const std::string& value,
                       const std::string& expected) {
    throw MediaError("the setting " + name + '=' + value + " is no " + expected);
}

std::string shorten(double value) {
    char text[32];
    std::snprintf(text, sizeof text, "%.15g", value);
    return text;
}

}  // namespace

std::string Settings::getText(const std::string& name, const std::string& otherwise) {
    _isUsed[name] = true;
    const auto found = _values.find(name);
    return found != _values.end() ? found->second : otherwise;
}

std::int64_t Settings::getNumber(const std::string& name, std::int64_t otherwise,
                                 std::int64_t lowest, std::int64_t highest) {
    const std::string text = getText(name, std::to_string(otherwise));
    std::int64_t number = 0;
    const auto [end, error] = std::from_chars(text.data(), text.data() + text.size(), number);
    if (error != std::errc() || end != text.data() + text.size() || number < lowest ||
        number > highest) {
        fail(name, text,
             "whole number from " + std::to_string(lowest) + " to " + std::to_string(highest));
    }
    return number;
}

double Settings::getReal(const std::string& name, double otherwise, double lowest, double highest) {
    if (!has(name)) return getText(name, ""), otherwise;
    const std::string text = getText(name, "");
    double number = 0;
    const auto [end, error] = std::from_chars(text.data(), text.data() + text.size(), number);
    if (error != std::errc() || end != text.data() + text.size() || !(number >= lowest) ||
        !(number <= highest)) {
        fail(name, text, "number from " + shorten(lowest) + " to " + shorten(highest));
    }
    return number;
}

Orv::Rational Settings::getRate(const std::string& name, const Orv::Rational& otherwise) {
    if (!has(name)) return getText(name, ""), otherwise;
    const std::string text = getText(name, "");
    std::int64_t numerator = 0;
    std::int64_t denominator = 1;
    const char* end = text.data() + text.size();
    auto parsed = std::from_chars(text.data(), end, numerator);
    if (parsed.ec == std::errc() && parsed.ptr != end && *parsed.ptr == '/') {
        parsed = std::from_chars(parsed.ptr + 1, end, denominator);
    }
    if (parsed.ec != std::errc() || parsed.ptr != end || numerator < 1 || denominator < 1 ||
        numerator / denominator > 1000 || numerator > 10000000) {
        fail(name, text, "rate such as 25 or 30000/1001");
    }
    return Orv::Rational(numerator, denominator);
}

void Settings::check() const {
    for (const auto& [name, value] : _values) {
        if (_isUsed.count(name) == 0) throw MediaError("there is no setting \"" + name + '"');
    }
}

}  // namespace MediaHost
