#pragma once

#include "lgLog.h"

namespace Orv {

/// Shows in the timeline how long its scope takes. Ends only what it has begun, so that switching
/// the timeline on meanwhile leaves no end without a beginning.
class LgSpan {
public:
    /// @param category  borrowed for ever.
    LgSpan(const char* category, std::string_view name) noexcept
        : _category(LgLog::isTimelineOn() ? category : nullptr) {
        if (_category != nullptr) LgLog::beginSpan(_category, name);
    }

    ~LgSpan() {
        if (_category != nullptr) LgLog::endSpan(_category);
    }

    LgSpan(const LgSpan&) = delete;
    LgSpan& operator=(const LgSpan&) = delete;

private:
    const char* _category;  // null: not begun
};

}  // namespace Orv
