#pragma once

#include <memory>
#include <string>

namespace Orv {

/// Runs one test of this program, by convention a DISABLED_ one, in a process of its own.
class ChildProcess {
public:
    /// @param test  "LkNamedSemaChild.DISABLED_answers"
    /// @param argument  what getArgument() gives there
    ChildProcess(const std::string& test, const std::string& argument);
    ~ChildProcess();  ///< Kills it if it still runs.

    ChildProcess(const ChildProcess&) = delete;
    ChildProcess& operator=(const ChildProcess&) = delete;

    bool join();  ///< Whether the test passed.
    void kill();  ///< Without a chance to clean up; returns when the process is gone.

    static std::string getArgument();  ///< Empty in a process that is no child.

private:
    struct Process;
    std::unique_ptr<Process> _process;  // null once it has ended
};

}  // namespace Orv
