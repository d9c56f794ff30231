#pragma once

#include "devANO.h"

namespace Orv {

class DevMDStdAccessPrtcl;

/// Request of the standard kit, to which the kit attaches completion objects of its own.
class ORV_RESMGT_API DevMDStdANO : public DevANO {
public:
    ~DevMDStdANO() override;

private:
    friend class DevMDStdAccessPrtcl;

    void setBaseACO(ObjPtr<DevACO> aco);
};

}  // namespace Orv
