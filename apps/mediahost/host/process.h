#pragma once

#include <cstdint>

namespace MediaHost {

/// What the operating system knows of this program, and what its user asks of it.
namespace Process {

/// From now on Ctrl-C, and being told to terminate, only count; the second one ends the program at
/// once, with code 130.
void catchInterrupts();
bool isInterrupted();

bool isTerminal();             ///< Does a person see what the program writes?
std::uint64_t getPeakBytes();  ///< The most memory the program has had at a time.
double getProcessorSeconds();  ///< Spent by all its threads.
double getSecondsSinceStart();

}  // namespace Process
}  // namespace MediaHost
