#pragma once

#include "liString.h"

namespace Orv {

/// Numbers as text, as a stream with default flags and precision writes them: integers in decimal,
/// floating values with six significant digits in the shorter of fixed and scientific form.
class ORV_RESMGT_API LiStringUtil {
public:
    LiStringUtil() = delete;

    static LiString convertNb(int number);
    static LiString convertNb(unsigned int number);
    static LiString convertNb(long number);
    static LiString convertNb(unsigned long number);
    static LiString convertNb(long long number);
    static LiString convertNb(unsigned long long number);
    static LiString convertNb(float number);
    static LiString convertNb(double number);
};

}  // namespace Orv
