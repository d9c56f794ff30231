#include <ctime>

#include "assertions.h"
#include "osDateUtil.h"
#include "osError.h"

namespace Orv {

OsDateUtil::Zone OsDateUtil::findLocalZone(std::int64_t utcSeconds) {
    std::tm fields{};
    const std::time_t moment = utcSeconds;
    ORV_ASSERT_SYS(::localtime_r(&moment, &fields) != nullptr, "::localtime_r() != NULL",
                   OsError::getLast());
    return {static_cast<int>(fields.tm_gmtoff), fields.tm_isdst > 0, fields.tm_zone};
}

void OsDateUtil::setZone(std::tm& fields, const Zone& zone) noexcept {
    fields.tm_isdst = zone.isDaylightSaving ? 1 : 0;
    fields.tm_gmtoff = zone.offsetSeconds;
    fields.tm_zone = zone.name;
}

}  // namespace Orv
