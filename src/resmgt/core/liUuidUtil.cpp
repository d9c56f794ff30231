#include "liUuidUtil.h"

namespace Orv {

bool LiUuidUtil::isGroupBorder(int position) noexcept {
    return position == 8 || position == 13 || position == 18 || position == 23;
}

int LiUuidUtil::findHexValue(char digit) noexcept {
    if (digit >= '0' && digit <= '9') return digit - '0';
    if (digit >= 'a' && digit <= 'f') return digit - 'a' + 10;
    if (digit >= 'A' && digit <= 'F') return digit - 'A' + 10;
    return -1;
}

bool LiUuidUtil::isWellFormed(const LiString& text) {
    if (text.getLength() != TEXT_LENGTH) return false;
    const char* const chars = text.getChars();
    for (int i = 0; i < TEXT_LENGTH; ++i) {
        if (isGroupBorder(i) ? chars[i] != '-' : findHexValue(chars[i]) < 0) return false;
    }
    return true;
}

}  // namespace Orv
