#pragma once

#include <string>

#include "mbTestKit.h"

namespace Orv {

using Buffer = RCShdEngPtr<MbBufferImp>;

inline ObjPtr<MbUnloadStrategy> lru() {
    return ObjPtr<MbUnloadStrategy>(new MbUnloadLRU(0));
}

/// Buffers of 100 bytes, of one manager with room for @p nbFitting of them.
struct PoolBench {
    static constexpr int SIZE = 100;

    explicit PoolBench(int nbFitting, ObjPtr<MbUnloadStrategy> strategy = lru())
        : manager(
              new MbHeapManager("pool", static_cast<std::uint64_t>(nbFitting * SIZE), strategy)),
          protocol(new ScriptedProtocol) {}

    Buffer create(int size = SIZE) {
        return MbBufferImpFactory(manager).create(
            LiString(("B" + std::to_string(++nbCreated)).c_str()), size, protocol);
    }
    Buffer createLoaded() {
        const Buffer buffer = create();
        use(buffer);
        return buffer;
    }
    static void use(const Buffer& buffer) {
        buffer->rdlock();
        buffer->unlock();
    }

    RCShdPtr<MbHeapManager> manager;
    RCShdPtr<ScriptedProtocol> protocol;
    int nbCreated = 0;
};

}  // namespace Orv
