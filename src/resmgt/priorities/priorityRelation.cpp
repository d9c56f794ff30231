#include "priorityRelation.h"

#include <limits>
#include <ostream>

#include "assertions.h"
#include "lkRecLock.h"
#include "priority.h"
#include "priorityMgr.h"

namespace Orv {

PriorityRelation::PriorityRelation(const LiString& name, Priority& left, Relation kind,
                                   Priority& right)
    : _name(name), _kind(kind), _mgr(left._mgr), _left(&left), _right(&right) {
    ORV_ASSERT(kind == EQUAL || kind == LESS || kind == LESS_OR_EQUAL);
    ORV_ASSERT(&left.getMgr() == &right.getMgr());
    _mgr.add(*this);
}

PriorityRelation::~PriorityRelation() {
    _mgr.remove(*this);
}

bool PriorityRelation::check() const {
    const LkGuard guard(_mgr._lock);
    return checkNoLock();
}

bool PriorityRelation::checkNoLock() const {
    if (_left == nullptr) return true;
    switch (_kind) {
        case EQUAL:
            return _left->_number == _right->_number;
        case LESS:
            return _left->_number < _right->_number;
        default:
            return _left->_number <= _right->_number;
    }
}

int PriorityRelation::computeLhsPriority(int rhs) const {
    if (_kind != LESS) return rhs;
    ORV_ASSERT(rhs > std::numeric_limits<int>::min());
    return rhs - 1;
}

int PriorityRelation::computeRhsPriority(int lhs) const {
    if (_kind != LESS) return lhs;
    ORV_ASSERT(lhs < std::numeric_limits<int>::max());
    return lhs + 1;
}

const char* PriorityRelation::relationToString(Relation kind) {
    switch (kind) {
        case EQUAL:
            return "==";
        case LESS:
            return "< ";
        case LESS_OR_EQUAL:
            return "<=";
    }
    Assertions::throwProgramAborted(ORV_FILE, __LINE__, "unknown relation of priorities");
}

void PriorityRelation::dump(std::ostream& stream) const {
    const LkGuard guard(_mgr._lock);
    dumpNoLock(stream);
}

void PriorityRelation::dumpNoLock(std::ostream& stream) const {
    stream << "  \"" << _name << "\":";
    if (_left == nullptr) {
        stream << " inert, it or a priority of it was removed\n";
        return;
    }
    stream << " lhs \"" << _left->_name << "\" (" << _left->_number << ") "
           << relationToString(_kind) << " rhs \"" << _right->_name << "\" (" << _right->_number
           << ") " << (checkNoLock() ? "valid" : "NOT valid") << '\n';
}

}  // namespace Orv
