#include "lgLog.h"

namespace Orv {

void LgLog::line(LgSeverity severity, const char* category, std::string_view text) noexcept {
    LgRegistry::getInstance().log({.severity = severity, .category = category, .text = text});
}

void LgLog::event(LgRecord::Kind kind, const char* category, std::string_view name,
                  std::uint64_t id, double value) noexcept {
    LgRegistry::getInstance().log(
        {.kind = kind, .category = category, .text = name, .id = id, .value = value});
}

}  // namespace Orv
