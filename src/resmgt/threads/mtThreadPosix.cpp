#include "mtThreadPosix.h"

#include <algorithm>
#include <cerrno>
#include <chrono>
#include <cstring>
#include <ctime>
#include <sys/prctl.h>
#include <unistd.h>

#include "assertions.h"
#include "mtProcessorsPosix.h"
#include "mtStopSignalPosix.h"

namespace Orv {

namespace {

constexpr std::size_t SMALLEST_RESERVE = 1 << 20;  // as Windows has it

/// How a thread is to be made.
class Attributes {
public:
    explicit Attributes(unsigned stackSize) {
        int error = ::pthread_attr_init(&_attributes);
        ORV_ASSERT_SYS(error == 0, "::pthread_attr_init( &attributes ) == 0", error);
        error = ::pthread_attr_setstacksize(&_attributes, getReserve(stackSize));
        if (error == 0) {
            error =
                ::pthread_attr_setsigmask_np(&_attributes, &MtStopSignalPosix::getBlockedSignals());
        }
        if (error == 0) return;
        ::pthread_attr_destroy(&_attributes);
        Assertions::throwSysAssertionFailed(
            ORV_FILE, __LINE__, "::pthread_attr_setstacksize( &attributes, _stackSize ) == 0",
            error);
    }
    ~Attributes() { ::pthread_attr_destroy(&_attributes); }

    Attributes(const Attributes&) = delete;
    Attributes& operator=(const Attributes&) = delete;

    const pthread_attr_t* get() const noexcept { return &_attributes; }

private:
    pthread_attr_t _attributes;

    /// The thread's own data and that of the libraries lie on its stack, too.
    static std::size_t getReserve(unsigned stackSize) {
        static const auto pageSize = static_cast<std::size_t>(::sysconf(_SC_PAGESIZE));
        static const auto taken = static_cast<std::size_t>(::sysconf(_SC_THREAD_STACK_MIN));
        const std::size_t size = std::max<std::size_t>(stackSize + taken, SMALLEST_RESERVE);
        return (size + pageSize - 1) / pageSize * pageSize;
    }
};

timespec toDeadline(const LkTimeLimit& limit) {
    using namespace std::chrono;
    const auto time = limit.getDeadline().time_since_epoch();
    const auto whole = duration_cast<seconds>(time);
    return {static_cast<std::time_t>(whole.count()),
            static_cast<long>(duration_cast<nanoseconds>(time - whole).count())};
}

}  // namespace

void* MtThreadPosix::run(void* native) {
    const MtThreadPosix& self = *static_cast<MtThreadPosix*>(native);
    self._entry(self._data);
    return nullptr;
}

void MtThreadPosix::create(unsigned stackSize, Entry entry, void* data) {
    const Attributes attributes(stackSize);
    _entry = entry;
    _data = data;
    _isTerminated.store(0, std::memory_order_relaxed);
    const int error = ::pthread_create(&_created, attributes.get(), run, this);
    ORV_ASSERT_SYS(error == 0,
                   "::pthread_create( &_threadHandle, &attributes, executeCb, this ) == 0", error);
}

void MtThreadPosix::enter() {
    adoptCurrent();
    MtStopSignalPosix::receive(&_isTerminated);
}

void MtThreadPosix::adoptCurrent() {
    _threadHandle = ::pthread_self();
    _id.setCurrentThread();
    _threadId = static_cast<pid_t>(_id.getNum());
    _applied = MtSchedulerPosix::read(_threadId);
}

void MtThreadPosix::detach() noexcept {
    MtStopSignalPosix::receive(nullptr);
    ::pthread_detach(_threadHandle);
}

bool MtThreadPosix::waitForEnd(const LkTimeLimit& limit) {
    int error = 0;
    if (limit.isInfinite()) {
        error = ::pthread_join(_created, nullptr);
    } else {
        const timespec deadline = toDeadline(limit);
        error = ::pthread_clockjoin_np(_created, nullptr, CLOCK_MONOTONIC, &deadline);
        if (error == ETIMEDOUT) return false;
    }
    ORV_ASSERT_SYS(error == 0, "::pthread_join( _threadHandle, nullptr ) == 0", error);
    return true;
}

void MtThreadPosix::release() noexcept {
    _id.reset();
    _threadId = 0;
}

bool MtThreadPosix::terminate() {
    return MtStopSignalPosix::send(_threadHandle, _isTerminated);
}

void MtThreadPosix::setName(const char* name) noexcept {
    ::prctl(PR_SET_NAME, name);  // cuts it to 15 characters
}

bool MtThreadPosix::applyLevel(int level, bool isRealTime) {
    const MtSchedulerPosix::State wanted = MtSchedulerPosix::toState(level, isRealTime);
    _applied = MtSchedulerPosix::apply(_threadId, level, isRealTime, _applied);
    return _applied == wanted;
}

/// The level that was asked for, unless somebody else has changed what came of it.
int MtThreadPosix::readLevel(int requested) const {
    const MtSchedulerPosix::State state = MtSchedulerPosix::read(_threadId);
    if (state == _applied) return requested;
    return MtSchedulerPosix::toLevel(state);
}

bool MtThreadPosix::isRealTime() const {
    return MtSchedulerPosix::read(_threadId).isRealTime;
}

void MtThreadPosix::setProcessor(int number) {
    MtProcessorsPosix::place(_threadHandle, number);
}

}  // namespace Orv
