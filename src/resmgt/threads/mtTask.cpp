#include "mtTask.h"

namespace Orv {

MtTaskImp::~MtTaskImp() = default;

MtTask::MtTask() noexcept = default;

MtTask::MtTask(MtRequestTag tag, RCShdPtr<MtTaskImp> work) noexcept
    : _tag(std::move(tag)), _work(std::move(work)) {}

}  // namespace Orv
