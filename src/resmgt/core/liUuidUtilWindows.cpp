#include <bit>
#include <rpc.h>
#include <windows.h>

#include "liUuidEx.h"
#include "liUuidUtil.h"
#include "sourceFile.h"

namespace Orv {

namespace {

using Uuid = LiUuidTypes::Uuid;

::UUID toSystem(const Uuid& uuid) noexcept {
    return std::bit_cast<::UUID>(uuid);
}

Uuid fromSystem(const ::UUID& uuid) noexcept {
    return std::bit_cast<Uuid>(uuid);
}

void check(RPC_STATUS status, int line, const char* function) {
    if (status != RPC_S_OK) throw LiUuidEx::ExInternalError(ORV_FILE, line, function);
}

/// A text of the RPC runtime, given back to it.
class RpcText {
public:
    RpcText() = default;
    RpcText(const RpcText&) = delete;
    ~RpcText() {
        if (chars != nullptr) ::RpcStringFreeA(&chars);
    }

    RPC_CSTR chars = nullptr;
};

}  // namespace

LiUuidUtil::Uuid LiUuidUtil::createNil() {
    ::UUID uuid;
    check(::UuidCreateNil(&uuid), __LINE__, "UuidCreateNil");
    return fromSystem(uuid);
}

LiUuidUtil::Uuid LiUuidUtil::create() {
    ::UUID uuid;
    const RPC_STATUS status = ::UuidCreate(&uuid);
    if (status != RPC_S_UUID_LOCAL_ONLY) check(status, __LINE__, "UuidCreate");
    return fromSystem(uuid);
}

LiUuidUtil::Uuid LiUuidUtil::fromString(const LiString& text) {
    ::UUID uuid;
    auto* const chars = reinterpret_cast<RPC_CSTR>(const_cast<char*>(text.getChars()));
    if (!isWellFormed(text) || ::UuidFromStringA(chars, &uuid) != RPC_S_OK) {
        throw LiUuidEx::ExInvalidUuidString(ORV_FILE, __LINE__, text);
    }
    return fromSystem(uuid);
}

LiString LiUuidUtil::toString(const Uuid& uuid) {
    ::UUID system = toSystem(uuid);
    RpcText text;
    check(::UuidToStringA(&system, &text.chars), __LINE__, "UuidToString");
    return LiString(reinterpret_cast<const char*>(text.chars));
}

bool LiUuidUtil::equal(const Uuid& a, const Uuid& b) {
    ::UUID systemA = toSystem(a);
    ::UUID systemB = toSystem(b);
    RPC_STATUS status = RPC_S_OK;
    const int result = ::UuidEqual(&systemA, &systemB, &status);
    check(status, __LINE__, "UuidEqual");
    return result != 0;
}

int LiUuidUtil::compare(const Uuid& a, const Uuid& b) {
    ::UUID systemA = toSystem(a);
    ::UUID systemB = toSystem(b);
    RPC_STATUS status = RPC_S_OK;
    const int result = ::UuidCompare(&systemA, &systemB, &status);
    check(status, __LINE__, "UuidCompare");
    return result;
}

bool LiUuidUtil::isNil(const Uuid& uuid) {
    ::UUID system = toSystem(uuid);
    RPC_STATUS status = RPC_S_OK;
    const int result = ::UuidIsNil(&system, &status);
    check(status, __LINE__, "UuidIsNil");
    return result != 0;
}

std::uint16_t LiUuidUtil::hash(const Uuid& uuid) {
    ::UUID system = toSystem(uuid);
    RPC_STATUS status = RPC_S_OK;
    const unsigned short result = ::UuidHash(&system, &status);
    check(status, __LINE__, "UuidHash");
    return result;
}

}  // namespace Orv
