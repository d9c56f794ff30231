#include "traceManager.h"

#include <algorithm>

#include "lgLog.h"
#include "traceLevel.h"

namespace Orv {

TraceManager& TraceManager::getInstance() {
    static auto* const manager = new TraceManager;
    return *manager;
}

void TraceManager::add(const TraceLevel& level) {
    const std::lock_guard guard(_mutex);
    _levels.push_back(&level);
    const auto wish = _wishes.find(std::string_view(level.getName()));
    if (wish != _wishes.end()) level.setOn(wish->second);
}

void TraceManager::remove(const TraceLevel& level) noexcept {
    const std::lock_guard guard(_mutex);
    std::erase(_levels, &level);
}

bool TraceManager::switchLevel(std::string_view name, bool isOn) {
    const std::lock_guard guard(_mutex);
    _wishes.insert_or_assign(std::string(name), isOn);
    bool isKnown = false;
    for (const TraceLevel* level : _levels) {
        if (level->getName() != name) continue;
        level->setOn(isOn);
        isKnown = true;
    }
    return isKnown;
}

void TraceManager::switchAll(bool isOn) {
    const TraceLevel& mainLevel = TraceLevel::getMain();
    const std::lock_guard guard(_mutex);
    for (const TraceLevel* level : _levels) {
        if (level != &mainLevel) level->setOn(isOn);
    }
}

bool TraceManager::isOn(std::string_view name) const {
    const std::lock_guard guard(_mutex);
    return std::ranges::any_of(_levels, [name](const TraceLevel* level) {
        return level->getName() == name && level->isOn();
    });
}

std::vector<std::string> TraceManager::getLevelNames() const {
    TraceLevel::getMain();  // there from the start, for whoever looks
    std::vector<std::string> names;
    {
        const std::lock_guard guard(_mutex);
        for (const TraceLevel* level : _levels) names.emplace_back(level->getName());
    }
    std::ranges::sort(names);
    const auto repeated = std::ranges::unique(names);
    names.erase(repeated.begin(), repeated.end());
    return names;
}

void TraceManager::print(const TraceLevel& level, std::string_view text) noexcept {
    LgLog::line(level.getSeverity(), level.getName(), text);
}

bool TraceManager::flush() noexcept {
    return LgRegistry::getInstance().flush();
}

void TraceManager::addSink(std::shared_ptr<LgSink> sink) {
    LgRegistry::getInstance().addSink(std::move(sink));
}

bool TraceManager::removeSink(const LgSink& sink) {
    return LgRegistry::getInstance().removeSink(sink);
}

void TraceManager::setStandardErrorOn(bool isOn) {
    LgRegistry::getInstance().setStandardErrorOn(isOn);
}

}  // namespace Orv
