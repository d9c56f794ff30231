#include "mtThreadMgr.h"

#include <atomic>
#include <ostream>

#include "inPackageInit.h"
#include "mtThread.h"
#include "mtThreadMgrImpPrivate.h"

namespace Orv {

namespace {

std::atomic<MtThreadMgr::RealTimeParam> realTimeParam{MtThreadMgr::NOT_DECLARED};

}  // namespace

MtThreadMgr::MtThreadMgr() : _imp(std::make_unique<MtThreadMgrImp>()) {}

MtThreadMgr& MtThreadMgr::get() {
    static auto* const mgr = new MtThreadMgr;
    return *mgr;
}

MtThreadMgr& MtThreadMgr::getInstance() {
    InPackageInit::initializeAll();
    return get();
}

MtThread* MtThreadMgr::findCurrentThread() noexcept {
    return MtThread::findCurrent();
}

MtThread& MtThreadMgr::createMainThread(MtThreadFactory& factory) {
    return _imp->createMainThread(factory);
}

MtThread* MtThreadMgr::findMainThread() const noexcept {
    return _imp->findMainThread();
}

std::size_t MtThreadMgr::getNbThreads() const {
    return _imp->getThreads().getSize();
}

std::vector<LiString> MtThreadMgr::getThreadNames() const {
    return _imp->getThreads().getNames();
}

std::vector<LiString> MtThreadMgr::stopThreads(double seconds) {
    return _imp->stopThreads(seconds);
}

void MtThreadMgr::indicateAppIsRealTime(bool required) {
    realTimeParam = required ? REAL_TIME_REQUIRED : REAL_TIME_OPTIONAL;
}

MtThreadMgr::RealTimeParam MtThreadMgr::getRealTimeParam() noexcept {
    return realTimeParam;
}

void MtThreadMgr::setRealTime(bool isOn) {
    _imp->setRealTime(isOn);
}

bool MtThreadMgr::isRealTime() const noexcept {
    return _imp->isRealTime();
}

int MtThreadMgr::getNbProcessors() const noexcept {
    return _imp->getNbProcessors();
}

void MtThreadMgr::setNbProcessors(int number) {
    _imp->setNbProcessors(number);
}

void MtThreadMgr::add(MtThreadGroup& group) {
    _imp->add(group);
}

void MtThreadMgr::remove(MtThreadGroup& group) {
    _imp->remove(group);
}

void MtThreadMgr::dump(std::ostream& stream) const {
    _imp->dump(stream);
}

}  // namespace Orv
