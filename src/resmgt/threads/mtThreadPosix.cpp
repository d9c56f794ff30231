#include "mtThreadPosix.h"

#include <algorithm>
#include <cerrno>
#include <chrono>
#include <sys/prctl.h>
#include <thread>
#include <unistd.h>

#include "assertions.h"
#include "lkAddressWaitPosix.h"
#include "mtProcessorsPosix.h"

namespace Orv {

namespace {

constexpr std::size_t SMALLEST_RESERVE = 1 << 20;  // as Windows has it
constexpr std::chrono::microseconds LONGEST_PAUSE(1000);

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
    _progress = RUNS;
    const int error = ::pthread_create(&_created, attributes.get(), run, this);
    ORV_ASSERT_SYS(error == 0,
                   "::pthread_create( &_threadHandle, &attributes, executeCb, this ) == 0", error);
}

void MtThreadPosix::enter() {
    adoptCurrent();
    MtStopSignalPosix::receive(&_stopOrder);
}

void MtThreadPosix::leave() noexcept {
    if (_progress.exchange(LEAVES) == IS_WATCHED) LkAddressWaitPosix::wakeAll(&_progress);
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
    if (!limit.isInfinite()) return waitUntil(limit);
    const int error = ::pthread_join(_created, nullptr);
    ORV_ASSERT_SYS(error == 0, "::pthread_join( _threadHandle, nullptr ) == 0", error);
    return true;
}

/// The C library's own join with a time limit goes by the wall clock, or past the sanitizers. When
/// the thread leaves there is little left of it, and that is looked at again and again.
bool MtThreadPosix::waitUntil(const LkTimeLimit& limit) {
    for (std::uint32_t progress = RUNS; progress != LEAVES; progress = _progress) {
        if (progress == RUNS && !_progress.compare_exchange_strong(progress, IS_WATCHED)) continue;
        if (!LkAddressWaitPosix::wait(&_progress, IS_WATCHED, limit)) break;
    }
    for (std::chrono::microseconds pause(20);; pause = std::min(2 * pause, LONGEST_PAUSE)) {
        const int error = ::pthread_tryjoin_np(_created, nullptr);
        if (error == 0) return true;
        ORV_ASSERT_SYS(error == EBUSY, "::pthread_tryjoin_np( _threadHandle, nullptr ) == 0",
                       error);
        if (limit.getRemainingMilliseconds() == 0) return false;
        std::this_thread::sleep_for(pause);
    }
}

void MtThreadPosix::release() noexcept {
    _id.reset();
    _threadId = 0;
}

bool MtThreadPosix::terminate() {
    if (!MtStopSignalPosix::send(_threadHandle, _stopOrder)) return false;
    leave();
    return true;
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
