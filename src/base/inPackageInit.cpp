#include "inPackageInit.h"

#include "inPackageRegistry.h"

namespace Orv {

InPackageInit::InPackageInit(const char* name, const std::type_info& type)
    : _name(name), _type(type) {}

InPackageInit::~InPackageInit() {
    InPackageRegistry::getInstance().remove(*this);
}

void InPackageInit::registerPackage() {
    InPackageRegistry::getInstance().add(*this);
}

void InPackageInit::addDependency(const std::type_info& type) {
    _dependencies.push_back(&type);
}

void InPackageInit::initializeAll() {
    InPackageRegistry::getInstance().initializeAll();
}

void InPackageInit::shutdownAll() {
    InPackageRegistry::getInstance().shutdownAll();
}

std::vector<std::string> InPackageInit::getInitializedNames() {
    return InPackageRegistry::getInstance().getInitializedNames();
}

}  // namespace Orv
