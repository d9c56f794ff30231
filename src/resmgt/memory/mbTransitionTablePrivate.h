#pragma once

#include <array>
#include <cstddef>
#include <cstdint>
#include <iosfwd>

#include "mbEvent.h"

namespace Orv {

/// The states of a buffer. Each is a class of the same name in MbStates.
enum class MbStateId : std::uint8_t {
    // Stable
    Freed,
    Unloaded,
    Loaded,
    Synched,
    RdLocked,
    WrLocked,
    RdLockedFreed,
    WrLockedFreed,
    Destroyed,
    // A call of the protocol is under way
    BeingRdLoaded,
    BeingWrLoaded,
    BeingRdReloaded,
    BeingWrReloaded,
    BeingSynched,
    BeingUnlocked,
    BeingAsyncLoaded,
    BeingAsyncReloaded,
    BeingAsyncSynched,
    // The protocol is to report
    WaitAsyncLoaded,
    WaitAsyncReloaded,
    WaitAsyncSynched,
    // On the way out
    BeingUnloaded,
    BeingFreed,
    BeingDestroyed,
    // The protocol has reported
    AsyncLoadSucceeded,
    AsyncLoadFailed,
    AsyncReloadSucceeded,
    AsyncReloadFailed,
    AsyncSyncSucceeded,
    AsyncSyncFailed,
    NONE,
};

constexpr std::size_t NB_MB_STATES = static_cast<std::size_t>(MbStateId::NONE);

/// What a state does about an event.
enum class MbReaction : std::uint8_t {
    IGNORE,
    ILLEGAL,     ///< MbEx::ExIllegalTransition
    WAIT,        ///< The thread waits for a change and asks again.
    PEND,        ///< Recorded, and delivered at the end of the next transition.
    COUNT_UP,    ///< One lock more.
    COUNT_DOWN,  ///< One lock less; the last one leads on.
    TOUCH,       ///< The buffer becomes the one used last.
    GO,
};

struct MbCell {
    MbReaction reaction;
    MbStateId next;  ///< Of GO and COUNT_DOWN.

    constexpr MbCell(MbReaction itsReaction, MbStateId itsNext = MbStateId::NONE) noexcept
        : reaction(itsReaction), next(itsNext) {}
    constexpr MbCell(MbStateId itsNext) noexcept : MbCell(MbReaction::GO, itsNext) {}
};

using MbCells = std::array<MbCell, NB_MB_EVENTS>;

struct MbStateRow {
    MbStateId id;
    const char* name;
    MbStateId next;  ///< Where the state's own action leads; NONE if it stays.
    MbCells cells;

    const MbCell& getCell(MbEvent event) const noexcept {
        return cells[static_cast<std::size_t>(event)];
    }
};

/// The life of a buffer: what each state does about each event. The classes of MbStates have the
/// actions, this has all that leads from one to another.
class MbTransitionTable {
public:
    static const MbStateRow& getRow(MbStateId) noexcept;

    /// The table as a graph in the language of Graphviz.
    static void writeDot(std::ostream&);
};

}  // namespace Orv
