#include <csignal>
#include <cstdlib>
#include <gtest/gtest.h>
#include <spawn.h>
#include <sys/wait.h>
#include <unistd.h>

#include "childProcess.h"

namespace Orv {

struct ChildProcess::Process {
    pid_t id;
};

ChildProcess::ChildProcess(const std::string& test, const std::string& argument)
    : _process(std::make_unique<Process>()) {
    ::setenv("ORV_TEST_ARGUMENT", argument.c_str(), 1);
    std::string filter = "--gtest_filter=" + test;
    char program[] = "/proc/self/exe";
    char all[] = "--gtest_also_run_disabled_tests";
    char* arguments[] = {program, filter.data(), all, nullptr};
    const int error = ::posix_spawn(&_process->id, program, nullptr, nullptr, arguments, ::environ);
    ::unsetenv("ORV_TEST_ARGUMENT");
    if (error != 0) {
        ADD_FAILURE() << "posix_spawn: error " << error;
        _process.reset();
    }
}

ChildProcess::~ChildProcess() {
    kill();
}

bool ChildProcess::join() {
    if (!_process) return false;
    int status = 0;
    while (::waitpid(_process->id, &status, 0) < 0 && errno == EINTR) continue;
    _process.reset();
    return WIFEXITED(status) && WEXITSTATUS(status) == 0;
}

void ChildProcess::kill() {
    if (!_process) return;
    ::kill(_process->id, SIGKILL);
    join();
}

std::string ChildProcess::getArgument() {
    const char* const argument = std::getenv("ORV_TEST_ARGUMENT");
    return argument != nullptr ? argument : "";
}

}  // namespace Orv
