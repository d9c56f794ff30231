#include "mbUnloadStrategy.h"

namespace Orv {

MbUnloadStrategy::~MbUnloadStrategy() = default;

void MbUnloadStrategy::touchBuffer(MbBufferImp* buffer) {
    removeBuffer(buffer);
    insertBuffer(buffer);
}

}  // namespace Orv
