#pragma once

#include "inInit.h"
#include "resmgtApi.h"

namespace Orv {

namespace OrvInit {

// Tags of the packages of libORVresmgt; each module defines the objects of its own packages.

class locks {};              ///< Locks and waits.
class dynamicAllocation {};  ///< Arenas and allocators.
class smartPtrs {};          ///< Counted pointers.
class containers {};         ///< Iterators and lists.
class literals {};           ///< Strings, UUIDs, dates and timecodes.
class memoryBuffers {};      ///< Buffers and their managers.
class threads {};            ///< Threads, thread data and utilities.
class threadExtensions {};   ///< Pools, tasks and requests.
class syncEngine {};         ///< Generators and clients.
class xml {};                ///< XML writing.
class deviceProtocol {};     ///< The device side: properties, streams, state machines.
class deviceManager {};      ///< The application's side: registry, manager and access objects.
class resmgt {};             ///< The whole library: who depends on it depends on all of it.

}  // namespace OrvInit

/// Kept inside libORVresmgt, so that a program whose package depends on OrvInit::resmgt loads the
/// library even if it calls nothing else in it.
template <>
class InInit<OrvInit::resmgt> {
public:
    ORV_RESMGT_API static const std::type_info& getType() noexcept;
};

}  // namespace Orv
