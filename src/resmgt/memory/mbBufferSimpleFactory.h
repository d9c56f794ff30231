#pragma once

#include "mbBuffer.h"
#include "mbBufferImpFactory.h"

namespace Orv {

/// Creates buffers for applications: of one manager, all loaded by one protocol.
///
///     MbBufferSimpleFactory factory(manager, protocol);
///     const MbBuffer frame = factory.create("frame 1", frameBytes);
///
/// A protocol that has to tell its buffers apart is given one by one, to the other create().
///
/// - Threads: const members by any number of threads.
class ORV_RESMGT_API MbBufferSimpleFactory {
public:
    /// @param manager       not null.
    /// @param protocol      null if each buffer brings its own.
    /// @param initialState  UNLOADED if the contents are there to be reloaded.
    explicit MbBufferSimpleFactory(const RCShdPtr<MbManager>& manager,
                                   const RCShdPtr<MbProtocol>& protocol = nullptr,
                                   MbInitialState initialState = MbInitialState::FREED,
                                   const MbAlignment& alignment = {});

    /// @param name  shown by messages and dumps; need not be unique.
    /// @param size  bytes, more than 0 (else an assertion).
    MbBuffer create(const LiString& name, int size) const;
    MbBuffer create(const LiString& name, int size, const RCShdPtr<MbProtocol>& protocol) const;

private:
    MbBufferImpFactory _factory;
    RCShdPtr<MbProtocol> _protocol;
};

}  // namespace Orv
