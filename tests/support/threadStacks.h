#pragma once

namespace Orv {

/// Call first in main: what threads exist by then, apart from the caller, belong to a sanitizer and
/// cannot be asked.
void prepareThreadStacks();

/// Writes to standard error what every thread of this process is doing: its id, its name where it
/// has one, and its calls. For the last words of a program; may be called once.
void writeThreadStacks();

}  // namespace Orv
