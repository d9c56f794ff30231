#pragma once

#include <atomic>
#include <mutex>
#include <string>
#include <vector>

#include "inPackageInit.h"
#include "threadSafety.h"

namespace Orv {

/// All packages of the process and the order in which they come up. Never destroyed.
class InPackageRegistry {
public:
    static InPackageRegistry& getInstance();

    void add(InPackageInit& package);
    void remove(InPackageInit& package) noexcept;
    void initializeAll();
    void shutdownAll();
    std::vector<std::string> getInitializedNames();

private:
    enum class State { OPEN, WORKING, SHUT_DOWN };

    // Recursive: a hook may ask for what it is part of. Held while hooks run, so that whoever asks
    // meanwhile returns when all packages are up.
    std::recursive_mutex _mutex;
    std::vector<InPackageInit*> _packages;     // in order of registration
    std::vector<InPackageInit*> _initialized;  // in the order they came up
    std::atomic<bool> _isUpToDate{false};
    State _state = State::OPEN;

    InPackageInit* find(const std::type_info& type) const noexcept;
    std::vector<InPackageInit*> sort() const;
    void shutDownTo(std::size_t nbPackages, std::exception_ptr& firstError);
};

}  // namespace Orv
