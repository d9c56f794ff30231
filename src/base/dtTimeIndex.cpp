#include "dtTimeIndex.h"

#include <ostream>

#include "assertions.h"

namespace Orv {

DtTimeIndex& DtTimeIndex::operator+=(const DtTimeIndex& other) {
    std::int64_t sum = 0;
    ORV_ASSERT_TEXT(!__builtin_add_overflow(_frames, other._frames, &sum), "frame count in range");
    _frames = sum;
    return *this;
}

DtTimeIndex& DtTimeIndex::operator-=(const DtTimeIndex& other) {
    std::int64_t difference = 0;
    ORV_ASSERT_TEXT(!__builtin_sub_overflow(_frames, other._frames, &difference),
                    "frame count in range");
    _frames = difference;
    return *this;
}

std::ostream& operator<<(std::ostream& stream, const DtTimeIndex& index) {
    return stream << index.getFrames();
}

}  // namespace Orv
