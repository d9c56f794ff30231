#pragma once

#include <atomic>
#include <string>
#include <typeinfo>
#include <vector>

#include "baseApi.h"
#include "inInit.h"

namespace Orv {

/// One package of a library: a part with its own start-up and shutdown, and the packages it needs.
///
/// A package is one static object of a derived class, whose constructor calls registerPackage() and
/// then addDependency() once for each package it needs. initializeAll() runs the hooks, a package
/// after all it depends on and else in order of registration; shutdownAll() in the reverse order.
///
/// - Threads: register during static initialisation; initializeAll() and shutdownAll() by any
///   thread. A hook runs on the thread that asked first, while the others wait: it must not itself
///   wait for a thread that asks.
class ORV_BASE_API InPackageInit {
public:
    InPackageInit(const InPackageInit&) = delete;
    InPackageInit& operator=(const InPackageInit&) = delete;

    const char* getName() const noexcept { return _name; }
    bool isInitialized() const noexcept { return _isInitialized.load(std::memory_order_acquire); }

    /// Brings every registered package up that is not up yet. At once when all are, when called by
    /// a hook, and after shutdownAll(), from which nothing leads back.
    /// @throws InEx::ExMissingPackage, InEx::ExDependencyCycle before any hook has run, and what a
    ///   hook throws, after the packages that this call had brought up were shut down again.
    static void initializeAll();

    /// Shuts every package down, the dependent ones first. A hook that throws keeps no other from
    /// running; the first exception is thrown at the end.
    static void shutdownAll();

    /// Names of the packages that are up, in the order they came up.
    static std::vector<std::string> getInitializedNames();

protected:
    /// @param name  borrowed for ever.
    /// @param type  identity of the package, InInit<Tag>::getType().
    InPackageInit(const char* name, const std::type_info& type);

    /// Takes the package out of the registry, so that a library may be unloaded before it was used.
    virtual ~InPackageInit();

    /// @throws InEx::ExNameNotUnique
    void registerPackage();

    void addDependency(const std::type_info& type);

    virtual void performInitialize() {}
    virtual void performShutdown() {}

private:
    friend class InPackageRegistry;

    const char* _name;
    const std::type_info& _type;
    std::vector<const std::type_info*> _dependencies;  // in order of addition
    std::atomic<bool> _isInitialized{false};
};

/// A package that has only a name and dependencies.
template <class Tag, class... Dependencies>
class InPlainPackage : public InPackageInit {
public:
    explicit InPlainPackage(const char* name) : InPackageInit(name, InInit<Tag>::getType()) {
        registerPackage();
        (addDependency(InInit<Dependencies>::getType()), ...);
    }
};

}  // namespace Orv
