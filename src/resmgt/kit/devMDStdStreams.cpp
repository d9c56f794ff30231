#include <utility>

#include "assertions.h"
#include "devMDStdFunctionSinkFactory.h"
#include "devMDStdStreamActiveSink.h"
#include "devMDStdStreamActiveSource.h"
#include "devMDStdStreamPassiveSink.h"
#include "devMDStdStreamPassiveSource.h"
#include "devMDStdStreamPrtcl.h"
#include "devPrtclEx.h"

namespace Orv {

namespace {

using Elem = DevMDStreamElem;

ObjPtr<Elem> createNews(Elem::Ev ev) {
    return ObjPtr<Elem>(new Elem(nullptr, ev));
}

DevMDStream::State stateAfter(Elem::Ev ev) {
    switch (ev) {
        case Elem::END:
            return DevMDStream::State::ENDED;
        case Elem::FAILED:
            return DevMDStream::State::FAILED;
        case Elem::STOPPED:
            return DevMDStream::State::FREE;
        default:
            return DevMDStream::State::RUNNING;
    }
}

}  // namespace

// --- active source ---

DevMDStdStreamActiveSource::DevMDStdStreamActiveSource(const LiString& name,
                                                       const LiString& description)
    : _name(name), _description(description) {}

DevMDStdStreamActiveSource::~DevMDStdStreamActiveSource() noexcept(false) = default;

void DevMDStdStreamActiveSource::start() {
    _isAvailable = false;
    _end.start();
}

void DevMDStdStreamActiveSource::stop() {
    _end.stop();
    _isAvailable = true;
}

bool DevMDStdStreamActiveSource::push(ObjPtr<Elem> elem) {
    const DevMDStdStreamActiveEnd<DevMDStreamPassiveSink>::Use sink(_end);
    if (!sink.isPossible()) return false;
    const State state = stateAfter(elem->getEv());
    if (state != State::RUNNING) _end.end(state);
    try {
        sink->push(std::move(elem));
    } catch (...) {
        Assertions::traceCurrentException("pushing into a stream");
        _end.end(State::FAILED);
        return false;
    }
    return state == State::RUNNING && _end.getState() == State::RUNNING;
}

// --- active sink ---

DevMDStdStreamActiveSink::DevMDStdStreamActiveSink(const LiString& name,
                                                   const LiString& description)
    : _name(name), _description(description) {}

DevMDStdStreamActiveSink::~DevMDStdStreamActiveSink() noexcept(false) = default;

void DevMDStdStreamActiveSink::start() {
    _isAvailable = false;
    _end.start();
}

void DevMDStdStreamActiveSink::stop() {
    _end.stop();
    _isAvailable = true;
}

ObjPtrRet<Elem> DevMDStdStreamActiveSink::pull() {
    const DevMDStdStreamActiveEnd<DevMDStreamPassiveSource>::Use source(_end);
    if (!source.isPossible()) return createNews(Elem::STOPPED);
    ObjPtr<Elem> elem;
    try {
        elem = source->pull();
    } catch (...) {
        Assertions::traceCurrentException("pulling out of a stream");
        elem = createNews(Elem::FAILED);
    }
    if (elem->isTerminal()) _end.end(stateAfter(elem->getEv()));
    return elem;
}

// --- passive source ---

DevMDStdStreamPassiveSource::DevMDStdStreamPassiveSource(const LiString& name,
                                                         const LiString& description, int capacity,
                                                         RCShdPtr<DevMDStdFifo> fifo)
    : _name(name),
      _description(description),
      _capacity(capacity > 0 ? static_cast<std::size_t>(capacity) : static_cast<std::size_t>(-1)),
      _fifo(std::move(fifo)) {}

DevMDStdStreamPassiveSource::~DevMDStdStreamPassiveSource() noexcept(false) = default;

DevMDStream::State DevMDStdStreamPassiveSource::getState() {
    const LkGuard guard(_mutex);
    return _isStarted ? stateAfter(_end) : State::FREE;
}

void DevMDStdStreamPassiveSource::start() {
    const LkGuard guard(_mutex);
    _isAvailable = false;
    _isStarted = true;
    _hasLost = false;
    _end = Elem::DATA;
}

void DevMDStdStreamPassiveSource::stop() {
    std::deque<ObjPtr<Elem>> dropped;
    const LkGuard guard(_mutex);
    _elems.swap(dropped);
    _isStarted = false;
    _isAvailable = true;
    _changed.broadcast();
}

bool DevMDStdStreamPassiveSource::isReady() {
    const LkGuard guard(_mutex);
    return !_isStarted || !_elems.empty() || _end != Elem::DATA;
}

bool DevMDStdStreamPassiveSource::put(ObjPtr<Elem> elem) {
    const LkGuard guard(_mutex);
    if (!_isStarted || _end != Elem::DATA) return false;
    if (elem->isTerminal()) {
        _end = elem->getEv();
    } else if (_elems.size() >= _capacity) {
        _hasLost = true;  // told when there is room again, so that the loss itself costs none
        return true;
    } else {
        if (std::exchange(_hasLost, false)) _elems.push_back(createNews(Elem::GAP));
        _elems.push_back(std::move(elem));
    }
    _changed.signal();
    return _end == Elem::DATA;
}

ObjPtrRet<Elem> DevMDStdStreamPassiveSource::pull() {
    DevWaitGraph::Target noServer;
    const DevWaitGraph::Wait wait(DevWaitGraph::Kind::ANSWER,
                                  _fifo.isNull() ? noServer : _fifo->getTarget(), this);
    const LkGuard guard(_mutex);
    while (_isStarted && _elems.empty() && _end == Elem::DATA) {
        if (wait.isRefused() || wait.isLetGo()) {
            throw DevPrtclEx::ExMDStdFifoClosed(ORV_FILE, __LINE__);
        }
        _changed.wait(guard);
    }
    return take();
}

ObjPtrRet<Elem> DevMDStdStreamPassiveSource::take() {
    if (!_isStarted) return createNews(Elem::STOPPED);
    if (!_elems.empty()) {
        ObjPtr<Elem> elem = std::move(_elems.front());
        _elems.pop_front();
        return elem;
    }
    if (std::exchange(_hasLost, false)) return createNews(Elem::GAP);
    return createNews(_end);
}

void DevMDStdStreamPassiveSource::letGo() {
    const LkGuard guard(_mutex);
    _changed.broadcast();
}

// --- passive sink ---

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
    return _state.load();
}

