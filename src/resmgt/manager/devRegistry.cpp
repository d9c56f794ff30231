#include "devRegistry.h"

#include "devNameMap.h"
#include "devPrtclEx.h"
#include "devRegistryDeviceEntry.h"
#include "lkSingleton.h"

namespace Orv {

DevRegistryEntry::DevRegistryEntry(const LiString& name, const LiString& description)
    : _name(name), _description(description) {}

DevRegistryEntry::~DevRegistryEntry() = default;

DevRegistryDeviceEntry::DevRegistryDeviceEntry(const LiString& name, const LiString& description,
                                               Create create)
    : DevRegistryEntry(name, description), _create(std::move(create)) {}

DevRegistryDeviceEntry::~DevRegistryDeviceEntry() = default;

RCShdPtr<DevMDPrtcl> DevRegistryDeviceEntry::createPrtcl() {
    return _create();
}

DevRegistry::~DevRegistry() = default;

class DevRegistryImp : public DevRegistry {
public:
    void addEntry(ObjPtr<DevRegistryEntry> entry) override {
        const LiString name = entry->getName();
        if (isRegistered(name)) throw DevPrtclEx::ExNameNotUnique(ORV_FILE, __LINE__, name);
        _entries.insert(name, std::move(entry));
    }

    bool isRegistered(const LiString& name) override { return _entries.find(name) != nullptr; }
    std::uint32_t getSize() override { return static_cast<std::uint32_t>(_entries.getSize()); }

    ObjPtr<std::vector<LiString>> getNames() override {
        ObjPtr<std::vector<LiString>> names(new std::vector<LiString>);
        for (const auto& [name, entry] : _entries) names->push_back(name);
        return names;
    }

    LiString getEntryDescription(const LiString& name) override {
        return getEntry(name)->getDescription();
    }

    void removeEntry(const LiString& name) override {
        getEntry(name).reset();
        _entries.erase(name);
    }

    RCShdPtr<DevMDPrtcl> createPrtcl(const LiString& name) override {
        return getEntry(name)->createPrtcl();
    }

private:
    friend class LkSingleton<DevRegistryImp>;

    DevNameMap<ObjPtr<DevRegistryEntry>> _entries;

    ObjPtr<DevRegistryEntry>& getEntry(const LiString& name) {
        if (!isRegistered(name)) {
            throw DevPrtclEx::ExNameNotRegistered(ORV_FILE, __LINE__, name);
        }
        return *_entries.find(name);
    }
};

DevRegistry& DevRegistry::getInstance() {
    return LkSingleton<DevRegistryImp>::getInstance();
}

}  // namespace Orv
