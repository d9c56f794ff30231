#include "devMDStdStreamActiveSink.h"

#include <utility>

#include "assertions.h"
#include "devMDStdStreamNewsPrivate.h"

namespace Orv {

using Elem = DevMDStreamElem;

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
    ObjPtr<Elem> elem;
    {
        const DevMDStdStreamActiveEnd<DevMDStreamPassiveSource>::Use source(_end);
        if (!source.isPossible()) return DevMDStdStreamNews::create(Elem::STOPPED);
        std::exception_ptr failure;
        try {
            elem = source->pull();
        } catch (...) {
            Assertions::traceCurrentException(
                DevMDStdStreamNews::describe("pulling out of", _name).c_str());
            failure = std::current_exception();
            elem = DevMDStdStreamNews::create(Elem::FAILED);
        }
        if (!elem->isTerminal()) return elem;
        _end.end(DevMDStdStreamNews::stateAfter(elem->getEv()), std::move(failure));
    }
    _end.tellEnd();
    return elem;
}

}  // namespace Orv
