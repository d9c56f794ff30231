#pragma once

#include "settings.h"
#include "sourceDevice.h"

namespace MediaHost {

/// Colour bars with burnt-in timecode. Settings: width, height, rate, seconds.
class PatternDevice : public SourceDevice {
public:
    PatternDevice(const Orv::LiString& name, HostContext& context, Settings settings);
};

/// A sine tone with a click each second. Settings: rate (samples per second), hertz, seconds.
class ToneDevice : public SourceDevice {
public:
    ToneDevice(const Orv::LiString& name, HostContext& context, Settings settings);
};

}  // namespace MediaHost
