#pragma once

#include <type_traits>
#include <utility>

#include "mtRequestTag.h"
#include "mtTaskImp.h"
#include "rcShdPtr.h"

namespace Orv {

/// A piece of work and the tag under which it is counted.
///
/// - Threads: a value. Copies share the work.
class ORV_RESMGT_API MtTask {
public:
    MtTask() noexcept;  ///< No work.

    /// @param tag  a default-constructed one: the task is not counted.
    MtTask(MtRequestTag tag, RCShdPtr<MtTaskImp> work) noexcept;

    /// A task that calls the function.
    template <class Function>
    [[nodiscard]] static MtTask create(MtRequestTag tag, Function&& function);

    bool isNull() const noexcept { return _work.isNull(); }
    const MtRequestTag& getTag() const noexcept { return _tag; }
    const RCShdPtr<MtTaskImp>& getWork() const noexcept { return _work; }

    void run() const { _work->performTask(); }  ///< @throws RCEx::ExNullPtr if there is no work.

private:
    template <class Function>
    class FunctionTask;

    MtRequestTag _tag;
    RCShdPtr<MtTaskImp> _work;
};

template <class Function>
class MtTask::FunctionTask final : public MtTaskImp {
public:
    explicit FunctionTask(Function function) : _function(std::move(function)) {}
    void performTask() override { _function(); }

private:
    Function _function;
};

template <class Function>
MtTask MtTask::create(MtRequestTag tag, Function&& function) {
    using Work = FunctionTask<std::decay_t<Function>>;
    return MtTask(std::move(tag), RCShdPtr<MtTaskImp>(new Work(std::forward<Function>(function))));
}

}  // namespace Orv
