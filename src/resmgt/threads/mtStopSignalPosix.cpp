#include "mtStopSignalPosix.h"

#include <cerrno>
#include <climits>
#include <linux/futex.h>
#include <sys/syscall.h>
#include <unistd.h>

#include "assertions.h"
#include "lkAddressWaitPosix.h"

namespace Orv {

namespace {

constexpr double LONGEST_WAIT_SECONDS = 1.0;

constinit thread_local std::atomic<std::uint32_t>* receiver = nullptr;

/// The C library gives the stack of a thread to a later one, together with the values of its keys,
/// which a thread that ends in the usual way leaves empty. Only writes to the thread's own memory.
void clearKeys() {
    for (pthread_key_t key = 0; key < PTHREAD_KEYS_MAX; ++key) {
        static_cast<void>(::pthread_setspecific(key, nullptr));
    }
}

void endThread(int, siginfo_t* info, void*) {
    std::atomic<std::uint32_t>* const isEnded = receiver;
    if (info->si_code != SI_QUEUE || info->si_pid != ::getpid()) return;
    if (isEnded == nullptr || info->si_value.sival_ptr != isEnded) return;  // for an earlier thread
    clearKeys();
    isEnded->store(1, std::memory_order_release);
    ::syscall(SYS_futex, isEnded, FUTEX_WAKE_PRIVATE, INT_MAX, nullptr, nullptr, 0);
    for (;;) ::syscall(SYS_exit, 0);
}

/// @return the signal; 0 if all are taken.
int install() {
    for (int signal = SIGRTMAX - 1; signal >= SIGRTMIN; --signal) {
        struct sigaction action{};
        if (::sigaction(signal, nullptr, &action) != 0) continue;
        if ((action.sa_flags & SA_SIGINFO) != 0 || action.sa_handler != SIG_DFL) continue;
        action.sa_sigaction = endThread;
        action.sa_flags = SA_SIGINFO | SA_RESTART | SA_ONSTACK;
        ::sigfillset(&action.sa_mask);
        if (::sigaction(signal, &action, nullptr) == 0) return signal;
    }
    return 0;
}

int getSignal() {
    static const int signal = install();
    return signal;
}

}  // namespace

const sigset_t& MtStopSignalPosix::getBlockedSignals() {
    static const sigset_t blocked = [] {
        sigset_t set;
        ::sigfillset(&set);
        for (const int signal : {SIGSEGV, SIGBUS, SIGFPE, SIGILL, SIGTRAP, SIGSYS, SIGABRT}) {
            ::sigdelset(&set, signal);
        }
        if (getSignal() != 0) ::sigdelset(&set, getSignal());
        return set;
    }();
    return blocked;
}

void MtStopSignalPosix::receive(std::atomic<std::uint32_t>* isEnded) noexcept {
    receiver = isEnded;
}

bool MtStopSignalPosix::send(pthread_t thread, std::atomic<std::uint32_t>& isEnded) {
    ORV_ASSERT_TEXT(getSignal() != 0, "a real-time signal is free");
    sigval value;
    value.sival_ptr = &isEnded;
    const int error = ::pthread_sigqueue(thread, getSignal(), value);
    if (error == ESRCH) return true;  // it has ended by itself
    ORV_ASSERT_SYS(error == 0, "::pthread_sigqueue( _threadHandle, signal, value ) == 0", error);
    const LkTimeLimit limit(LONGEST_WAIT_SECONDS);
    while (isEnded.load(std::memory_order_acquire) == 0) {
        if (!LkAddressWaitPosix::wait(&isEnded, 0, limit)) {
            return isEnded.load(std::memory_order_acquire) != 0;
        }
    }
    return true;
}

}  // namespace Orv
