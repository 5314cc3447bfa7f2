#pragma once
// What the system says about the current start of the machine and about other processes: enough to
// tell whether the process that left a file behind can still be running.
#include <cstdint>
#include <string>

namespace sys {

// Eight hexadecimal digits that differ from one start of the system to the next ("00000000" when
// the system does not say).
std::string BootTag();
// When the system started, in seconds since 1970; 0 when unknown.
std::int64_t BootTime();
// False when process `pid` certainly stopped after it was seen at `seenAt` (seconds since 1970):
// no process has that number now, or the one that has it started later than that. True otherwise,
// including when the system does not say.
bool MayStillRun(long pid, std::int64_t seenAt);

} // namespace sys
