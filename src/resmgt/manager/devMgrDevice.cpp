#include <algorithm>

#include "assertions.h"
#include "devMDAccessPrtcl.h"
#include "devMDPropertyPrtcl.h"
#include "devMgrDevicePrivate.h"
#include "devMgrEx.h"
#include "devMgrPropertyParser.h"
#include "devRegistry.h"

namespace Orv {

void DevMgrDevice::open() {
    try {
        const RCShdPtr<DevMDPrtcl> prtcl = DevRegistry::getInstance().createPrtcl(_name);
        ORV_ASSERT(!prtcl.isNull());
        if (auto* const access = dynamic_cast<DevMDAccessPrtcl*>(prtcl.get())) {
            access->performOpen();
        }
        _prtcl = prtcl;
    } catch (...) {
        _failure = std::current_exception();
        _ready.set();
        throw;
    }
    _isOpen.store(true, std::memory_order_release);
    _ready.set();
}

const RCShdPtr<DevMDPrtcl>& DevMgrDevice::await() {
    if (!isOpen()) {
        const DevWaitGraph::Wait wait(DevWaitGraph::Kind::ANSWER, _opener, nullptr);
        if (wait.isRefused()) throw DevMgrEx::BadMDPrtclImp(ORV_FILE, __LINE__, _name);
        _ready.wait();
        if (_failure != nullptr) std::rethrow_exception(_failure);
    }
    return _prtcl;
}

int DevMgrDevice::getQueueLength() const {
    if (!isOpen()) return 0;
    const auto* const access = dynamic_cast<const DevMDAccessPrtcl*>(_prtcl.get());
    return access != nullptr ? access->getQueueLength() : 0;
}

void DevMgrDevice::close() noexcept {
    try {
        if (auto* const access = dynamic_cast<DevMDAccessPrtcl*>(_prtcl.get())) {
            access->performClose();
        }
    } catch (...) {
        const std::string where = "closing the device \"" + std::string(_name.getText()) + '"';
        Assertions::traceCurrentException(where.c_str());
    }
}

RCShdPtr<DevMDPropertyAny> DevMgrDevice::getProperty(const DevMgrPropertyParser& path) {
    if (!_isIndexed.load(std::memory_order_acquire)) makeIndex();
    std::string key;
    for (const LiString& set : path.getPropertySetPath()) key.append(set.getText()).append(" ");
    key.append(path.getPropertyName().getText());
    const auto found = _index.find(key);
    if (found == _index.end()) {
        std::string subject = std::string(_name.getText()) + ' ' + key;
        std::replace(subject.begin(), subject.end(), ' ', ':');
        throw DevMgrEx::NameNotRegistered(ORV_FILE, __LINE__, LiString(subject.c_str()));
    }
    return found->second;
}

/// The tree is frozen by its first reading, so one reading is enough.
void DevMgrDevice::makeIndex() {
    const LkGuard guard(_indexMutex);
    if (_isIndexed.load(std::memory_order_relaxed)) return;
    auto* const prtcl = dynamic_cast<DevMDPropertyPrtcl*>(_prtcl.get());
    if (prtcl == nullptr) throw DevMgrEx::BadMDPrtclImp(ORV_FILE, __LINE__, _name);
    _index.clear();
    addToIndex(std::string(), prtcl->getPropertyIter(), prtcl->getPropertySetIter());
    _isIndexed.store(true, std::memory_order_release);
}

void DevMgrDevice::addToIndex(const std::string& path, DevMDPropertySet::Properties properties,
                              DevMDPropertySet::Sets sets) {
    // A name with white space in it, which no property string can name, must not look like a path.
    const auto isReachable = [](const LiString& name) {
        return name.getText().find_first_of(" \t\n\v\f\r") == std::string_view::npos;
    };
    for (; !properties.atEnd(); properties.next()) {
        const LiString name = properties.item()->getName();
        if (isReachable(name)) {
            _index.emplace(path + std::string(name.getText()), properties.item());
        }
    }
    for (; !sets.atEnd(); sets.next()) {
        DevMDPropertySet& set = *sets.item();
        const LiString name = set.getName();
        if (!isReachable(name)) continue;
        addToIndex(path + std::string(name.getText()) + " ", set.getPropertyIter(),
                   set.getPropertySetIter());
    }
}

}  // namespace Orv
