#pragma once

#include <vector>

namespace Orv {

class DevMDPrtcl;

/// The devices that are in running sequences, of the whole process: a device can follow one
/// sequence only.
///
/// - Threads: any.
class DevSeqClaims {
public:
    using Devices = std::vector<const DevMDPrtcl*>;

    /// All of them or none. @return false if one is in a sequence already.
    [[nodiscard]] static bool add(const Devices& devices);
    static void remove(const DevMDPrtcl& device) noexcept;
};

}  // namespace Orv
