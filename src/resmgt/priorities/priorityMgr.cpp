#include "priorityMgr.h"

#include <iterator>
#include <sstream>

#include "assertions.h"
#include "priorityNotifierPrivate.h"
#include "traceLevel.h"
#include "traceManager.h"

namespace Orv {

namespace {

const TraceLevel traceLevel("priorities");

}  // namespace

PriorityMgr::PriorityMgr(const LiString& name, int min, int max)
    : _name(name),
      _min(min),
      _max(max),
      _notifier(std::make_unique<PriorityNotifier>(_lock)),
      _solver(min, max) {
    ORV_ASSERT(min <= max);
}

PriorityMgr::~PriorityMgr() noexcept(false) {
    const LkGuard guard(_lock);
    ORV_ASSERT_IN_DESTRUCTOR(_priorities.empty());
}

void PriorityMgr::add(Priority& priority) {
    ORV_ASSERT(&priority._mgr == this);
    const LkGuard guard(_lock);
    if (priority._seat.isTaken()) return;
    priority._seat.take(_priorities);
    _notifier->add(priority);
    notify(NUMBER_SET);
}

void PriorityMgr::add(PriorityRelation& relation) {
    ORV_ASSERT(&relation._mgr == this);
    const LkGuard guard(_lock);
    if (relation._seat.isTaken() || relation._left == nullptr) return;
    ORV_ASSERT(relation._left->_seat.isTaken() && relation._right->_seat.isTaken());
    relation._seat.take(_relations);
    relation._leftSeat.take(relation._left->_asLeft);
    relation._rightSeat.take(relation._right->_asRight);
    noteUse(*relation._left);
    noteUse(*relation._right);
    notify(RELATIONS_CHANGED);
}

void PriorityMgr::remove(Priority& priority) {
    {
        const LkGuard guard(_lock);
        if (!priority._seat.isTaken()) return;
        while (!priority._asLeft.empty()) leaveNoLock(*priority._asLeft.front());
        while (!priority._asRight.empty()) leaveNoLock(*priority._asRight.front());
        priority._seat.leave(_priorities);
        _notifier->remove(priority);
        notify(RELATIONS_CHANGED);
    }
    PriorityNotifier::waitForCall(*priority._link);
}

void PriorityMgr::remove(PriorityRelation& relation) {
    const LkGuard guard(_lock);
    if (relation._seat.isTaken()) leaveNoLock(relation);
}

void PriorityMgr::leaveNoLock(PriorityRelation& relation) {
    relation._seat.leave(_relations);
    relation._leftSeat.leave(relation._left->_asLeft);
    relation._rightSeat.leave(relation._right->_asRight);
    relation._left = relation._right = nullptr;
    notify(RELATIONS_CHANGED);
}

void PriorityMgr::notify(NotifyType) {
    const LkGuard guard(_lock);
    _isUpToDate = _isSolved = false;
}

void PriorityMgr::enableTracing(bool isEnabled) {
    const LkGuard guard(_lock);
    _isTracing = isEnabled;
}

void PriorityMgr::update() {
    do {
        const LkGuard guard(_lock);
        bringUpToDateNoLock();
    } while (_notifier->deliver());
}

int PriorityMgr::getNumber(const Priority& priority) {
    const std::shared_ptr<PriorityLink> link = priority._link;
    int number = 0;
    {
        const LkGuard guard(_lock);
        noteUse(priority);
        bringUpToDateNoLock();
        number = priority._number;
    }
    if (!_notifier->deliver()) return number;
    update();
    // One that was told may have destroyed this one.
    const LkGuard guard(_lock);
    return link->priority == nullptr ? number : priority._number;
}

void PriorityMgr::noteUse(const Priority& priority) {
    _notifier->noteUse(priority);
}

PriorityMgr::Error PriorityMgr::check() {
    const LkGuard guard(_lock);
    return solveNoLock();
}

PriorityMgr::Error PriorityMgr::solveNoLock() {
    if (!_isSolved) {
        performUpdate();
        _isSolved = true;
    }
    return _error;
}

void PriorityMgr::bringUpToDateNoLock() {
    while (!_isUpToDate) {
        if (solveNoLock() == NONE) {
            takeNumbersNoLock();
        } else {
            updateError(_error);
            if (_isSolved) return;  // nothing was mended
        }
    }
}

void PriorityMgr::performUpdate() {
    const LkGuard guard(_lock);
    PrioritySolver solver(_min, _max);
    for (Priority* priority : _priorities) {
        priority->_index =
            priority->_isFixed ? solver.addFixed(priority->_number) : solver.addDerived();
    }
    for (const PriorityRelation* relation : _relations) {
        const auto left = relation->_left->_index, right = relation->_right->_index;
        switch (relation->_kind) {
            case PriorityRelation::EQUAL:
                solver.addEqual(left, right);
                break;
            case PriorityRelation::LESS:
                solver.addLess(left, right);
                break;
            case PriorityRelation::LESS_OR_EQUAL:
                solver.addLessOrEqual(left, right);
                break;
        }
    }
    const PrioritySolver::Outcome outcome = solver.solve();
    _error = outcome == PrioritySolver::SOLVED        ? NONE
             : outcome == PrioritySolver::EMPTY_RANGE ? TRANSIENT_INVALID
                                                      : RELATION_INVALID;
    _solver = std::move(solver);
}

void PriorityMgr::takeNumbersNoLock() {
    bool hasChanged = false;
    for (Priority* priority : _priorities) {
        const int number = _solver.getNumber(priority->_index);
        hasChanged = hasChanged || priority->_number != number;
        priority->_number = number;
        priority->_isTied = _solver.isTied(priority->_index);
        _notifier->noteNumber(*priority);
    }
    _isUpToDate = true;
    if (hasChanged && (_isTracing || traceLevel.isOn())) traceNumbers();
}

void PriorityMgr::traceNumbers() const {
    std::ostringstream text;
    dump(text);
    TraceManager::getInstance().print(traceLevel, text.view());
}

void PriorityMgr::updateError(Error error) {
    const LkGuard guard(_lock);
    if (error == TRANSIENT_INVALID) throw makeTransientInvalid();
    if (error == RELATION_INVALID) throw makeRelationInvalid();
}

PriorityEx::ExTransientInvalid PriorityMgr::makeTransientInvalid() const {
    const auto culprit = _solver.getCulprit();
    const Priority& priority = **std::next(_priorities.begin(), culprit);
    return {ORV_FILE, __LINE__, priority._name, _solver.getLow(culprit), _solver.getHigh(culprit)};
}

PriorityEx::ExRelationInvalid PriorityMgr::makeRelationInvalid() const {
    const PriorityRelation& relation = **std::next(_relations.begin(), _solver.getCulprit());
    const Priority& left = *relation._left;
    const Priority& right = *relation._right;
    return {ORV_FILE,
            __LINE__,
            relation._name,
            left._name,
            _solver.getNumber(left._index),
            PriorityRelation::relationToString(relation._kind),
            right._name,
            _solver.getNumber(right._index)};
}

void PriorityMgr::dump(std::ostream& stream) const {
    const LkGuard guard(_lock);
    stream << "PriorityMgr \"" << _name << "\" " << _min << ".." << _max
           << (_isUpToDate ? "" : " NOT UP TO DATE") << '\n';
    if (_isSolved && _error == TRANSIENT_INVALID) stream << makeTransientInvalid().what() << '\n';
    if (_isSolved && _error == RELATION_INVALID) stream << makeRelationInvalid().what() << '\n';
    stream << "Priorities:\n";
    for (const Priority* priority : _priorities) priority->dumpNoLock(stream);
    stream << "Relations: \n";
    for (const PriorityRelation* relation : _relations) relation->dumpNoLock(stream);
}

}  // namespace Orv
