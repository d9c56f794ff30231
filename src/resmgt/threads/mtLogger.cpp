#include "mtLogger.h"

#include <memory>

#include "lgReader.h"
#include "lkGuard.h"
#include "lkRecLock.h"
#include "mtPriorityMgr.h"
#include "mtThreadFactory.h"
#include "priorityRelation.h"

namespace Orv {

namespace {

class LoggerProtocol : public MtThreadProtocol {
public:
    explicit LoggerProtocol(Priority& priority) : _loggerPriority(priority) {}

private:
    Priority& _loggerPriority;
    std::unique_ptr<PriorityRelation> _equalToLogger;
    LgReader _reader;

    void performAttach(MtThread* thread) override {
        _equalToLogger = std::make_unique<PriorityRelation>(
            "equalToLogger", thread->getPriority(), PriorityRelation::EQUAL, _loggerPriority);
    }
    void performDetach(MtThread*) override { _equalToLogger.reset(); }
    void performBody(MtThread*) override { _reader.run(); }
    void performStop(MtThread*) override { _reader.stop(); }
};

/// Never destroyed: the logger may run when the process ends.
struct Logger {
    LkRecLock lock{"MtLogger"};
    Priority priority{"LoggerPriority", MtPriorityMgr::getInstance()};
    PriorityRelation isBelowBaseLine{"logger<baseLine", priority, PriorityRelation::LESS,
                                     MtPriorityMgr::getInstance().getRtPriorities().getBaseLine()};
    ObjPtr<MtThread> thread;

    static Logger& get() {
        static auto* const logger = new Logger;
        return *logger;
    }
};

}  // namespace

// The lock is held while the thread starts and ends, which takes neither it nor code of others.

void MtLogger::start() {
    Logger& logger = Logger::get();
    MtThreadFactory& factory = MtThreadFactory::getInstance();
    const LkGuard guard(logger.lock);
    if (logger.thread && logger.thread->isRunning()) return;
    logger.thread = factory.create("Log_Reader_Thread",
                                   ObjPtr<MtThreadProtocol>(new LoggerProtocol(logger.priority)));
    logger.thread->start();
}

void MtLogger::stop() {
    Logger& logger = Logger::get();
    const LkGuard guard(logger.lock);
    logger.thread.reset();
}

bool MtLogger::isRunning() {
    Logger& logger = Logger::get();
    const LkGuard guard(logger.lock);
    return logger.thread && logger.thread->isRunning();
}

Priority& MtLogger::getPriority() {
    return Logger::get().priority;
}

}  // namespace Orv
