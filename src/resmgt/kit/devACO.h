#pragma once

#include "devAEO.h"

namespace Orv {

/// Asynchronous completion object: runs once, right after the request that it is attached to.
///
/// One that is destroyed without having run tells whoever waits for it that nothing will come.
class ORV_RESMGT_API DevACO : public DevAEO {
public:
    ~DevACO() override;
};

}  // namespace Orv
