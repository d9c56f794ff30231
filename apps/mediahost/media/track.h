#pragma once

#include <atomic>
#include <cstdint>
#include <exception>
#include <map>
#include <memory>
#include <optional>
#include <orv/lkAsyncHandle.h>
#include <orv/lkCondVar.h>
#include <orv/lkMutex.h>
#include <orv/mbBuffer.h>
#include <orv/mbBufferRdGuardImp.h>
#include <orv/mbBufferSimpleFactory.h>
#include <orv/mtThread.h>

#include "unitDecoder.h"

namespace MediaHost {

/// The units of a track as buffers: what is locked is in memory, what is not may give way to others
/// and is decoded again when it is wanted.
///
/// Buffers are loaded by the track's own thread, which serves all that is asked of it in one go
/// through the track, in whatever order that was.
///
/// - Threads: any; the buffers that fetch() gives, too, until the track goes.
/// - Errors: fetch() throws what decoding has thrown; from then on always.
class Track {
public:
    /// @param manager  of the buffers; shared with other tracks or not.
    Track(const Orv::LiString& name, std::unique_ptr<UnitDecoder> decoder,
          const Orv::RCShdPtr<Orv::MbManager>& manager);
    ~Track();  ///< No buffer of it may be locked any more.

    Track(const Track&) = delete;
    Track& operator=(const Track&) = delete;

    /// The unit, locked in memory; waits for it. Null behind the end and after stop().
    Orv::MbBufferRdGuardImp fetch(std::int64_t unit);

    /// Has units loaded ahead; those that are there become the ones used last. May wait for room.
    void prefetch(std::int64_t first, std::int64_t nbUnits);

    /// The unit is not wanted again: its memory goes with the last lock. It may be fetched all the
    /// same, and is decoded again then.
    void letGo(std::int64_t unit);

    /// How many units there are; if that is not known, decodes to the end. 0 after stop().
    std::int64_t findNbUnits();

    void stop();  ///< Ends all waits, those to come included.

    std::size_t getUnitBytes() const { return _unitBytes; }
    std::uint64_t getNbDecoded() const { return _nbDecoded.load(); }
    std::uint64_t getNbFaults() const { return _nbFaults.load(); }

private:
    class Protocol;
    class Waiting;
    struct Request {
        void* data;
        Orv::LkAsyncHandle* handle;
        bool isUrgent;  // somebody waits for just this one
    };
    static constexpr std::int64_t UNKNOWN = INT64_MAX;
    static constexpr std::int64_t NEAR = 64;  // units that are decoded in one go

    const std::unique_ptr<UnitDecoder> _decoder;
    const std::size_t _unitBytes;
    const Orv::MbBufferSimpleFactory _factory;
    std::atomic<std::int64_t> _nbUnits{UNKNOWN};
    std::atomic<std::uint64_t> _nbDecoded{0};
    std::atomic<std::uint64_t> _nbFaults{0};

    Orv::LkMutex _mutex{"Track"};
    Orv::LkCondVar _changed{"Track changed"};
    // Guarded by _mutex:
    std::map<std::int64_t, Request> _requests;
    std::map<std::int64_t, Orv::MbBuffer> _buffers;
    std::size_t _nbBuffersToPrune = 256;
    std::exception_ptr _error;
    bool _isEndWanted = false;
    bool _isStopped = false;

    Orv::ObjPtr<Orv::MtThread> _thread;  // last: it uses all the others

    Orv::MbBuffer getBuffer(std::int64_t unit);
    void prune();
    void request(std::int64_t unit, const Request& request);
    void run();
    bool serve();
    std::optional<std::int64_t> choosePlace();
    void finishAll(std::exception_ptr error);
    void finishBehind(std::int64_t end);
    void noteProgress();
};

}  // namespace MediaHost
