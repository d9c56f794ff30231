#pragma once

#include <cstdint>
#include <stdexcept>

#include "exBase.h"
#include "resmgtApi.h"

namespace Orv {

class LiString;

/// Errors of priorities: what was asked of them contradicts itself.
class ORV_RESMGT_API PriorityEx : public ExBase {
public:
    class ExError;
    class ExTransientInvalid;
    class ExRelationInvalid;

protected:
    using ExBase::ExBase;
};

/// No numbers fulfil all relations within the range.
class ORV_RESMGT_API PriorityEx::ExError : public PriorityEx {
protected:
    using PriorityEx::PriorityEx;
};

/// The relations leave no number for a priority: its low bound exceeds its high bound.
class ORV_RESMGT_API PriorityEx::ExTransientInvalid
    : public ExConcrete<ExTransientInvalid, ExError, std::runtime_error> {
public:
    ExTransientInvalid(const char* file, int line, const LiString& priority, std::int64_t low,
                       std::int64_t high);
};

/// A relation cannot hold, given the others; it says with which numbers it fails.
class ORV_RESMGT_API PriorityEx::ExRelationInvalid
    : public ExConcrete<ExRelationInvalid, ExError, std::runtime_error> {
public:
    /// @param kind  as PriorityRelation::relationToString() has it.
    ExRelationInvalid(const char* file, int line, const LiString& relation, const LiString& left,
                      int leftNumber, const char* kind, const LiString& right, int rightNumber);
};

}  // namespace Orv
