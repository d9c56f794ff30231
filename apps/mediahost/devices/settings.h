#pragma once

#include <map>
#include <orv/rational.h>
#include <string>

namespace MediaHost {

/// What a device is made with: `file=clip.mp4 threads=2`.
///
/// - Errors: MediaError that names the setting and what was expected; check() for those that no
///   device has asked for.
class Settings {
public:
    void set(const std::string& name, const std::string& value) { _values[name] = value; }
    bool has(const std::string& name) const { return _values.count(name) > 0; }

    std::string getText(const std::string& name, const std::string& otherwise);
    std::int64_t getNumber(const std::string& name, std::int64_t otherwise, std::int64_t lowest,
                           std::int64_t highest);
    double getReal(const std::string& name, double otherwise, double lowest, double highest);
    Orv::Rational getRate(const std::string& name, const Orv::Rational& otherwise);

    void check() const;

private:
    std::map<std::string, std::string> _values;
    std::map<std::string, bool> _isUsed;
};

}  // namespace MediaHost
