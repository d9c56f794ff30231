#include "devSeqPrtclUtil.h"

#include <atomic>
#include <utility>

#include "assertions.h"

namespace Orv {

DevSeqReportTarget::~DevSeqReportTarget() noexcept(false) = default;

/// The way of the device's answers to the manager's thread.
class DevSeqPrtclUtil::Line : public RCBase<LkCounter<long>> {
public:
    Line(RCShdPtr<DevMgrFifo> fifo, RCShdPtr<DevSeqReportTarget> target, unsigned node)
        : _fifo(std::move(fifo)), _target(std::move(target)), _node(node) {}

    /// Waits for room in the manager's queue. What goes wrong is no fault of the device.
    void report(DevSeqReport::Kind kind, unsigned attempt, bool isDone) noexcept;

    void beginSync(unsigned attempt);
    void endSync(unsigned attempt);
    DtTime getLatency() const;
    DtTimeMark getMark() const;

private:
    const RCShdPtr<DevMgrFifo> _fifo;
    const RCShdPtr<DevSeqReportTarget> _target;
    const unsigned _node;

    mutable LkLock _lock{"DevSeqPrtclUtil"};
    unsigned _syncAttempt ORV_GUARDED_BY(_lock) = 0;
    DtTimeMark _syncMark ORV_GUARDED_BY(_lock);
    DtTimeMark _lockMark ORV_GUARDED_BY(_lock);
};

/// A report on its way. If the queue drops it, the target is told.
class DevSeqPrtclUtil::ReportANO : public DevANO {
public:
    ReportANO(const RCShdPtr<DevSeqReportTarget>& target, const DevSeqReport& report)
        : _target(target), _report(report) {}
    ~ReportANO() override {
        if (!_hasRun) _target->miss();
    }
    void performExecute() override {
        _hasRun = true;
        _target->take(_report);
    }

private:
    const RCShdPtr<DevSeqReportTarget> _target;
    const DevSeqReport _report;
    bool _hasRun = false;
};

void DevSeqPrtclUtil::Line::report(DevSeqReport::Kind kind, unsigned attempt,
                                   bool isDone) noexcept {
    if (!_target->isOpen()) return;
    try {
        const DevSeqReport report{_node, attempt, kind, isDone};
        _fifo->produce(DevANOQueueEntry(ObjPtr<DevANO>(new ReportANO(_target, report))));
    } catch (...) {
        Assertions::traceCurrentException("reporting from a device of a sequence");
        _target->miss();
    }
}

void DevSeqPrtclUtil::Line::beginSync(unsigned attempt) {
    const LkGuard guard(_lock);
    _syncAttempt = attempt;
    _syncMark = DtTimeMark::now();
    _lockMark = DtTimeMark();
}

void DevSeqPrtclUtil::Line::endSync(unsigned attempt) {
    const LkGuard guard(_lock);
    if (attempt == _syncAttempt) _lockMark = DtTimeMark::now();
}

DtTime DevSeqPrtclUtil::Line::getLatency() const {
    const LkGuard guard(_lock);
    if (_lockMark.isZero()) return DtTime();
    return DtTime::fromNanoseconds(_lockMark.getNanosecondsSince(_syncMark));
}

DtTimeMark DevSeqPrtclUtil::Line::getMark() const {
    const LkGuard guard(_lock);
    return _lockMark;
}

/// Runs when a command is done; destroyed unrun it reports that the command never will be.
class DevSeqPrtclUtil::CommandACO : public DevACO {
public:
    CommandACO(const RCShdPtr<Line>& line, DevSeqReport::Kind kind, unsigned attempt)
        : _line(line), _kind(kind), _attempt(attempt) {}
    ~CommandACO() override {
        if (!_hasRun) _line->report(_kind, _attempt, false);
    }
    void performExecute() override {
        _hasRun = true;
        if (_kind == DevSeqReport::LOCKED) _line->endSync(_attempt);
        _line->report(_kind, _attempt, true);
    }

private:
    const RCShdPtr<Line> _line;
    const DevSeqReport::Kind _kind;
    const unsigned _attempt;
    bool _hasRun = false;
};

class DevSeqPrtclUtil::ReadyANO : public DevANO {
public:
    ReadyANO(const RCShdPtr<Line>& line, unsigned attempt) : _line(line), _attempt(attempt) {}
    ~ReadyANO() override {
        if (!_hasRun.load()) _line->report(DevSeqReport::READY, _attempt, false);
    }
    void performExecute() override {
        _hasRun = true;
        _line->report(DevSeqReport::READY, _attempt, true);
    }

private:
    const RCShdPtr<Line> _line;
    const unsigned _attempt;
    std::atomic<bool> _hasRun{false};
};

class DevSeqPrtclUtil::LockLostANO : public DevANO {
public:
    LockLostANO(const RCShdPtr<Line>& line, unsigned attempt) : _line(line), _attempt(attempt) {}
    void performExecute() override { _line->report(DevSeqReport::LOCK_LOST, _attempt, true); }

private:
    const RCShdPtr<Line> _line;
    const unsigned _attempt;
};

DevSeqPrtclUtil::DevSeqPrtclUtil(RCShdPtr<DevMDSyncSeqPrtcl> prtcl, RCShdPtr<DevMgrFifo> fifo,
                                 RCShdPtr<DevSeqReportTarget> target, unsigned node)
    : _prtcl(std::move(prtcl)), _line(new Line(std::move(fifo), std::move(target), node)) {}

DevSeqPrtclUtil::~DevSeqPrtclUtil() = default;

ObjPtr<DevACO> DevSeqPrtclUtil::createACO(DevSeqReport::Kind kind) {
    return ObjPtr<DevACO>(new CommandACO(_line, kind, ++_attempts[kind]));
}

void DevSeqPrtclUtil::start() {
    ObjPtr<DevACO> aco = createACO(DevSeqReport::STARTED);
    const unsigned attempt = _attempts[DevSeqReport::STARTED];
    _attempts[DevSeqReport::READY] = _attempts[DevSeqReport::LOCK_LOST] = attempt;
    _prtcl->performStart(std::move(aco), ObjPtr<DevANO>(new ReadyANO(_line, attempt)),
                         ObjPtr<DevANO>(new LockLostANO(_line, attempt)));
}

void DevSeqPrtclUtil::stop() {
    _prtcl->performStop(createACO(DevSeqReport::STOPPED));
}

void DevSeqPrtclUtil::abort() {
    _prtcl->performAbort(createACO(DevSeqReport::ABORTED));
}

void DevSeqPrtclUtil::recover() {
    _prtcl->performRecover(createACO(DevSeqReport::RECOVERED));
}

void DevSeqPrtclUtil::sync(const DtTime& time) {
    ObjPtr<DevACO> aco = createACO(DevSeqReport::LOCKED);
    _line->beginSync(_attempts[DevSeqReport::LOCKED]);
    _prtcl->performSync(std::move(aco), time);
}

void DevSeqPrtclUtil::sync(const DtTimeMark& mark) {
    ObjPtr<DevACO> aco = createACO(DevSeqReport::LOCKED);
    _line->beginSync(_attempts[DevSeqReport::LOCKED]);
    _prtcl->performSync(std::move(aco), mark);
}

DtTime DevSeqPrtclUtil::getLatency() const {
    return _line->getLatency();
}

DtTimeMark DevSeqPrtclUtil::getMark() const {
    return _line->getMark();
}

}  // namespace Orv
