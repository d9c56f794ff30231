#include "priority.h"

#include <ostream>
#include <string_view>

#include "lkRecLock.h"
#include "priorityMgr.h"
#include "priorityNotifierPrivate.h"
#include "priorityRelation.h"

namespace Orv {

namespace {

/// One line of a dump: a label and the priorities of which it tells, if there are any.
class DumpLine {
public:
    DumpLine(std::ostream& stream, const char* label) : _stream(stream), _label(label) {}
    ~DumpLine() {
        if (!_isEmpty) _stream << '\n';
    }

    DumpLine(const DumpLine&) = delete;
    DumpLine& operator=(const DumpLine&) = delete;

    void add(const char* kind, const LiString& name, int number) {
        _stream << (_isEmpty ? "    " : ", ") << (_isEmpty ? _label : "");
        _stream << kind << " \"" << name << "\" (" << number << ')';
        _isEmpty = false;
    }

private:
    std::ostream& _stream;
    const char* _label;
    bool _isEmpty = true;
};

}  // namespace

Priority::Priority(const LiString& name, PriorityMgr& mgr, int number)
    : _mgr(mgr),
      _link(std::make_shared<PriorityLink>()),
      _name(name),
      _isFixed(number != DERIVED),
      _number(number) {
    _mgr.add(*this);
}

Priority::Priority(const Priority& other)
    : Priority(other.getName(), other._mgr, other.getGiven()) {
    const LkGuard guard(_mgr._lock);
    _number = other._number;
}

Priority::~Priority() {
    _mgr.remove(*this);
}

int Priority::getPriority() const {
    return _mgr.getNumber(*this);
}

void Priority::setPriority(int number) {
    const LkGuard guard(_mgr._lock);
    _isFixed = number != DERIVED;
    if (_isFixed) _number = number;
    _mgr.noteUse(*this);
    _mgr.notify(PriorityMgr::NUMBER_SET);
}

LiString Priority::getName() const {
    const LkGuard guard(_mgr._lock);
    return _name;
}

void Priority::setName(const LiString& name) {
    const LkGuard guard(_mgr._lock);
    _name = name;
}

bool Priority::isFixed() const {
    const LkGuard guard(_mgr._lock);
    return _isFixed;
}

bool Priority::isTied() const {
    const LkGuard guard(_mgr._lock);
    return _isTied;
}

bool Priority::isIndependantButNotSet() const {
    const LkGuard guard(_mgr._lock);
    return !_isFixed && _asLeft.empty() && _asRight.empty();
}

void Priority::updatePriority(int) {}

int Priority::getGiven() const {
    const LkGuard guard(_mgr._lock);
    return _isFixed ? _number : DERIVED;
}

void Priority::dump(std::ostream& stream) const {
    const LkGuard guard(_mgr._lock);
    dumpNoLock(stream);
}

void Priority::dumpNoLock(std::ostream& stream) const {
    stream << "  \"" << _name << "\" " << _number;
    stream << (_isFixed ? " fixed\n" : _isTied ? " tied\n" : "\n");
    {
        DumpLine line(stream, "Equals: ");
        for (const auto* relation : _asLeft) {
            if (relation->_kind != PriorityRelation::EQUAL) continue;
            line.add("==", relation->_right->_name, relation->_right->_number);
        }
        for (const auto* relation : _asRight) {
            if (relation->_kind != PriorityRelation::EQUAL) continue;
            line.add("==", relation->_left->_name, relation->_left->_number);
        }
    }
    {
        DumpLine line(stream, "DependOns: ");
        for (const auto* relation : _asLeft) {
            if (relation->_kind == PriorityRelation::EQUAL) continue;
            line.add(relation->_kind == PriorityRelation::LESS ? "<" : "<=",
                     relation->_right->_name, relation->_right->_number);
        }
    }
    {
        DumpLine line(stream, "Dependants: ");
        for (const auto* relation : _asRight) {
            if (relation->_kind == PriorityRelation::EQUAL) continue;
            line.add(relation->_kind == PriorityRelation::LESS ? ">" : ">=", relation->_left->_name,
                     relation->_left->_number);
        }
    }
    if (_asLeft.empty() && _asRight.empty()) stream << "    Independant: in no relation\n";
}

}  // namespace Orv
