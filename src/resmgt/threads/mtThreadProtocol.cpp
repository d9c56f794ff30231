#include "mtThreadProtocol.h"

#include "mtThread.h"

namespace Orv {

void MtThreadProtocol::performStop(MtThread* thread) {
    thread->requestCancel(false);
}

ObjPtrRet<MtThreadProtocol> MtThreadFunction::create(Body body) {
    return ObjPtrRet<MtThreadProtocol>(new MtThreadFunction(std::move(body)));
}

ObjPtrRet<MtThreadProtocol> MtThreadFunction::create(std::function<void()> body) {
    return create([body = std::move(body)](MtThread&) { body(); });
}

void MtThreadFunction::performBody(MtThread* thread) {
    _body(*thread);
}

}  // namespace Orv
