#include "mtRequestTag.h"

#include <limits>

#include "assertions.h"
#include "mtRequestRecordPrivate.h"

namespace Orv {

MtRequestTag::MtRequestTag() noexcept = default;
MtRequestTag::MtRequestTag(const MtRequestTag&) noexcept = default;
MtRequestTag::MtRequestTag(MtRequestTag&&) noexcept = default;
MtRequestTag::~MtRequestTag() = default;
MtRequestTag& MtRequestTag::operator=(const MtRequestTag&) = default;
MtRequestTag& MtRequestTag::operator=(MtRequestTag&&) = default;

MtRequestTag::MtRequestTag(RCShdPtr<Record> id) noexcept : _id(std::move(id)) {}

bool MtRequestTag::isValid() const noexcept {
    return !_id.isNull() && !_id->isReleased();
}

MtRequestTag::Record& MtRequestTag::getRecord(const MtRequestMgr& mgr) const {
    ORV_ASSERT_TEXT(isValid() && _id->isOf(mgr), "tag.isValid()");
    return *_id;
}

void MtRequestTag::Record::increment() {
    ORV_ASSERT_TEXT(_count < std::numeric_limits<std::uint32_t>::max(),
                    "(*tag._id).first < 4294967295");
    ++_count;
}

void MtRequestTag::Record::decrement() {
    ORV_ASSERT_TEXT(_count > 0, "(*tag._id).first > 0");
    if (--_count > 0) return;
    ++_nbZeroes;
    if (_requestZero != nullptr) _requestZero->pulse();
}

bool MtRequestTag::Record::waitZero(const LkGuard<const LkMutex>& guard, const LkTimeLimit& limit) {
    if (_count == 0) return true;
    if (_requestZero == nullptr) {
        _requestZero = std::make_unique<LkPulse>("RequestZero", LkPulse::WAKE_ALL);
    }
    const std::uint64_t nbZeroes = _nbZeroes;
    while (_nbZeroes == nbZeroes) {
        _requestZero->reset();
        if (limit.isInfinite()) {
            _requestZero->wait(guard);
        } else if (!_requestZero->timedWait(guard, limit.getRemainingMilliseconds() * 1e-3)) {
            return _nbZeroes != nbZeroes;
        }
    }
    return true;
}

void MtRequestTag::Record::checkReleasable() const {
    ORV_ASSERT_TEXT(_count == 0, "(*tag._id).first == 0");
}

}  // namespace Orv
