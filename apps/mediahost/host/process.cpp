#include "process.h"

#include <chrono>
#include <csignal>
#include <cstdlib>

namespace MediaHost::Process {

namespace {

constexpr int INTERRUPTED = 130;

volatile std::sig_atomic_t interrupted = 0;

const auto START = std::chrono::steady_clock::now();

extern "C" void takeInterrupt(int number) {
    if (interrupted != 0) std::_Exit(INTERRUPTED);
    interrupted = 1;
    std::signal(number, takeInterrupt);  // some systems forget it after the first
}

}  // namespace

void catchInterrupts() {
    std::signal(SIGINT, takeInterrupt);
    std::signal(SIGTERM, takeInterrupt);
}

bool isInterrupted() {
    return interrupted != 0;
}

double getSecondsSinceStart() {
    return std::chrono::duration<double>(std::chrono::steady_clock::now() - START).count();
}

}  // namespace MediaHost::Process
