#include "liStringUtil.h"

#include <sstream>

namespace Orv {

namespace {

template <class T>
LiString write(T number) {
    std::ostringstream stream;
    stream << number;
    return LiString(stream);
}

}  // namespace

LiString LiStringUtil::convertNb(int number) {
    return write(number);
}
LiString LiStringUtil::convertNb(unsigned int number) {
    return write(number);
}
LiString LiStringUtil::convertNb(long number) {
    return write(number);
}
LiString LiStringUtil::convertNb(unsigned long number) {
    return write(number);
}
LiString LiStringUtil::convertNb(long long number) {
    return write(number);
}
LiString LiStringUtil::convertNb(unsigned long long number) {
    return write(number);
}
LiString LiStringUtil::convertNb(float number) {
    return write(number);
}
LiString LiStringUtil::convertNb(double number) {
    return write(number);
}

}  // namespace Orv
