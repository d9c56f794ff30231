// Thread pools: one task to a pool of one thread, submitted and waited for, when tasks take 1 and 100
// microseconds; and a thousand of the short ones, submitted at once to a pool of two.
#include <benchmark/benchmark.h>
#include <boost/asio/post.hpp>
#include <boost/asio/thread_pool.hpp>
#include <chrono>
#include <condition_variable>
#include <deque>
#include <functional>
#include <mutex>
#include <oneapi/tbb/task_arena.h>
#include <orv/mtTaskPool.h>
#include <semaphore.h>
#include <thread>
#include <vector>

namespace {

using Microseconds = std::chrono::microseconds;

void workFor(Microseconds duration) {
    using Clock = std::chrono::steady_clock;
    const auto end = Clock::now() + duration;
    while (Clock::now() < end) continue;
}

/// How a pool that has no wait of its own tells that its tasks are done.
class Done {
public:
    Done() { ::sem_init(&_sema, 0, 0); }
    ~Done() { ::sem_destroy(&_sema); }
    void expect(int nbTasks) { _nbLeft = nbTasks; }
    void report() {
        if (_nbLeft.fetch_sub(1) == 1) ::sem_post(&_sema);
    }
    void wait() {
        while (::sem_wait(&_sema) != 0) continue;
    }

private:
    ::sem_t _sema;
    std::atomic<int> _nbLeft{0};
};

class TaskPool {
public:
    explicit TaskPool(int nbThreads)
        : _pool("bench", static_cast<unsigned>(nbThreads)),
          _tag(_pool.getRequestMgr().acquireTag()) {
        _pool.start();
    }

    template <class Task>
    void run(int nbTasks, Task task) {
        for (int i = 0; i < nbTasks; ++i) _pool.submit(_tag, task);
        _pool.wait(_tag);
    }

private:
    Orv::MtTaskPool _pool;
    const Orv::MtRequestTag _tag;
};

class AsioPool {
public:
    explicit AsioPool(int nbThreads) : _pool(static_cast<std::size_t>(nbThreads)) {}
    ~AsioPool() { _pool.join(); }

    template <class Task>
    void run(int nbTasks, Task task) {
        _done.expect(nbTasks);
        for (int i = 0; i < nbTasks; ++i) {
            boost::asio::post(_pool, [this, task] {
                task();
                _done.report();
            });
        }
        _done.wait();
    }

private:
    boost::asio::thread_pool _pool;
    Done _done;
};

/// Its threads are the library's own; the caller's does not take part.
class TbbArena {
public:
    explicit TbbArena(int nbThreads) : _arena(nbThreads, 0) {}

    template <class Task>
    void run(int nbTasks, Task task) {
        _done.expect(nbTasks);
        for (int i = 0; i < nbTasks; ++i) {
            _arena.enqueue([this, task] {
                task();
                _done.report();
            });
        }
        _done.wait();
    }

private:
    tbb::task_arena _arena;
    Done _done;
};

/// The textbook: a queue of functions behind a mutex and a condition variable.
class StandardPool {
public:
    explicit StandardPool(int nbThreads) {
        for (int i = 0; i < nbThreads; ++i) _threads.emplace_back([this] { work(); });
    }
    ~StandardPool() {
        {
            const std::lock_guard guard(_mutex);
            _isOver = true;
        }
        _changed.notify_all();
        for (std::thread& thread : _threads) thread.join();
    }

    template <class Task>
    void run(int nbTasks, Task task) {
        _done.expect(nbTasks);
        for (int i = 0; i < nbTasks; ++i) {
            {
                const std::lock_guard guard(_mutex);
                _tasks.emplace_back([this, task] {
                    task();
                    _done.report();
                });
            }
            _changed.notify_one();
        }
        _done.wait();
    }

private:
    std::mutex _mutex;
    std::condition_variable _changed;
    std::deque<std::function<void()>> _tasks;
    bool _isOver = false;
    Done _done;
    std::vector<std::thread> _threads;

    void work() {
        std::unique_lock lock(_mutex);
        for (;;) {
            _changed.wait(lock, [this] { return _isOver || !_tasks.empty(); });
            if (_tasks.empty()) return;
            const std::function<void()> task = std::move(_tasks.front());
            _tasks.pop_front();
            lock.unlock();
            task();
            lock.lock();
        }
    }
};

template <class Pool>
void submitAndWait(benchmark::State& state, int nbThreads, int nbTasks, Microseconds duration) {
    Pool pool(nbThreads);
    const auto task = [duration] { workFor(duration); };
    for (auto _ : state) pool.run(nbTasks, task);
}

template <class Pool>
void registerPeer(const std::string& name) {
    const auto add = [&name](const char* title, int nbThreads, int nbTasks, int microseconds) {
        benchmark::RegisterBenchmark((title + ("/" + name)).c_str(), submitAndWait<Pool>, nbThreads,
                                     nbTasks, Microseconds(microseconds))
            ->UseRealTime();
    };
    add("1 task of 1 us", 1, 1, 1);
    add("1 task of 100 us", 1, 1, 100);
    add("1000 tasks of 1 us", 2, 1000, 1);
}

const bool isRegistered = [] {
    registerPeer<TaskPool>("MtTaskPool");
    registerPeer<AsioPool>("boost::asio::thread_pool");
    registerPeer<TbbArena>("tbb::task_arena");
    registerPeer<StandardPool>("std::thread pool");
    return true;
}();

}  // namespace
