#include "mtProcessorsPosix.h"

#include <cerrno>
#include <memory>
#include <sched.h>
#include <unistd.h>
#include <vector>

#include "assertions.h"

namespace Orv {

namespace {

/// A set that may hold more processors than the C library's own.
class Set {
public:
    explicit Set(int capacity) : _bytes(CPU_ALLOC_SIZE(capacity)), _set(CPU_ALLOC(capacity)) {
        if (!_set) throw std::bad_alloc();
        CPU_ZERO_S(_bytes, _set.get());
    }

    bool readProcess() { return ::sched_getaffinity(::getpid(), _bytes, _set.get()) == 0; }
    int apply(pthread_t thread) const {
        return ::pthread_setaffinity_np(thread, _bytes, _set.get());
    }
    void add(int processor) { CPU_SET_S(static_cast<std::size_t>(processor), _bytes, _set.get()); }
    bool has(int processor) const {
        return CPU_ISSET_S(static_cast<std::size_t>(processor), _bytes, _set.get());
    }

private:
    struct Free {
        void operator()(cpu_set_t* set) const { CPU_FREE(set); }
    };
    const std::size_t _bytes;
    const std::unique_ptr<cpu_set_t, Free> _set;
};

constexpr int MOST_PROCESSORS = 1 << 16;

/// The system's numbers of the processors; empty if it does not tell.
std::vector<int> ask() {
    for (int capacity = CPU_SETSIZE; capacity <= MOST_PROCESSORS; capacity *= 2) {
        Set set(capacity);
        if (!set.readProcess()) {
            if (errno != EINVAL) break;  // the set is too small for this machine
            continue;
        }
        std::vector<int> numbers;
        for (int i = 0; i < capacity; ++i) {
            if (set.has(i)) numbers.push_back(i);
        }
        return numbers;
    }
    return {};
}

const std::vector<int>& getAll() {
    static const auto& all = *new std::vector<int>(ask());
    return all;
}

}  // namespace

int MtProcessorsPosix::getNumber() {
    if (!getAll().empty()) return static_cast<int>(getAll().size());
    const long nbOnline = ::sysconf(_SC_NPROCESSORS_ONLN);
    return nbOnline > 0 ? static_cast<int>(nbOnline) : 1;
}

void MtProcessorsPosix::place(pthread_t thread, int number) {
    const std::vector<int>& all = getAll();
    if (all.empty()) return;
    ORV_ASSERT(number < getNumber());
    Set set(all.back() + 1);
    if (number >= 0) {
        set.add(all[static_cast<std::size_t>(number)]);
    } else {
        for (const int processor : all) set.add(processor);
    }
    const int error = set.apply(thread);
    ORV_ASSERT_SYS(error == 0,
                   "::pthread_setaffinity_np( _threadHandle, bytes, &threadAffinity ) == 0", error);
}

}  // namespace Orv
