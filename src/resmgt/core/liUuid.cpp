#include "liUuid.h"

#include "liUuidUtil.h"

namespace Orv {

LiUuid::LiUuid() : _uuid(LiUuidUtil::createNil()) {}

LiUuid::LiUuid(CreateEnum) : _uuid(LiUuidUtil::create()) {}

LiUuid::LiUuid(const LiString& text) : _uuid(LiUuidUtil::fromString(text)) {}

void LiUuid::clear() {
    _uuid = LiUuidUtil::createNil();
}

void LiUuid::create() {
    _uuid = LiUuidUtil::create();
}

void LiUuid::fromString(const LiString& text) {
    _uuid = LiUuidUtil::fromString(text);
}

LiString LiUuid::toString() const {
    return LiUuidUtil::toString(_uuid);
}

bool LiUuid::equal(const LiUuid& other) const {
    return LiUuidUtil::equal(_uuid, other._uuid);
}

int LiUuid::compare(const LiUuid& other) const {
    return LiUuidUtil::compare(_uuid, other._uuid);
}

bool LiUuid::isNil() const {
    return LiUuidUtil::isNil(_uuid);
}

std::uint64_t LiUuid::hash() const {
    return LiUuidUtil::hash(_uuid);
}

}  // namespace Orv
