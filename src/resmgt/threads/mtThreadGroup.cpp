#include "mtThreadGroup.h"

#include <ostream>

#include "assertions.h"
#include "mtThread.h"
#include "mtThreadListPrivate.h"
#include "mtThreadMgr.h"

namespace Orv {

MtThreadGroup::MtThreadGroup(const LiString& name)
    : _name(name), _threads(std::make_unique<MtThreadList>("MtThreadGroup")) {
    MtThreadMgr::getInstance().add(*this);
}

MtThreadGroup::~MtThreadGroup() noexcept(false) {
    MtThreadMgr::get().remove(*this);
    ORV_ASSERT_IN_DESTRUCTOR_TEXT(_threads->getSize() == 0, "_threads.size() == 0");
}

std::size_t MtThreadGroup::getNbThreads() const {
    return _threads->getSize();
}

void MtThreadGroup::execute(const MtGroupCommand& command) {
    _threads->forEach([&](MtThread& thread) { command.execute(thread); });
}

void MtThreadGroup::dump(std::ostream& stream) const {
    stream << "Group \"" << _name << "\":\n";
    _threads->forEachLocked([&](const MtThread& thread) {
        stream << "  ";
        thread.dump(stream);
    });
}

void MtThreadGroup::add(MtThread& thread) {
    _threads->add(thread);
}

void MtThreadGroup::remove(MtThread& thread) {
    _threads->remove(thread);
}

}  // namespace Orv
