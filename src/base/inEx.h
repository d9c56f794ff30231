#pragma once

#include <stdexcept>
#include <string>

#include "exBase.h"

namespace Orv {

/// Errors of package initialisation; each names the packages concerned.
class ORV_BASE_API InEx : public ExBase {
public:
    class ExNameNotUnique;
    class ExMissingPackage;
    class ExDependencyCycle;

protected:
    using ExBase::ExBase;
};

/// Two packages have one tag or one name.
class ORV_BASE_API InEx::ExNameNotUnique
    : public ExConcrete<ExNameNotUnique, InEx, std::logic_error> {
public:
    ExNameNotUnique(const char* file, int line, const std::string& package);
};

/// A package depends on one that is not registered.
class ORV_BASE_API InEx::ExMissingPackage
    : public ExConcrete<ExMissingPackage, InEx, std::logic_error> {
public:
    ExMissingPackage(const char* file, int line, const std::string& package,
                     const std::string& missing);
};

/// Packages depend on each other in a circle.
class ORV_BASE_API InEx::ExDependencyCycle
    : public ExConcrete<ExDependencyCycle, InEx, std::logic_error> {
public:
    /// @param circle  the packages in order, the first one again at the end: "a -> b -> a".
    ExDependencyCycle(const char* file, int line, const std::string& circle);
};

}  // namespace Orv
