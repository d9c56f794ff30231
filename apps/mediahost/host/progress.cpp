#include "progress.h"

#include <algorithm>
#include <cstdio>
#include <iostream>
#include <orv/devMgrPropertyValueUtil.h>

#include "host.h"
#include "process.h"
#include "sourceDevice.h"

namespace MediaHost {

namespace {

constexpr double GET_SECONDS = 0.05;  // progress is not worth waiting for
constexpr int BAR_WIDTH = 20;

double getOr(Orv::DevMgrPropertyAcc& properties, const std::string& name, double otherwise) {
    try {
        double value = 0;
        Orv::DevMgrPropertyValueUtil<double>::getValue(properties, name.c_str(), value,
                                                       GET_SECONDS);
        return value;
    } catch (const std::exception&) {
        return otherwise;
    }
}

std::string format(const char* pattern, double value) {
    char text[64];
    std::snprintf(text, sizeof text, pattern, value);
    return text;
}

}  // namespace

Progress::Progress(Host& host) : _host(host), _isTerminal(Process::isTerminal()) {
    for (const Pipeline::Device& spec : host.getPipeline().devices) {
        const auto source = Orv::RCShdPtr<SourceDevice>::dynamicCast(host.getDevice(spec.name));
        if (!_position.isNull() || source.isNull() || source->getPictureFormat() == nullptr)
            continue;
        _rate = source->getPictureFormat()->rate.toDouble();
        _duration = getOr(host.getProperties(), spec.name + ":duration", 0);
        _position = Orv::DevMgrPropertyValueUtil<std::int64_t>::resolve(
            host.getProperties(), (spec.name + ":position").c_str());
    }
}

Progress::~Progress() {
    if (_isBarOpen) std::cout << std::endl;
}

void Progress::show() {
    const double now = Process::getSecondsSinceStart();
    if (now < _nextSeconds) return;
    _nextSeconds = now + (_isTerminal ? 0.1 : 1);
    std::int64_t position = 0;
    try {
        if (!_position.isNull()) _position->get(position, GET_SECONDS);
    } catch (const std::exception&) {
        return;  // the device is busy; there will be a next time
    }
    const std::string text = makeText(position);
    if (!_isTerminal) {
        std::cout << text << std::endl;
        return;
    }
    const double seconds = _rate > 0 ? static_cast<double>(position) / _rate : 0;
    const int nbDone =
        _duration > 0 ? std::clamp(static_cast<int>(seconds / _duration * BAR_WIDTH), 0, BAR_WIDTH)
                      : 0;
    std::cout << "\r[" << std::string(static_cast<std::size_t>(nbDone), '#')
              << std::string(static_cast<std::size_t>(BAR_WIDTH - nbDone), '.') << "] " << text
              << "\x1b[K" << std::flush;
    _isBarOpen = true;
}

std::string Progress::makeText(std::int64_t position) const {
    const HostContext& context = _host.getContext();
    std::string text;
    if (_rate > 0) {
        text += format("%.2f s  ", static_cast<double>(position) / _rate);
        text += context.timecode->getTimecode(position).getChars();
        const Orv::MbManagerStatistics cache = context.getCacheStatistics();
        text += format("  cache %.1f", static_cast<double>(cache.bytesInUse) / (1 << 20));
        text += format("/%.1f MB", static_cast<double>(context.cacheBytes) / (1 << 20));
    }
    if (context.isPaced) {
        text += format("  late %.2f ms", context.pacer.getLateness().p99Seconds * 1e3);
    }
    text += "  queues";
    for (const Orv::DevMgr::Device& device : _host.getManager().getDevices()) {
        text += ' ' + std::to_string(device.nbWaiting);
    }
    return text;
}

}  // namespace MediaHost
