#pragma once
// The process's resident memory as the kernel reports it, for the benchmarks' memory counters.
#include <fstream>
#include <string>

namespace benchmemory {

// A "VmRSS:" or "VmHWM:" (peak) line of /proc/self/status, in kilobytes.
inline long StatusKilobytes(const char* key)
{
    std::ifstream status("/proc/self/status");
    std::string line;
    while (std::getline(status, line))
        if (line.rfind(key, 0) == 0)
            return std::stol(line.substr(std::string(key).size()));
    return 0;
}

// Makes the kernel's peak resident size start again from the current one.
inline void ResetPeak() { std::ofstream("/proc/self/clear_refs") << "5"; }

} // namespace benchmemory
