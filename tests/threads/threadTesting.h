#pragma once

#include <condition_variable>
#include <mutex>
#include <utility>

#include "mtThread.h"
#include "mtThreadFactory.h"
#include "mtThreadMgr.h"

#if defined(__has_feature)
#if __has_feature(thread_sanitizer)
#define ORV_TEST_TSAN 1
#endif
#if __has_feature(thread_sanitizer) || __has_feature(address_sanitizer)
#define ORV_TEST_SANITIZED 1
#endif
#endif

namespace Orv {

#if defined(ORV_TEST_SANITIZED)
constexpr bool IS_SANITIZED = true;
#else
constexpr bool IS_SANITIZED = false;
#endif

#if defined(ORV_TEST_TSAN)
constexpr bool IS_THREAD_SANITIZED = true;
#else
constexpr bool IS_THREAD_SANITIZED = false;
#endif

/// A thread that has not been started, with a function for its body.
inline ObjPtr<MtThread> makeThread(const LiString& name, MtThreadFunction::Body body,
                                   bool terminatesOnUnhandled = false, unsigned stackSize = 0) {
    return MtThreadFactory::getInstance().create(name, MtThreadFunction::create(std::move(body)),
                                                 terminatesOnUnhandled, stackSize);
}

/// A body that does what it is told from outside, until it is asked to stop.
class ErrandProtocol : public MtThreadProtocol {
public:
    /// Has the thread do something and waits for it.
    void run(std::function<void()> action) {
        std::unique_lock lock(_mutex);
        _action = std::move(action);
        _changed.notify_all();
        _changed.wait(lock, [&] { return !_action; });
    }

private:
    std::mutex _mutex;
    std::condition_variable _changed;
    std::function<void()> _action;
    bool _isOver = false;

    void performBody(MtThread*) override {
        std::unique_lock lock(_mutex);
        for (;;) {
            _changed.wait(lock, [&] { return _action || _isOver; });
            if (!_action) return;
            _action();
            _action = nullptr;
            _changed.notify_all();
        }
    }

    void performStop(MtThread*) override {
        const std::lock_guard guard(_mutex);
        _isOver = true;
        _changed.notify_all();
    }
};

/// A thread with that body. It runs from its construction to its destruction.
class ErrandThread {
public:
    explicit ErrandThread(const LiString& name = "errand") {
        auto* const protocol = new ErrandProtocol;
        _protocol = protocol;
        _thread = MtThreadFactory::getInstance().create(name, ObjPtr<MtThreadProtocol>(protocol));
        _thread->start();
    }

    MtThread& operator*() const { return *_thread; }
    MtThread* operator->() const { return _thread.get(); }
    void run(std::function<void()> action) const { _protocol->run(std::move(action)); }

private:
    ErrandProtocol* _protocol;
    ObjPtr<MtThread> _thread;
};

}  // namespace Orv
