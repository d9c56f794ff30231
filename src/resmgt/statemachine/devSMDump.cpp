#include <ostream>

#include "devSMDumpPrivate.h"

namespace Orv {

void dumpJoined(std::ostream& stream, const std::vector<LiString>& names) {
    const char* separator = "";
    for (const LiString& name : names) {
        stream << separator << name;
        separator = ", ";
    }
}

void dumpCondition(std::ostream& stream, const DevSMCondition& condition) {
    stream << "{ " << condition.transition << ", { ";
    dumpJoined(stream, condition.outcomes);
    stream << " }, { ";
    dumpJoined(stream, condition.leadsTo);
    stream << " } }\n";
}

}  // namespace Orv
