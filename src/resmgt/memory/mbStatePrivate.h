#pragma once

#include "mbTransitionTablePrivate.h"

namespace Orv {

class MbBufferImp;

/// A state of a buffer: what it does about events, and what is done when a buffer enters and leaves
/// it. States are shared by all buffers and have no data of their own.
///
/// Every member is called with the buffer's mutex held.
class MbState {
public:
    virtual ~MbState() = default;

    MbState(const MbState&) = delete;
    MbState& operator=(const MbState&) = delete;

    /// @return false if the thread has to wait for a change and deliver the event again.
    /// @throws MbEx::ExIllegalTransition, what a transition throws.
    [[nodiscard]] virtual bool receive(MbBufferImp&, MbEvent) const = 0;

    /// Whether a buffer in this state has contents in memory.
    virtual bool isLoaded() const noexcept = 0;

    /// Performs the state's action.
    /// @return the state that it leads to, or NONE.
    virtual MbStateId enter(MbBufferImp&) const = 0;
    virtual void exit(MbBufferImp&) const = 0;

    MbStateId getId() const noexcept { return _row.id; }
    const char* getName() const noexcept { return _row.name; }

    bool isLocked() const noexcept {
        return getId() >= MbStateId::RdLocked && getId() <= MbStateId::WrLockedFreed;
    }

protected:
    explicit MbState(MbStateId id) noexcept : _row(MbTransitionTable::getRow(id)) {}

    const MbStateRow& getRow() const noexcept { return _row; }

private:
    const MbStateRow& _row;
};

}  // namespace Orv
