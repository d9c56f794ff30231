#include "mtRequestMgr.h"

#include <limits>
#include <stdexcept>

#include "mtRequestRecordPrivate.h"

namespace Orv {

struct MtRequestMgr::Records {
    MtRequestTag::Record::List list;
};

MtRequestMgr::MtRequestMgr() : _records(std::make_unique<Records>()) {}

MtRequestMgr::~MtRequestMgr() {
    for (const RCShdPtr<MtRequestTag::Record>& record : _records->list) record->markReleased();
}

MtRequestTag MtRequestMgr::acquireTag() {
    const RCShdPtr<MtRequestTag::Record> record(new MtRequestTag::Record(*this));
    const LkGuard guard(_mutex);
    if (_records->list.size() >= std::numeric_limits<std::uint32_t>::max()) {
        throw std::length_error("list too long");
    }
    record->place = _records->list.insert(_records->list.end(), record);
    return MtRequestTag(record);
}

void MtRequestMgr::releaseTag(const MtRequestTag& tag) {
    MtRequestTag::Record::List released;  // freed without the mutex
    const LkGuard guard(_mutex);
    MtRequestTag::Record& record = tag.getRecord(*this);
    record.checkReleasable();
    record.markReleased();
    released.splice(released.end(), _records->list, record.place);
}

void MtRequestMgr::incRequestCount(const MtRequestTag& tag) {
    const LkGuard guard(_mutex);
    tag.getRecord(*this).increment();
}

void MtRequestMgr::decRequestCount(const MtRequestTag& tag) {
    RCShdPtr<MtRequestTag::Record> awaited;
    {
        const LkGuard guard(_mutex);
        if (tag.getRecord(*this).decrement()) awaited = tag._id;
    }
    // Without the mutex: a thread that is woken would only have to wait for it.
    if (awaited) awaited->pulse();
}

unsigned MtRequestMgr::getRequestCount(const MtRequestTag& tag) const {
    const LkGuard guard(_mutex);
    return tag.getRecord(*this).getCount();
}

void MtRequestMgr::waitRequestCountZero(const MtRequestTag& tag) {
    wait(tag, LkTimeLimit());
}

bool MtRequestMgr::timedWaitRequestCountZero(const MtRequestTag& tag, double seconds) {
    return wait(tag, LkTimeLimit(seconds));
}

bool MtRequestMgr::wait(const MtRequestTag& tag, const LkTimeLimit& limit) {
    // The record stays, whoever releases the tag meanwhile.
    const MtRequestTag held = tag;  // NOLINT(performance-unnecessary-copy-initialization)
    const LkGuard guard(_mutex);
    return held.getRecord(*this).waitZero(guard, limit);
}

std::uint32_t MtRequestMgr::getNbTags() const {
    const LkGuard guard(_mutex);
    return static_cast<std::uint32_t>(_records->list.size());
}

}  // namespace Orv
