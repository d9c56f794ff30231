#include "traceLevel.h"

#include "traceManager.h"

namespace Orv {

TraceLevel::TraceLevel(const char* name, bool isOn, LgSeverity severity)
    : _isOn(isOn), _severity(severity), _name(name) {
    TraceManager::getInstance().add(*this);
}

TraceLevel::~TraceLevel() {
    TraceManager::getInstance().remove(*this);
}

const TraceLevel& TraceLevel::getMain() {
    static const auto* const level = new TraceLevel("main", true, LgSeverity::FAILURE);
    return *level;
}

}  // namespace Orv
