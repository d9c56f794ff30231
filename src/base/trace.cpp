#include "trace.h"

#include "traceManager.h"

namespace Orv {

Trace::~Trace() {
    TraceManager::getInstance().print(_level, _stream.view());
}

}  // namespace Orv
