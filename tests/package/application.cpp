// What an application does first: starts the packages, catches what the library throws, shuts down.
#include <cstdio>
#include <orv/base.h>
#include <orv/resmgt.h>
#include <stdexcept>
#include <string>

namespace {

class Unknown {};
class Faulty {};
class Application {};

/// The application's own package: it comes up after the whole library.
const Orv::InPlainPackage<Application, Orv::OrvInit::resmgt> applicationPackage("application");

bool catchesAs(const char* name, bool isRight) {
    std::printf("caught as %s: %s\n", name, isRight ? "yes" : "NO");
    return isRight;
}

/// The library throws; the application knows the class by its area, its standard class, its root.
template <class Caught>
bool libraryThrows(const char* name) {
    const std::string expected =
        "Package \"faulty\" depends on package \"Unknown\", which is not registered.";
    const Orv::InPlainPackage<Faulty, Unknown> faulty("faulty");
    try {
        Orv::InPackageInit::initializeAll();
    } catch (const Caught& exception) {
        return catchesAs(name, exception.what() == expected);
    } catch (...) {
    }
    return catchesAs(name, false);
}

}  // namespace

int main() {
    const bool isCaught = libraryThrows<Orv::InEx::ExMissingPackage>("its own class") &
                          libraryThrows<Orv::InEx>("its area") &
                          libraryThrows<Orv::ExBase>("ExBase") &
                          libraryThrows<std::logic_error>("std::logic_error") &
                          libraryThrows<std::exception>("std::exception");
    Orv::InPackageInit::initializeAll();
    std::string names;
    for (const std::string& name : Orv::InPackageInit::getInitializedNames()) names += " " + name;
    std::printf("packages:%s\n", names.c_str());
    const bool isUp = names.starts_with(" base ") && names.ends_with(" resmgt application");
    Orv::InPackageInit::shutdownAll();
    const bool isDown = Orv::InPackageInit::getInitializedNames().empty();
    std::printf(isCaught && isUp && isDown ? "package works\n" : "package FAILS\n");
    return isCaught && isUp && isDown ? 0 : 1;
}
