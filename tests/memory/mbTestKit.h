#pragma once

#include <cstring>
#include <functional>
#include <map>
#include <mutex>
#include <string>
#include <utility>
#include <vector>

#include "mbBuffer.h"
#include "mbBufferImpFactory.h"
#include "mbHeapManager.h"
#include "mbUnloadLRU.h"

namespace Orv {

/// Writes down what the protocol is called for, and does in between what the test wants.
class ScriptedProtocol : public MbProtocol {
public:
    using Hook = std::function<void(void* data, std::uint64_t size, LkAsyncHandle* handle)>;

    /// From now on every call of that name does this.
    void on(const std::string& call, Hook hook) {
        const std::lock_guard guard(_mutex);
        _hooks[call] = std::move(hook);
    }
    void on(const std::string& call, std::function<void()> hook) {
        on(call, [hook](void*, std::uint64_t, LkAsyncHandle*) { hook(); });
    }

    /// The calls so far, separated by blanks; they begin anew.
    std::string takeCalls() {
        const std::lock_guard guard(_mutex);
        return std::exchange(_calls, {});
    }

    void load(void* p, std::uint64_t n) override { call("load", p, n); }
    void asyncLoad(void* p, std::uint64_t n, LkAsyncHandle* h) override {
        call("asyncLoad", p, n, h);
    }
    void asyncLoadSucceeded() override { call("asyncLoadSucceeded"); }
    void asyncLoadFailed() override { call("asyncLoadFailed"); }
    void reload(void* p, std::uint64_t n) override { call("reload", p, n); }
    void asyncReload(void* p, std::uint64_t n, LkAsyncHandle* h) override {
        call("asyncReload", p, n, h);
    }
    void asyncReloadSucceeded() override { call("asyncReloadSucceeded"); }
    void asyncReloadFailed() override { call("asyncReloadFailed"); }
    void unlocked(void* p, std::uint64_t n) override { call("unlocked", p, n); }
    void sync(void* p, std::uint64_t n) override { call("sync", p, n); }
    void asyncSync(void* p, std::uint64_t n, LkAsyncHandle* h) override {
        call("asyncSync", p, n, h);
    }
    void asyncSyncSucceeded() override { call("asyncSyncSucceeded"); }
    void asyncSyncFailed() override { call("asyncSyncFailed"); }
    void unload(void* p, std::uint64_t n) override { call("unload", p, n); }
    void free(void* p, std::uint64_t n) override { call("free", p, n); }
    void markDirty(void* p, std::uint64_t n) override { call("markDirty", p, n); }

private:
    std::mutex _mutex;
    std::map<std::string, Hook> _hooks;
    std::string _calls;

    void call(const std::string& name, void* data = nullptr, std::uint64_t size = 0,
              LkAsyncHandle* handle = nullptr) {
        Hook hook;
        {
            const std::lock_guard guard(_mutex);
            if (!_calls.empty()) _calls += ' ';
            _calls += name;
            const auto found = _hooks.find(name);
            if (found != _hooks.end()) hook = found->second;
        }
        if (hook) hook(data, size, handle);
    }
};

/// A manager with more room than its buffers want, unless a test limits it, that tells what buffers
/// ask of it.
class ScriptedManager : public MbHeapManager {
public:
    static constexpr std::uint64_t PLENTY = 1 << 20;
    using Hook = std::function<void(const char* call, MbBufferImp& buffer)>;

    explicit ScriptedManager(std::uint64_t maxBytes = PLENTY)
        : MbHeapManager("pool", maxBytes, ObjPtr<MbUnloadStrategy>(new MbUnloadLRU(0))) {}

    Hook hook;  // set while no other thread uses the manager

    void allocateRegion(MbBufferImp* buffer) override {
        tell("allocateRegion", buffer);
        MbHeapManager::allocateRegion(buffer);
    }
    void deallocateRegion(MbBufferImp* buffer) override {
        tell("deallocateRegion", buffer);
        MbHeapManager::deallocateRegion(buffer);
    }
    void bufferNotUnloadable(MbBufferImp* buffer) override {
        tell("bufferNotUnloadable", buffer);
        MbHeapManager::bufferNotUnloadable(buffer);
    }
    void bufferUnloadable(MbBufferImp* buffer) override {
        tell("bufferUnloadable", buffer);
        MbHeapManager::bufferUnloadable(buffer);
    }

private:
    void tell(const char* call, MbBufferImp* buffer) {
        if (hook) hook(call, *buffer);
    }
};

/// What a test throws from callbacks.
struct Refusal : std::runtime_error {
    Refusal() : std::runtime_error("refused") {}
};

/// A manager, a protocol and a buffer of them.
struct BufferBench {
    explicit BufferBench(MbInitialState initial = MbInitialState::FREED, bool isTraced = false,
                         std::uint64_t maxBytes = ScriptedManager::PLENTY)
        : manager(new ScriptedManager(maxBytes)), protocol(new ScriptedProtocol) {
        MbBufferImpFactory factory(manager);
        factory.setInitialState(initial);
        factory.setTraced(isTraced);
        buffer = factory.create("B", 64, protocol);
    }

    std::string state() const { return buffer->getStateName(); }
    std::uint64_t bytesInUse() const { return manager->getStatistics().bytesInUse; }

    RCShdPtr<ScriptedManager> manager;
    RCShdPtr<ScriptedProtocol> protocol;
    RCShdEngPtr<MbBufferImp> buffer;
};

}  // namespace Orv
