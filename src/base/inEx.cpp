#include "inEx.h"

namespace Orv {

InEx::ExNameNotUnique::ExNameNotUnique(const char* file, int line, const std::string& package)
    : ExConcrete(file, line) {
    setReason("Package \"" + package + "\" is registered already.");
}

InEx::ExMissingPackage::ExMissingPackage(const char* file, int line, const std::string& package,
                                         const std::string& missing)
    : ExConcrete(file, line) {
    setReason("Package \"" + package + "\" depends on package \"" + missing +
              "\", which is not registered.");
}

InEx::ExDependencyCycle::ExDependencyCycle(const char* file, int line, const std::string& circle)
    : ExConcrete(file, line) {
    setReason("Packages depend on each other in a circle: " + circle + ".");
}

}  // namespace Orv
