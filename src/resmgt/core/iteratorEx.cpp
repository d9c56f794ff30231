#include "iteratorEx.h"

#include "sourceFile.h"

namespace Orv {

IteratorEx::ExOutOfRange::ExOutOfRange(const char* file, int line) : ExConcrete(file, line) {
    setReason("Iterator is out of range.");
}

void IteratorEx::throwExOutOfRange() {
    throw ExOutOfRange(ORV_FILE, __LINE__);
}

}  // namespace Orv
