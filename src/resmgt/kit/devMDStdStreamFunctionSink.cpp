#include "devMDStdStreamFunctionSink.h"

#include <cxxabi.h>
#include <utility>

#include "assertions.h"
#include "devMDStdANO.h"
#include "devMDStdStreamNewsPrivate.h"

namespace Orv {

class DevMDStdStreamFunctionSink::PushANO : public DevMDStdANO {
public:
    PushANO(const RCShdPtr<DevMDStdStreamFunctionSink>& sink, ObjPtr<DevMDStreamElem> elem)
        : _sink(sink), _elem(std::move(elem)) {}
    void performExecute() override { _sink->take(std::move(_elem)); }

private:
    const RCShdPtr<DevMDStdStreamFunctionSink> _sink;  // until the device has come to it
    ObjPtr<DevMDStreamElem> _elem;
};

/// Owned by its sink.
class DevMDStdStreamFunctionSink::Factory : public DevMDStdStreamPassiveSinkANOFactory {
public:
    explicit Factory(DevMDStdStreamFunctionSink& sink) : _sink(sink) {}

    ObjPtr<DevANO> createPushANO(ObjPtr<DevMDStreamElem> elem) override {
        return ObjPtr<DevANO>(
            new PushANO(RCShdPtr<DevMDStdStreamFunctionSink>(&_sink), std::move(elem)));
    }

private:
    DevMDStdStreamFunctionSink& _sink;
};

DevMDStdStreamFunctionSink::DevMDStdStreamFunctionSink(const LiString& name,
                                                       const LiString& description,
                                                       RCShdPtr<DevMDStdFifo> fifo, Take take,
                                                       IsCompatible isCompatible)
    : DevMDStdStreamPassiveSink(name, description, std::move(fifo),
                                ObjPtr<DevMDStdStreamPassiveSinkANOFactory>(new Factory(*this))),
      _take(std::move(take)),
      _isCompatible(std::move(isCompatible)) {}

DevMDStdStreamFunctionSink::~DevMDStdStreamFunctionSink() noexcept(false) = default;

bool DevMDStdStreamFunctionSink::isCompatible(const LiString& description) {
    return _isCompatible ? _isCompatible(description)
                         : DevMDStdStreamPassiveSink::isCompatible(description);
}

void DevMDStdStreamFunctionSink::start() {
    const LkGuard guard(_lock);
    if (isAvailable()) ++_nbStarted;
    DevMDStdStreamPassiveSink::start();
}

bool DevMDStdStreamFunctionSink::isOpen() {
    const LkGuard guard(_lock);
    return _nbEnded != _nbStarted;
}

void DevMDStdStreamFunctionSink::take(ObjPtr<DevMDStreamElem> elem) {
    const bool isTerminal = elem->isTerminal();
    if (_isSkipping && !isTerminal) return;
    try {
        _take(std::move(elem));
    } catch (const abi::__forced_unwind&) {
        throw;
    } catch (...) {
        Assertions::traceCurrentException(
            DevMDStdStreamNews::describe("taking an element in", getName()).c_str());
        _isSkipping = true;
        failCurrent(std::current_exception());
    }
    if (!isTerminal) return;
    _isSkipping = false;
    {
        const LkGuard guard(_lock);
        ++_nbEnded;
    }
    ended();
}

/// What is left of an earlier stream does not harm the present one.
void DevMDStdStreamFunctionSink::failCurrent(std::exception_ptr failure) {
    {
        const LkGuard guard(_lock);
        if (_nbEnded + 1 != _nbStarted) return;
        setFailure(std::move(failure));
    }
    tellEnd();
}

}  // namespace Orv
