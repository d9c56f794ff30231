#pragma once

#include "mbStateImpPrivate.h"

namespace Orv {

/// The states of a buffer: a class for each, grouped by what they have in common. What each does
/// about events, and where its action leads, stands in MbTransitionTable; the actions stand here.
namespace MbStates {

/// A state without action.
class States : public MbStateImp {
public:
    bool isLoaded() const noexcept override { return false; }
    MbStateId enter(MbBufferImp&) const override { return getRow().next; }
    void exit(MbBufferImp&) const override {}

protected:
    using MbStateImp::MbStateImp;
    using Protocol = MbProtocol;
    using Size = std::uint64_t;
};

/// Loaded and unlocked: the manager may tell the buffer to unload.
class LoadedStates : public States {
public:
    bool isLoaded() const noexcept override { return true; }
    MbStateId enter(MbBufferImp&) const override;
    void exit(MbBufferImp&) const override;

protected:
    using States::States;
};

/// A lock holds the contents in memory. Entered without one, after its release has thrown, the
/// state leads on to Loaded: nobody would come to unlock the buffer.
class LockedStates : public States {
public:
    bool isLoaded() const noexcept override { return true; }
    MbStateId enter(MbBufferImp&) const override;

protected:
    using States::States;
};

/// A thread is at it, with the mutex released, and leads on when it is done.
class TransientStates : public States {
protected:
    using States::States;
};

/// Asks for memory and has it filled for a lock.
class LoadingStates : public TransientStates {
public:
    MbStateId enter(MbBufferImp&) const override;

protected:
    using TransientStates::TransientStates;

private:
    virtual void fill(Protocol&, void* data, Size) const = 0;
    virtual void count(MbBufferImp&) const = 0;
};

/// Has the protocol start an asynchronous operation.
class BeingAsyncStates : public TransientStates {
public:
    MbStateId enter(MbBufferImp&) const override;

protected:
    using TransientStates::TransientStates;

private:
    virtual void start(Protocol&, void* data, Size, LkAsyncHandle*) const = 0;
};

/// The same, with memory that is asked for first.
class BeingAsyncFilledStates : public BeingAsyncStates {
public:
    MbStateId enter(MbBufferImp&) const override;

protected:
    using BeingAsyncStates::BeingAsyncStates;

private:
    virtual MbStateId getOrigin() const noexcept = 0;
};

/// The protocol is to report the end of an asynchronous operation. Entered when it is over, after
/// telling its end has thrown, the state leads on as if the operation had failed: nobody would come
/// to report.
class WaitAsyncStates : public States {
public:
    MbStateId enter(MbBufferImp&) const override;

protected:
    using States::States;
};

/// Tells the protocol how an asynchronous operation has ended. One that was to bring contents and
/// failed gives its memory back.
class CompletionStates : public TransientStates {
public:
    MbStateId enter(MbBufferImp&) const override;

protected:
    using TransientStates::TransientStates;

private:
    virtual void tell(Protocol&) const = 0;
    virtual void count(MbBufferImp&) const {}
};

/// Has the contents let go, then gives the memory back.
class LettingGoStates : public TransientStates {
public:
    MbStateId enter(MbBufferImp&) const override;

protected:
    using TransientStates::TransientStates;

private:
    virtual void letGo(Protocol&, void* data, Size) const = 0;
    virtual void count(MbBufferImp&) const {}
};

// Stable states

class Freed : public States {
public:
    Freed() noexcept : States(MbStateId::Freed) {}
};

class Unloaded : public States {
public:
    Unloaded() noexcept : States(MbStateId::Unloaded) {}
};

class Loaded : public LoadedStates {
public:
    Loaded() noexcept : LoadedStates(MbStateId::Loaded) {}
};

class Synched : public LoadedStates {
public:
    Synched() noexcept : LoadedStates(MbStateId::Synched) {}
};

class RdLocked : public LockedStates {
public:
    RdLocked() noexcept : LockedStates(MbStateId::RdLocked) {}
    MbStateId enter(MbBufferImp&) const override;
};

class WrLocked : public LockedStates {
public:
    WrLocked() noexcept : LockedStates(MbStateId::WrLocked) {}
    MbStateId enter(MbBufferImp&) const override;
};

class RdLockedFreed : public LockedStates {
public:
    RdLockedFreed() noexcept : LockedStates(MbStateId::RdLockedFreed) {}
};

class WrLockedFreed : public LockedStates {
public:
    WrLockedFreed() noexcept : LockedStates(MbStateId::WrLockedFreed) {}
};

class Destroyed : public States {
public:
    Destroyed() noexcept : States(MbStateId::Destroyed) {}
    MbStateId enter(MbBufferImp&) const override;
};

// Transient states

class BeingRdLoaded : public LoadingStates {
public:
    BeingRdLoaded() noexcept : LoadingStates(MbStateId::BeingRdLoaded) {}

private:
    void fill(Protocol& p, void* data, Size size) const override { p.load(data, size); }
    void count(MbBufferImp& buffer) const override { countLoad(buffer); }
};

class BeingWrLoaded : public LoadingStates {
public:
    BeingWrLoaded() noexcept : LoadingStates(MbStateId::BeingWrLoaded) {}

private:
    void fill(Protocol& p, void* data, Size size) const override { p.load(data, size); }
    void count(MbBufferImp& buffer) const override { countLoad(buffer); }
};

class BeingRdReloaded : public LoadingStates {
public:
    BeingRdReloaded() noexcept : LoadingStates(MbStateId::BeingRdReloaded) {}

private:
    void fill(Protocol& p, void* data, Size size) const override { p.reload(data, size); }
    void count(MbBufferImp& buffer) const override { countReload(buffer); }
};

class BeingWrReloaded : public LoadingStates {
public:
    BeingWrReloaded() noexcept : LoadingStates(MbStateId::BeingWrReloaded) {}

private:
    void fill(Protocol& p, void* data, Size size) const override { p.reload(data, size); }
    void count(MbBufferImp& buffer) const override { countReload(buffer); }
};

class BeingAsyncLoaded : public BeingAsyncFilledStates {
public:
    BeingAsyncLoaded() noexcept : BeingAsyncFilledStates(MbStateId::BeingAsyncLoaded) {}

private:
    void start(Protocol& p, void* data, Size size, LkAsyncHandle* handle) const override {
        p.asyncLoad(data, size, handle);
    }
    MbStateId getOrigin() const noexcept override { return MbStateId::Freed; }
};

class BeingAsyncReloaded : public BeingAsyncFilledStates {
public:
    BeingAsyncReloaded() noexcept : BeingAsyncFilledStates(MbStateId::BeingAsyncReloaded) {}

private:
    void start(Protocol& p, void* data, Size size, LkAsyncHandle* handle) const override {
        p.asyncReload(data, size, handle);
    }
    MbStateId getOrigin() const noexcept override { return MbStateId::Unloaded; }
};

class BeingAsyncSynched : public BeingAsyncStates {
public:
    BeingAsyncSynched() noexcept : BeingAsyncStates(MbStateId::BeingAsyncSynched) {}

private:
    void start(Protocol& p, void* data, Size size, LkAsyncHandle* handle) const override {
        p.asyncSync(data, size, handle);
    }
};

class BeingSynched : public TransientStates {
public:
    BeingSynched() noexcept : TransientStates(MbStateId::BeingSynched) {}
    MbStateId enter(MbBufferImp&) const override;
};

class BeingUnlocked : public TransientStates {
public:
    BeingUnlocked() noexcept : TransientStates(MbStateId::BeingUnlocked) {}
    MbStateId enter(MbBufferImp&) const override;
};

class BeingUnloaded : public LettingGoStates {
public:
    BeingUnloaded() noexcept : LettingGoStates(MbStateId::BeingUnloaded) {}

private:
    void letGo(Protocol& p, void* data, Size size) const override { p.unload(data, size); }
    void count(MbBufferImp& buffer) const override { countEviction(buffer); }
};

class BeingFreed : public LettingGoStates {
public:
    BeingFreed() noexcept : LettingGoStates(MbStateId::BeingFreed) {}

private:
    void letGo(Protocol& p, void* data, Size size) const override { p.free(data, size); }
};

class BeingDestroyed : public TransientStates {
public:
    BeingDestroyed() noexcept : TransientStates(MbStateId::BeingDestroyed) {}
    MbStateId enter(MbBufferImp&) const override;
};

// Asynchronous operations

class WaitAsyncLoaded : public WaitAsyncStates {
public:
    WaitAsyncLoaded() noexcept : WaitAsyncStates(MbStateId::WaitAsyncLoaded) {}
};

class WaitAsyncReloaded : public WaitAsyncStates {
public:
    WaitAsyncReloaded() noexcept : WaitAsyncStates(MbStateId::WaitAsyncReloaded) {}
};

class WaitAsyncSynched : public WaitAsyncStates {
public:
    WaitAsyncSynched() noexcept : WaitAsyncStates(MbStateId::WaitAsyncSynched) {}
};

class AsyncLoadSucceeded : public CompletionStates {
public:
    AsyncLoadSucceeded() noexcept : CompletionStates(MbStateId::AsyncLoadSucceeded) {}

private:
    void tell(Protocol& p) const override { p.asyncLoadSucceeded(); }
    void count(MbBufferImp& buffer) const override { countLoad(buffer); }
};

class AsyncLoadFailed : public CompletionStates {
public:
    AsyncLoadFailed() noexcept : CompletionStates(MbStateId::AsyncLoadFailed) {}

private:
    void tell(Protocol& p) const override { p.asyncLoadFailed(); }
};

class AsyncReloadSucceeded : public CompletionStates {
public:
    AsyncReloadSucceeded() noexcept : CompletionStates(MbStateId::AsyncReloadSucceeded) {}

private:
    void tell(Protocol& p) const override { p.asyncReloadSucceeded(); }
    void count(MbBufferImp& buffer) const override { countReload(buffer); }
};

class AsyncReloadFailed : public CompletionStates {
public:
    AsyncReloadFailed() noexcept : CompletionStates(MbStateId::AsyncReloadFailed) {}

private:
    void tell(Protocol& p) const override { p.asyncReloadFailed(); }
};

class AsyncSyncSucceeded : public CompletionStates {
public:
    AsyncSyncSucceeded() noexcept : CompletionStates(MbStateId::AsyncSyncSucceeded) {}

private:
    void tell(Protocol& p) const override { p.asyncSyncSucceeded(); }
};

class AsyncSyncFailed : public CompletionStates {
public:
    AsyncSyncFailed() noexcept : CompletionStates(MbStateId::AsyncSyncFailed) {}

private:
    void tell(Protocol& p) const override { p.asyncSyncFailed(); }
};

}  // namespace MbStates

}  // namespace Orv
