#include "devMDStdPropertyGetACO.h"

#include <utility>

namespace Orv {

DevMDStdPropertyGetACO::~DevMDStdPropertyGetACO() {
    if (_sema == nullptr) return;
    _success = false;
    _sema->post();
}

void DevMDStdPropertyGetACO::performExecute() {
    std::exchange(_sema, nullptr)->post();
}

DevMDStdGetAnswer::~DevMDStdGetAnswer() noexcept(false) = default;

DevMDStdTimedGetACO::~DevMDStdTimedGetACO() {
    if (_answer.isNull()) return;
    _answer->success = false;
    performExecute();
}

void DevMDStdTimedGetACO::performExecute() {
    _answer->isAnswered.store(true, std::memory_order_release);
    _answer->answered.post();
    _answer.reset();
}

}  // namespace Orv
