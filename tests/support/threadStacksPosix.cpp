#include <atomic>
#include <chrono>
#include <cstdio>
#include <dlfcn.h>
#include <execinfo.h>
#include <filesystem>
#include <fstream>
#include <set>
#include <signal.h>
#include <sstream>
#include <string>
#include <sys/syscall.h>
#include <thread>
#include <unistd.h>
#include <vector>

#include "threadStacks.h"

namespace Orv {

namespace {

// One of the signals that a program raises in itself: threads that block signals from outside, and
// sanitizers that put them off, still take it at once.
constexpr int STACK_SIGNAL = SIGTRAP;

void* frames[128];
std::atomic<int> nbFrames{0};
std::set<int> foreignThreads;

std::vector<int> listOtherThreads() {
    std::vector<int> ids;
    for (const auto& task : std::filesystem::directory_iterator("/proc/self/task")) {
        const int id = std::stoi(task.path().filename().string());
        if (id != gettid() && !foreignThreads.contains(id)) ids.push_back(id);
    }
    return ids;
}

void catchStack(int) {
    nbFrames = backtrace(frames, 128);
}

/// The thread's calls, in `frames`; 0 if it does not answer.
int collectStack(int threadId) {
    nbFrames = 0;
    syscall(SYS_tgkill, getpid(), threadId, STACK_SIGNAL);
    for (int i = 0; i < 1000 && nbFrames == 0; ++i) {
        std::this_thread::sleep_for(std::chrono::milliseconds(1));
    }
    return nbFrames;
}

/// Writes a run of frames of one module as "function at file:line".
void writeFrames(const char* module, const std::string& offsets, int first, int last) {
    std::fflush(stderr);
    const std::string command = "addr2line -Cpfs -e '" + std::string(module) + "'" + offsets +
                                " 2>/dev/null | sed 's/^/    /' >&2";
    if (std::system(command.c_str()) != 0) {
        backtrace_symbols_fd(frames + first, last - first, STDERR_FILENO);
    }
}

void writeStack(int nb) {
    std::string module, offsets;
    int first = 2;  // past the signal's own frames
    for (int i = first; i < nb; ++i) {
        Dl_info info{};
        if (dladdr(frames[i], &info) == 0) continue;
        if (module != info.dli_fname) {
            if (!offsets.empty()) writeFrames(module.c_str(), offsets, first, i);
            module = info.dli_fname;
            offsets.clear();
            first = i;
        }
        // One back from the return address is inside the call.
        std::ostringstream offset;
        offset << " 0x" << std::hex
               << static_cast<char*>(frames[i]) - static_cast<char*>(info.dli_fbase) - 1;
        offsets += offset.str();
    }
    if (!offsets.empty()) writeFrames(module.c_str(), offsets, first, nb);
}

}  // namespace

void prepareThreadStacks() {
    std::thread([] {}).join();  // with the first thread a sanitizer starts its own
    for (const int id : listOtherThreads()) foreignThreads.insert(id);
}

void writeThreadStacks() {
    void* warmUp[1];
    backtrace(warmUp, 1);  // loads what the signal handler must not
    struct sigaction action{};
    action.sa_handler = catchStack;
    sigaction(STACK_SIGNAL, &action, nullptr);
    alarm(60);  // should even this hang

    for (const int id : listOtherThreads()) {
        std::string name;
        std::getline(std::ifstream("/proc/self/task/" + std::to_string(id) + "/comm"), name);
        const int nb = collectStack(id);
        std::fprintf(stderr, "  thread %d \"%s\"%s\n", id, name.c_str(),
                     nb == 0 ? " does not answer" : "");
        writeStack(nb);
    }
}

}  // namespace Orv
