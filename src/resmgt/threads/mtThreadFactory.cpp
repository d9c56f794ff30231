#include "mtThreadFactory.h"

#include <utility>

#include "assertions.h"
#include "inPackageInit.h"
#include "mtNative.h"

namespace Orv {

MtThreadFactory& MtThreadFactory::getInstance() {
    InPackageInit::initializeAll();
    return get();
}

MtThreadFactory& MtThreadFactory::get() {
    static auto* const factory = new MtThreadFactory;
    return *factory;
}

ObjPtrRet<MtThread> MtThreadFactory::create(const LiString& name, ObjPtr<MtThreadProtocol> protocol,
                                            bool terminatesOnUnhandled, unsigned stackSize) {
    return ObjPtrRet<MtThread>(
        new MtThread(name, std::move(protocol), nullptr, false, terminatesOnUnhandled, stackSize));
}

ObjPtrRet<MtThread> MtThreadFactory::create(MtThreadGroup& group, const LiString& name,
                                            ObjPtr<MtThreadProtocol> protocol,
                                            bool terminatesOnUnhandled, unsigned stackSize) {
    return ObjPtrRet<MtThread>(
        new MtThread(name, std::move(protocol), &group, false, terminatesOnUnhandled, stackSize));
}

bool MtThreadFactory::isOnMainThread() const {
    return MtThreadFactoryNative::isOnMainThread();
}

ObjPtrRet<MtThread> MtThreadFactory::createMainThread() {
    ORV_ASSERT(isOnMainThread());
    return ObjPtrRet<MtThread>(new MtThread("main", nullptr, nullptr, true, false, 0));
}

}  // namespace Orv
