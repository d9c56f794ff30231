#include <algorithm>
#include <cerrno>
#include <cstring>
#include <sys/random.h>

#include "liUuidEx.h"
#include "liUuidUtil.h"
#include "sourceFile.h"

namespace Orv {

LiUuidUtil::Uuid LiUuidUtil::createNil() {
    return {};
}

LiUuidUtil::Uuid LiUuidUtil::create() {
    Uuid uuid;
    std::size_t length = 0;
    while (length < sizeof uuid.bytes) {
        const ssize_t result = ::getrandom(uuid.bytes + length, sizeof uuid.bytes - length, 0);
        if (result < 0 && errno != EINTR) {
            throw LiUuidEx::ExInternalError(ORV_FILE, __LINE__, "UuidCreate");
        }
        if (result > 0) length += static_cast<std::size_t>(result);
    }
    // RFC 4122, section 4.4: version 4, and the variant of that document.
    uuid.bytes[6] = static_cast<std::uint8_t>((uuid.bytes[6] & 0x0f) | 0x40);
    uuid.bytes[8] = static_cast<std::uint8_t>((uuid.bytes[8] & 0x3f) | 0x80);
    return uuid;
}

LiUuidUtil::Uuid LiUuidUtil::fromString(const LiString& text) {
    if (!isWellFormed(text)) throw LiUuidEx::ExInvalidUuidString(ORV_FILE, __LINE__, text);
    const char* chars = text.getChars();
    Uuid uuid;
    for (std::uint8_t& byte : uuid.bytes) {
        if (*chars == '-') ++chars;
        byte = static_cast<std::uint8_t>(findHexValue(chars[0]) * 16 + findHexValue(chars[1]));
        chars += 2;
    }
    return uuid;
}

LiString LiUuidUtil::toString(const Uuid& uuid) {
    constexpr char DIGITS[] = "0123456789abcdef";
    char text[TEXT_LENGTH + 1] = {};
    int position = 0;
    for (const std::uint8_t byte : uuid.bytes) {
        if (isGroupBorder(position)) text[position++] = '-';
        text[position++] = DIGITS[byte / 16];
        text[position++] = DIGITS[byte % 16];
    }
    return LiString(text);
}

bool LiUuidUtil::equal(const Uuid& a, const Uuid& b) {
    return std::memcmp(a.bytes, b.bytes, sizeof a.bytes) == 0;
}

int LiUuidUtil::compare(const Uuid& a, const Uuid& b) {
    const int order = std::memcmp(a.bytes, b.bytes, sizeof a.bytes);
    return (order > 0) - (order < 0);
}

bool LiUuidUtil::isNil(const Uuid& uuid) {
    return std::all_of(std::begin(uuid.bytes), std::end(uuid.bytes),
                       [](std::uint8_t byte) { return byte == 0; });
}

std::uint16_t LiUuidUtil::hash(const Uuid& uuid) {
    std::uint64_t halves[2];
    static_assert(sizeof halves == sizeof uuid.bytes);
    std::memcpy(halves, uuid.bytes, sizeof halves);
    // Multiplying by an odd number carries every bit to the top, whose sixteen are taken.
    std::uint64_t mixed = (halves[0] ^ (halves[0] >> 32)) * 0x9e3779b97f4a7c15;
    mixed = (mixed ^ (mixed >> 32) ^ halves[1] ^ (halves[1] >> 32)) * 0xbf58476d1ce4e5b9;
    return static_cast<std::uint16_t>(mixed >> 48);
}

}  // namespace Orv
