#include "devMDStdStreamPassiveSink.h"

#include <utility>

#include "assertions.h"
#include "devMDStdStreamNewsPrivate.h"
#include "devPrtclEx.h"

namespace Orv {

using Elem = DevMDStreamElem;

DevMDStdStreamPassiveSinkANOFactory::~DevMDStdStreamPassiveSinkANOFactory() = default;

DevMDStdStreamPassiveSink::DevMDStdStreamPassiveSink(
    const LiString& name, const LiString& description, RCShdPtr<DevMDStdFifo> fifo,
    ObjPtr<DevMDStdStreamPassiveSinkANOFactory> factory)
    : _name(name),
      _description(description),
      _fifo(std::move(fifo)),
      _factory(std::move(factory)) {}

DevMDStdStreamPassiveSink::~DevMDStdStreamPassiveSink() noexcept(false) = default;

DevMDStream::State DevMDStdStreamPassiveSink::getState() {
    return _hasFailed.load() ? State::FAILED : _state.load();
}

std::exception_ptr DevMDStdStreamPassiveSink::getFailure() {
    const LkGuard guard(_failureLock);
    return _failure;
}

void DevMDStdStreamPassiveSink::fail(std::exception_ptr failure) {
    setFailure(std::move(failure));
    tellEnd();
}

void DevMDStdStreamPassiveSink::setFailure(std::exception_ptr failure) {
    const LkGuard guard(_failureLock);
    if (_state.load() == State::FREE || _hasFailed.load()) return;
    _failure.swap(failure);
    _hasFailed = true;
}

void DevMDStdStreamPassiveSink::tellEnd() noexcept {
    _aeo.tell([](DevAEO& aeo) { aeo.performExecute(); });
}

void DevMDStdStreamPassiveSink::start() {
    std::exception_ptr none;
    const LkGuard guard(_failureLock);
    _isAvailable = false;
    _hasFailed = false;
    _failure.swap(none);
    _state = State::RUNNING;
}

void DevMDStdStreamPassiveSink::stop() {
    const bool isCut = _state.exchange(State::FREE) == State::RUNNING;
    _hasFailed = false;
    _isAvailable = true;
    if (!isCut || _fifo.isNull() || _fifo->isClosed()) return;
    try {
        DevANOQueueEntry entry(_factory->createPushANO(DevMDStdStreamNews::create(Elem::STOPPED)));
        _fifo->producePastCapacity(entry);
    } catch (const DevPrtclEx::ExMDStdFifoClosed&) {
        // The device has gone, and with it who would have to know.
    }
}

void DevMDStdStreamPassiveSink::push(ObjPtr<Elem> elem) {
    DevMDStdFifo& fifo = *_fifo;
    State state = State::RUNNING;
    const bool isTerminal = elem->isTerminal();
    if (isTerminal) {
        // The first terminal element is the last one to be seen.
        if (!_state.compare_exchange_strong(
                state, elem->getEv() == Elem::END ? State::ENDED : State::FAILED)) {
            return;
        }
    } else if (_state.load() != State::RUNNING) {
        return;
    }
    const std::exception_ptr failure = _hasFailed.load() ? getFailure() : nullptr;
    if (isTerminal || !failure) {
        fifo.produce(DevANOQueueEntry(_factory->createPushANO(std::move(elem))));
    }
    if (failure) std::rethrow_exception(failure);
}

}  // namespace Orv
