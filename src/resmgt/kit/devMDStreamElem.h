#pragma once

#include "devAEO.h"
#include "rcBase.h"
#include "rcShdPtr.h"
#include "resmgtApi.h"

namespace Orv {

/// Data that an element of a stream carries; devices derive their buffers from it. Shared, so that
/// passing an element on never copies the data.
class ORV_RESMGT_API DevMDStreamBuf : public RCBase<LkCounter<long>> {
public:
    ~DevMDStreamBuf() noexcept(false) override;
};

/// One element of a stream: a buffer, or news about the stream. Passed on as ObjPtr, by one owner
/// to the next.
class ORV_RESMGT_API DevMDStreamElem {
public:
    enum Ev {
        DATA = 0,     ///< A buffer.
        GAP = 1,      ///< Elements were lost here.
        END = 2,      ///< The stream is complete.
        FAILED = 3,   ///< The source cannot go on.
        STOPPED = 4,  ///< The stream was disconnected.
    };

    DevMDStreamElem(RCShdPtr<DevMDStreamBuf> buf, Ev ev) : _buf(std::move(buf)), _ev(ev) {}

    const RCShdPtr<DevMDStreamBuf>& getBuf() const noexcept { return _buf; }  ///< Null if no DATA.
    Ev getEv() const noexcept { return _ev; }

    /// Nothing follows END, FAILED and STOPPED.
    bool isTerminal() const noexcept { return _ev >= END; }

    // Elements travel between threads as requests do, and come from the same pool.
    static void* operator new(std::size_t nbBytes) { return DevAEO::operator new(nbBytes); }
    static void operator delete(void* elem, std::size_t nbBytes) noexcept {
        DevAEO::operator delete(elem, nbBytes);
    }

private:
    RCShdPtr<DevMDStreamBuf> _buf;
    Ev _ev;
};

}  // namespace Orv
