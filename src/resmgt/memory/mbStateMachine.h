#pragma once

#include <array>
#include <cstddef>
#include <iosfwd>
#include <memory>

#include "mbEvent.h"
#include "resmgtApi.h"

namespace Orv {

class MbState;
enum class MbStateId : std::uint8_t;

/// The states that all buffers of the process share, in two sets: one whose states trace every event
/// that they receive, on the trace level "memoryBuffers", and one whose states do not.
///
/// - Threads: any; nothing changes after a set was made.
class ORV_RESMGT_API MbStateMachine {
public:
    /// One of the two, made when it is first asked for; lives as long as the process.
    static const MbStateMachine& getInstance(bool isTraced);

    /// The traced one if the trace level is on, else the other.
    static const MbStateMachine& getInstance();

    /// The life of a buffer as a graph for Graphviz: dashed arrows are what happens by itself when
    /// the protocol's call has ended.
    static void writeDot(std::ostream&);

    MbStateMachine(const MbStateMachine&) = delete;
    MbStateMachine& operator=(const MbStateMachine&) = delete;

    const MbState& getState(MbStateId id) const noexcept {
        return *_states[static_cast<std::size_t>(id)];
    }

private:
    static constexpr std::size_t NB_STATES = 30;

    explicit MbStateMachine(bool isTraced);
    ~MbStateMachine() = delete;

    std::array<std::unique_ptr<const MbState>, NB_STATES> _states;

    template <class State>
    void add(bool isTraced);
};

}  // namespace Orv
