#pragma once

#include <iosfwd>

#include "resmgtApi.h"

namespace Orv {

/// Values of mutex attributes.
class ORV_RESMGT_API LkMutexAttrTypes {
public:
    /// What happens to the priority of a thread that holds a mutex.
    enum PrioProtocol : int {
        UNIMPLEMENTED = 0,  ///< Whatever the system does.
        NONE = 1,           ///< Nothing.
        INHERIT = 2,        ///< It rises to that of the most urgent waiter.
        PROTECT = 3         ///< It rises to the mutex's ceiling.
    };
};

/// Prints the enumerator's name.
/// @throws ProgramAborted for any other value.
ORV_RESMGT_API std::ostream& operator<<(std::ostream&, LkMutexAttrTypes::PrioProtocol);

}  // namespace Orv
