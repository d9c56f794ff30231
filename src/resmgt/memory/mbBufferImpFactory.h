#pragma once

#include "mbBufferImp.h"

namespace Orv {

/// Creates buffers that have manager, alignment and initial state in common.
///
/// MbBufferSimpleFactory is the same with handles instead of counted pointers.
///
/// - Threads: const, so any number may create; setters by one thread at a time.
class ORV_RESMGT_API MbBufferImpFactory {
public:
    /// @param manager  not null.
    explicit MbBufferImpFactory(RCShdPtr<MbManager> manager);
    virtual ~MbBufferImpFactory();

    MbBufferImpFactory(const MbBufferImpFactory&) = delete;
    MbBufferImpFactory& operator=(const MbBufferImpFactory&) = delete;

    // For the buffers that come

    void setAlignment(const MbAlignment& alignment) noexcept { _alignment = alignment; }
    void setInitialState(MbInitialState state) noexcept { _initialState = state; }

    /// Whether they trace every event; as it stands, if "memoryBuffers" is on when they are created.
    void setTraced(bool isTraced) noexcept;

    /// @param name      shown by messages and dumps; need not be unique.
    /// @param size      bytes, more than 0 (else an assertion).
    /// @param protocol  not null; may be shared by buffers.
    virtual RCShdEngPtr<MbBufferImp> create(const LiString& name, int size,
                                            const RCShdPtr<MbProtocol>& protocol) const;

    const RCShdPtr<MbManager>& getManager() const noexcept { return _manager; }

private:
    RCShdPtr<MbManager> _manager;
    MbAlignment _alignment;
    MbInitialState _initialState = MbInitialState::FREED;
    const MbStateMachine* _machine = nullptr;  // null: according to the trace level
};

}  // namespace Orv
