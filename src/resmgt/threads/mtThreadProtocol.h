#pragma once

#include <functional>
#include <utility>

#include "objPtr.h"
#include "resmgtApi.h"

namespace Orv {

class MtThread;

/// What a thread does: its body, and what is to happen when it is stopped.
///
/// The thread owns its protocol, from construction until it goes. For a body that is a function
/// take MtThreadFunction.
///
/// - Threads: performBody() and performFinished() run on the thread itself, all others on the one
///   that makes, stops, cancels or destroys it. No lock of the thread is held in any of them.
class ORV_RESMGT_API MtThreadProtocol {
public:
    virtual ~MtThreadProtocol() noexcept(false) = default;  // a member may assert in its own

    /// The thread has taken the protocol; it does not run yet.
    virtual void performAttach(MtThread*) {}

    /// The thread gives the protocol back, before it destroys it. What this throws is traced.
    virtual void performDetach(MtThread*) {}

    /// The body. What it throws, of any type, is thrown again by MtThread::join().
    virtual void performBody(MtThread*) = 0;

    /// The body has ended, in whatever way. What this throws counts as the body's.
    virtual void performFinished(MtThread*) {}

    /// The thread is asked to stop: see to it that the body ends, and do not wait for it. May come
    /// at any time, more than once and from several threads. By default requests cancellation.
    virtual void performStop(MtThread*);

    /// Cancellation was requested, for a body that has to be woken for it, or the thread was ended
    /// by force.
    virtual void performCanceled(MtThread*) {}

protected:
    MtThreadProtocol() = default;
    MtThreadProtocol(const MtThreadProtocol&) = default;
    MtThreadProtocol& operator=(const MtThreadProtocol&) = default;
};

/// A protocol whose body is a function:
/// `factory.create("decoder", MtThreadFunction::create([] { decode(); }))`.
class ORV_RESMGT_API MtThreadFunction : public MtThreadProtocol {
public:
    using Body = std::function<void(MtThread&)>;

    static ObjPtrRet<MtThreadProtocol> create(Body body);
    static ObjPtrRet<MtThreadProtocol> create(std::function<void()> body);

    explicit MtThreadFunction(Body body) : _body(std::move(body)) {}
    void performBody(MtThread*) override;

private:
    Body _body;
};

}  // namespace Orv
