#pragma once

#include "devACO.h"
#include "lkSema.h"
#include "lkUnnamedSema.h"
#include "rcBase.h"
#include "rcShdPtr.h"

namespace Orv {

/// Completion of a property's get: posts a semaphore of the thread that waits for the value. If it
/// goes without having run, that thread is released with the news that there is no value.
class ORV_RESMGT_API DevMDStdPropertyGetACO : public DevACO {
public:
    /// Both are borrowed, and not touched after the post.
    DevMDStdPropertyGetACO(LkUnnamedSema& sema, bool& success) : _sema(&sema), _success(success) {}
    ~DevMDStdPropertyGetACO() override;

    void performExecute() override;

private:
    LkUnnamedSema* _sema;  // null: posted
    bool& _success;
};

/// The meeting point of a get that may give up: outlives the one that waits.
class ORV_RESMGT_API DevMDStdGetAnswer : public RCBase<LkCounter<long>> {
public:
    ~DevMDStdGetAnswer() noexcept(false) override;

    bool success = true;
    LkSema answered{"DevMDStdProperty::performGet", 0};
    std::atomic<bool> isAnswered{false};
};

/// DevMDStdPropertyGetACO for a get that may give up.
class ORV_RESMGT_API DevMDStdTimedGetACO : public DevACO {
public:
    explicit DevMDStdTimedGetACO(const RCShdPtr<DevMDStdGetAnswer>& answer) : _answer(answer) {}
    ~DevMDStdTimedGetACO() override;

    void performExecute() override;

private:
    RCShdPtr<DevMDStdGetAnswer> _answer;  // null: posted
};

}  // namespace Orv
