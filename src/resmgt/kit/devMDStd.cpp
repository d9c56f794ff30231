#include <algorithm>

#include "devMDAccessPrtcl.h"
#include "devMDProperty.h"
#include "devMDPropertyPrtcl.h"
#include "devMDStdProperty.h"
#include "devMDStdPropertyPrtcl.h"
#include "devPrtclEx.h"

namespace Orv {

DevMDPrtcl::~DevMDPrtcl() noexcept(false) = default;
DevMDAccessPrtcl::~DevMDAccessPrtcl() noexcept(false) = default;
DevMDPropertyPrtcl::~DevMDPropertyPrtcl() noexcept(false) = default;
DevMDPropertySet::~DevMDPropertySet() noexcept(false) = default;
DevMDPropertyAny::~DevMDPropertyAny() noexcept(false) = default;
DevMDPropertyDescriptorAny::~DevMDPropertyDescriptorAny() noexcept(false) = default;
DevMDPropertyAEO::~DevMDPropertyAEO() = default;

void DevMDPropertyAEO::performExecute() {
    propertyChanged(ALL);
}

RCShdPtr<DevMDPropertyDescriptorAny> DevMDPropertyAny::getDescriptor() const {
    return nullptr;
}

// --- property sets ---

namespace {

template <class Items>
auto findByName(const Items& items, const LiString& name) {
    return std::find_if(items.begin(), items.end(),
                        [&](const auto& item) { return item->getName() == name; });
}

}  // namespace

DevMDStdPropertySet::DevMDStdPropertySet(const LiString& name, const LiString& description)
    : _name(name), _description(description) {}

DevMDStdPropertySetBuilder::DevMDStdPropertySetBuilder(
    Vector<RCShdPtr<DevMDPropertySet>>& topSets, Vector<RCShdPtr<DevMDPropertyAny>>& topProperties,
    int& nbActiveBuilders)
    : _topSets(topSets), _topProperties(topProperties), _nbActiveBuilders(&nbActiveBuilders) {
    ++*_nbActiveBuilders;
}

DevMDStdPropertySetBuilder::~DevMDStdPropertySetBuilder() {
    --*_nbActiveBuilders;
}

Vector<RCShdPtr<DevMDPropertyAny>>& DevMDStdPropertySetBuilder::getCurrentProperties() {
    return _open.empty() ? _topProperties : _open.back()->getProperties();
}

Vector<RCShdPtr<DevMDPropertySet>>& DevMDStdPropertySetBuilder::getCurrentSets() {
    return _open.empty() ? _topSets : _open.back()->getPropertySets();
}

void DevMDStdPropertySetBuilder::pushSet(const LiString& name, const LiString& description) {
    Vector<RCShdPtr<DevMDPropertySet>>& sets = getCurrentSets();
    const auto found = findByName(sets, name);
    if (found != sets.end()) {
        _open.push_back(RCShdPtr<DevMDStdPropertySet>::dynamicCast(*found));
        return;
    }
    const RCShdPtr<DevMDStdPropertySet> set(new DevMDStdPropertySet(name, description));
    sets.push_back(set);
    _open.push_back(set);
}

void DevMDStdPropertySetBuilder::popSet() {
    if (_open.empty()) throw DevPrtclEx::ExMDStdPropertySetBuilderPop(ORV_FILE, __LINE__);
    _open.pop_back();
}

void DevMDStdPropertySetBuilder::addProperty(RCShdPtr<DevMDPropertyAny> property) {
    const LiString name = property->getName();
    Vector<RCShdPtr<DevMDPropertyAny>>& properties = getCurrentProperties();
    if (findByName(properties, name) != properties.end()) {
        throw DevPrtclEx::ExNameNotUnique(ORV_FILE, __LINE__);
    }
    properties.push_back(std::move(property));
}

LiString DevMDStdPropertySetBuilder::getCurrentSetName() {
    return _open.empty() ? LiString() : _open.back()->getName();
}

DevMDPropertySet::Properties DevMDStdPropertySetBuilder::getCurrentPropertyIter() {
    return Properties::over(getCurrentProperties());
}

DevMDPropertySet::Sets DevMDStdPropertySetBuilder::getCurrentPropertySetIter() {
    return Sets::over(getCurrentSets());
}

// --- the property protocol ---

DevMDStdPropertyPrtcl::DevMDStdPropertyPrtcl(const LiString& name) : _name(name) {}

ObjPtrRet<DevMDStdPropertySetBuilder> DevMDStdPropertyPrtcl::getPropertySetBuilder() {
    if (_isBeingRead.load(std::memory_order_acquire)) {
        throw DevPrtclEx::ExMDStdPropertiesWriteUnavail(ORV_FILE, __LINE__, _name.getChars());
    }
    return ObjPtrRet<DevMDStdPropertySetBuilder>(
        new DevMDStdPropertySetBuilder(_sets, _properties, _nbActiveBuilders));
}

void DevMDStdPropertyPrtcl::startReading(const char* what) {
    if (_isBeingRead.load(std::memory_order_acquire)) return;
    if (_nbActiveBuilders > 0) {
        throw DevPrtclEx::ExMDStdPropertiesReadUnavail(ORV_FILE, __LINE__, _name.getChars(), what);
    }
    _isBeingRead.store(true, std::memory_order_release);
}

DevMDPropertySet::Properties DevMDStdPropertyPrtcl::getPropertyIter() {
    startReading("properties");
    return Properties::over(_properties);
}

DevMDPropertySet::Properties DevMDStdPropertyPrtcl::getPropertyIterEnd() {
    startReading("properties");
    return Properties::over(_properties).end();
}

DevMDPropertySet::Sets DevMDStdPropertyPrtcl::getPropertySetIter() {
    startReading("property sets");
    return Sets::over(_sets);
}

DevMDPropertySet::Sets DevMDStdPropertyPrtcl::getPropertySetIterEnd() {
    startReading("property sets");
    return Sets::over(_sets).end();
}

}  // namespace Orv
