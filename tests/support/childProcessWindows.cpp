#include <gtest/gtest.h>
#include <windows.h>

#include "childProcess.h"

namespace Orv {

struct ChildProcess::Process {
    HANDLE handle;
};

ChildProcess::ChildProcess(const std::string& test, const std::string& argument)
    : _process(std::make_unique<Process>()) {
    char program[MAX_PATH];
    ::GetModuleFileNameA(nullptr, program, sizeof program);
    std::string command = std::string("\"") + program + "\" --gtest_filter=" + test +
                          " --gtest_also_run_disabled_tests";
    STARTUPINFOA start{};
    start.cb = sizeof start;
    PROCESS_INFORMATION information{};
    ::SetEnvironmentVariableA("ORV_TEST_ARGUMENT", argument.c_str());
    const BOOL isStarted = ::CreateProcessA(program, command.data(), nullptr, nullptr, FALSE, 0,
                                            nullptr, nullptr, &start, &information);
    ::SetEnvironmentVariableA("ORV_TEST_ARGUMENT", nullptr);
    if (!isStarted) {
        ADD_FAILURE() << "CreateProcess: error " << ::GetLastError();
        _process.reset();
        return;
    }
    ::CloseHandle(information.hThread);
    _process->handle = information.hProcess;
}

ChildProcess::~ChildProcess() {
    kill();
}

bool ChildProcess::join() {
    if (!_process) return false;
    DWORD code = 1;
    ::WaitForSingleObject(_process->handle, INFINITE);
    ::GetExitCodeProcess(_process->handle, &code);
    ::CloseHandle(_process->handle);
    _process.reset();
    return code == 0;
}

void ChildProcess::kill() {
    if (!_process) return;
    ::TerminateProcess(_process->handle, 1);
    join();
}

std::string ChildProcess::getArgument() {
    char argument[1024] = "";
    ::GetEnvironmentVariableA("ORV_TEST_ARGUMENT", argument, sizeof argument);
    return argument;
}

}  // namespace Orv
