#pragma once

namespace Orv {

/// States of the sequence machine. The values are their indices in its table.
enum class DevSeqState : int {
    INIT = 0,
    START = 1,      ///< The device prepares.
    WSR = 2,        ///< Waits until its children are ready.
    READY = 3,      ///< Ready, with all that is below.
    WML = 4,        ///< Waits until the parent is in step.
    SYNC = 5,       ///< The device gets into step.
    LOCK = 6,       ///< In step.
    RECOVER = 7,    ///< The device prepares again.
    WSS = 8,        ///< Waits until its children have stopped.
    STOP = 9,       ///< The device stops.
    ABORT = 10,     ///< The device gives up.
    FINAL = 11,     ///< The end.
    ILLEGAL = 12,   ///< "_ill": ended by an event that was not expected.
    EXCEPTION = 13  ///< "_exc": ended by an exception of the device's protocol.
};

constexpr int NB_DEV_SEQ_STATES = 14;

/// Has the node begun, and not yet ended?
constexpr bool isWorking(DevSeqState state) noexcept {
    return state > DevSeqState::INIT && state < DevSeqState::FINAL;
}

/// Has the node ended otherwise than as it should?
constexpr bool hasFailed(DevSeqState state) noexcept {
    return state > DevSeqState::FINAL;
}

}  // namespace Orv
