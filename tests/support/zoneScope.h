#pragma once

#include <ctime>
#include <string>

#include "envVar.h"

namespace Orv {

/// Puts the process into another time zone while it exists; on Linux only.
class ZoneScope {
public:
    explicit ZoneScope(const char* zone) : _before(EnvVar("TZ").getText().value_or("")) {
        set(zone);
    }
    ~ZoneScope() { set(_before); }

    ZoneScope(const ZoneScope&) = delete;
    ZoneScope& operator=(const ZoneScope&) = delete;

    // Rules written out, so that no database of zones is needed.
    static constexpr const char* BERLIN = "CET-1CEST,M3.5.0,M10.5.0/3";
    static constexpr const char* NEW_YORK = "EST5EDT,M3.2.0,M11.1.0";
    static constexpr const char* LORD_HOWE = "LHST-10:30LHDT-11,M10.1.0,M4.1.0";  // by 30 minutes

private:
    std::string _before;

    static void set(const std::string& zone) {
        std::string assignment("TZ=");
        assignment.append(zone);
        EnvVar::putEnv(assignment.c_str());
        ::tzset();
    }
};

}  // namespace Orv
