#include "lgSink.h"

namespace Orv {

LgSink::~LgSink() = default;

}  // namespace Orv
