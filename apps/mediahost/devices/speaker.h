#pragma once

#include <memory>
#include <span>

#include "formats.h"

namespace MediaHost {

/// What makes sound audible.
///
/// - Threads: made, used and destroyed by one.
class Speaker {
public:
    virtual ~Speaker() = default;

    /// Queues samples behind those that have not sounded yet.
    virtual void play(std::span<const float> samples) = 0;
    virtual double getQueuedSeconds() = 0;  ///< That have not sounded yet.

    /// @throws MediaError if there is no device for sound, or the program was built without SDL.
    static std::unique_ptr<Speaker> create(const SoundFormat& format);
};

}  // namespace MediaHost
