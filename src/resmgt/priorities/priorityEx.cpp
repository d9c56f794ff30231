#include "priorityEx.h"

#include "formatText.h"
#include "liString.h"

namespace Orv {

PriorityEx::ExTransientInvalid::ExTransientInvalid(const char* file, int line,
                                                   const LiString& priority, std::int64_t low,
                                                   std::int64_t high)
    : ExConcrete(file, line) {
    setReason(formatText("Transient \"%s\" invalid: %lld %lld", priority.getChars(),
                         static_cast<long long>(low), static_cast<long long>(high)));
}

PriorityEx::ExRelationInvalid::ExRelationInvalid(const char* file, int line,
                                                 const LiString& relation, const LiString& left,
                                                 int leftNumber, const char* kind,
                                                 const LiString& right, int rightNumber)
    : ExConcrete(file, line) {
    setReason(formatText("Relation \"%s\" invalid: \"%s\" (%d) %s \"%s\" (%d)", relation.getChars(),
                         left.getChars(), leftNumber, kind, right.getChars(), rightNumber));
}

}  // namespace Orv
