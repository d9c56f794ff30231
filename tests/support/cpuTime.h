#pragma once

namespace Orv {

/// Processor time that all threads of this process have used up to now: shows that a wait sleeps.
double getProcessCpuSeconds();

}  // namespace Orv