void DevMDStdStreamPassiveSink::start() {
    _isAvailable = false;
    _state = State::RUNNING;
}

void DevMDStdStreamPassiveSink::stop() {
    const bool isCut = _state.exchange(State::FREE) == State::RUNNING;
    _isAvailable = true;
    if (!isCut || _fifo.isNull() || _fifo->isClosed()) return;
    try {
        DevANOQueueEntry entry(_factory->createPushANO(createNews(Elem::STOPPED)));
        _fifo->producePastCapacity(entry);
    } catch (const DevPrtclEx::ExMDStdFifoClosed&) {
        // The device has gone, and with it who would have to know.
    }
}

void DevMDStdStreamPassiveSink::push(ObjPtr<Elem> elem) {
    DevMDStdFifo& fifo = *_fifo;
    State state = State::RUNNING;
    if (elem->isTerminal()) {
        // The first terminal element is the last one to be seen.
        if (!_state.compare_exchange_strong(
                state, elem->getEv() == Elem::END ? State::ENDED : State::FAILED)) {
            return;
        }
    } else if (_state.load() != State::RUNNING) {
        return;
    }
    fifo.produce(DevANOQueueEntry(_factory->createPushANO(std::move(elem))));
}

// --- ready sink ---

class DevMDStdFunctionSinkFactory::PushANO : public DevMDStdANO {
public:
    PushANO(const RCShdPtr<const Function>& function, ObjPtr<Elem> elem)
        : _function(function), _elem(std::move(elem)) {}
    void performExecute() override { _function->take(std::move(_elem)); }

private:
    const RCShdPtr<const Function> _function;
    ObjPtr<Elem> _elem;
};

DevMDStdFunctionSinkFactory::DevMDStdFunctionSinkFactory(Take take)
    : _function(new Function(std::move(take))) {}

DevMDStdFunctionSinkFactory::~DevMDStdFunctionSinkFactory() = default;

ObjPtr<DevANO> DevMDStdFunctionSinkFactory::createPushANO(ObjPtr<Elem> elem) {
    return ObjPtr<DevANO>(new PushANO(_function, std::move(elem)));
}

// --- the stream protocol ---

DevMDStdStreamPrtcl::DevMDStdStreamPrtcl(const LiString& name) : _name(name) {}

void DevMDStdStreamPrtcl::addStream(RCShdPtr<DevMDStream> stream) {
    if (_isIteratorCreated.load()) throw DevPrtclEx::ExMDStdAddStream(ORV_FILE, __LINE__);
    _streams.push_back(std::move(stream));
}

ConstIterator<RCShdPtr<DevMDStream>> DevMDStdStreamPrtcl::performGetStreams() {
    _isIteratorCreated = true;
    return ConstIterator<RCShdPtr<DevMDStream>>::over(_streams);
}

}  // namespace Orv
