#include "devMDStdStreamPassiveSource.h"

#include <utility>

#include "assertions.h"
#include "devMDStdStreamNewsPrivate.h"
#include "devPrtclEx.h"

namespace Orv {

using Elem = DevMDStreamElem;

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
    return _isStarted ? DevMDStdStreamNews::stateAfter(_end) : State::FREE;
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
        if (std::exchange(_hasLost, false)) _elems.push_back(DevMDStdStreamNews::create(Elem::GAP));
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
    if (!_isStarted) return DevMDStdStreamNews::create(Elem::STOPPED);
    if (!_elems.empty()) {
        ObjPtr<Elem> elem = std::move(_elems.front());
        _elems.pop_front();
        return elem;
    }
    if (std::exchange(_hasLost, false)) return DevMDStdStreamNews::create(Elem::GAP);
    return DevMDStdStreamNews::create(_end);
}

void DevMDStdStreamPassiveSource::letGo() {
    const LkGuard guard(_mutex);
    _changed.broadcast();
}

}  // namespace Orv
