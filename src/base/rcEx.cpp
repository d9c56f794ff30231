#include "rcEx.h"

namespace Orv {

RCEx::ExNullPtr::ExNullPtr(const char* file, int line) : ExConcrete(file, line) {
    setReason("Dereferencing a null pointer");
}

}  // namespace Orv
