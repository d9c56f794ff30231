#include "mbProtocol.h"

namespace Orv {

MbProtocol::~MbProtocol() = default;

void MbProtocol::load(void* data, std::uint64_t size) {
    reload(data, size);
}

void MbProtocol::asyncLoad(void* data, std::uint64_t size, LkAsyncHandle* handle) {
    asyncReload(data, size, handle);
}

void MbProtocol::asyncLoadSucceeded() {
    asyncReloadSucceeded();
}

void MbProtocol::asyncLoadFailed() {
    asyncReloadFailed();
}

void MbProtocol::reload(void*, std::uint64_t) {}

void MbProtocol::asyncReload(void* data, std::uint64_t size, LkAsyncHandle* handle) {
    reload(data, size);
    handle->reportSucceeded();
}

void MbProtocol::asyncReloadSucceeded() {}

void MbProtocol::asyncReloadFailed() {}

void MbProtocol::unlocked(void*, std::uint64_t) {}

void MbProtocol::sync(void* data, std::uint64_t size) {
    unload(data, size);
}

void MbProtocol::asyncSync(void* data, std::uint64_t size, LkAsyncHandle* handle) {
    sync(data, size);
    handle->reportSucceeded();
}

void MbProtocol::asyncSyncSucceeded() {}

void MbProtocol::asyncSyncFailed() {}

void MbProtocol::unload(void*, std::uint64_t) {}

void MbProtocol::free(void*, std::uint64_t) {}

void MbProtocol::markDirty(void*, std::uint64_t) {}

}  // namespace Orv
