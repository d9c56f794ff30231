#include "inPackageRegistry.h"

#include <algorithm>
#include <cstring>
#include <exception>

#include "demangle.h"
#include "inEx.h"
#include "sourceFile.h"

namespace Orv {

namespace {

/// "locks" for the tag class Orv::OrvInit::locks.
std::string packageName(const std::type_info& type) {
    const std::string name = demangle(type);
    const std::size_t colons = name.rfind("::");
    return colons == std::string::npos ? name : name.substr(colons + 2);
}

}  // namespace

InPackageRegistry& InPackageRegistry::getInstance() {
    static auto* const registry = new InPackageRegistry;
    return *registry;
}

void InPackageRegistry::add(InPackageInit& package) {
    const std::lock_guard guard(_mutex);
    const auto clashes = [&](const InPackageInit* other) {
        return other->_type == package._type || std::strcmp(other->_name, package._name) == 0;
    };
    if (std::any_of(_packages.begin(), _packages.end(), clashes)) {
        throw InEx::ExNameNotUnique(ORV_FILE, __LINE__, package._name);
    }
    _packages.push_back(&package);
    _isUpToDate.store(false, std::memory_order_relaxed);
}

void InPackageRegistry::remove(InPackageInit& package) noexcept {
    const std::lock_guard guard(_mutex);
    std::erase(_packages, &package);
    std::erase(_initialized, &package);
}

InPackageInit* InPackageRegistry::find(const std::type_info& type) const noexcept {
    const auto found =
        std::find_if(_packages.begin(), _packages.end(),
                     [&](const InPackageInit* package) { return package->_type == type; });
    return found == _packages.end() ? nullptr : *found;
}

/// The packages, each behind those it depends on.
std::vector<InPackageInit*> InPackageRegistry::sort() const {
    std::vector<InPackageInit*> sorted;
    std::vector<const InPackageInit*> path;  // from a package down to the one being looked at

    const auto visit = [&](const auto& self, InPackageInit* package) -> void {
        if (std::find(sorted.begin(), sorted.end(), package) != sorted.end()) return;
        const auto seen = std::find(path.begin(), path.end(), package);
        if (seen != path.end()) {
            std::string circle;
            for (auto member = seen; member != path.end(); ++member) {
                circle.append((*member)->_name).append(" -> ");
            }
            throw InEx::ExDependencyCycle(ORV_FILE, __LINE__, circle + package->_name);
        }
        path.push_back(package);
        for (const std::type_info* type : package->_dependencies) {
            InPackageInit* const needed = find(*type);
            if (needed == nullptr) {
                throw InEx::ExMissingPackage(ORV_FILE, __LINE__, package->_name,
                                             packageName(*type));
            }
            self(self, needed);
        }
        path.pop_back();
        sorted.push_back(package);
    };

    for (InPackageInit* package : _packages) visit(visit, package);
    return sorted;
}

void InPackageRegistry::initializeAll() {
    if (_isUpToDate.load(std::memory_order_acquire)) return;
    const std::lock_guard guard(_mutex);
    if (_state != State::OPEN) return;
    const std::vector<InPackageInit*> sorted = sort();
    _initialized.reserve(sorted.size());

    _state = State::WORKING;
    const std::size_t nbBefore = _initialized.size();
    try {
        for (InPackageInit* package : sorted) {
            if (package->isInitialized()) continue;
            package->performInitialize();
            package->_isInitialized.store(true, std::memory_order_release);
            _initialized.push_back(package);
        }
    } catch (...) {
        std::exception_ptr ignored;
        shutDownTo(nbBefore, ignored);
        _state = State::OPEN;
        throw;
    }
    _state = State::OPEN;
    // A hook may have brought further packages with it; they come up with the next call.
    _isUpToDate.store(_initialized.size() == _packages.size(), std::memory_order_release);
}

void InPackageRegistry::shutdownAll() {
    const std::lock_guard guard(_mutex);
    if (_state != State::OPEN) return;
    _state = State::SHUT_DOWN;
    std::exception_ptr firstError;
    shutDownTo(0, firstError);
    if (firstError) std::rethrow_exception(firstError);
}

std::vector<std::string> InPackageRegistry::getInitializedNames() {
    const std::lock_guard guard(_mutex);
    std::vector<std::string> names;
    names.reserve(_initialized.size());
    for (const InPackageInit* package : _initialized) names.emplace_back(package->getName());
    return names;
}

void InPackageRegistry::shutDownTo(std::size_t nbPackages, std::exception_ptr& firstError) {
    while (_initialized.size() > nbPackages) {
        InPackageInit* const package = _initialized.back();
        _initialized.pop_back();
        try {
            package->performShutdown();
        } catch (...) {
            if (!firstError) firstError = std::current_exception();
        }
        package->_isInitialized.store(false, std::memory_order_release);
    }
}

}  // namespace Orv
