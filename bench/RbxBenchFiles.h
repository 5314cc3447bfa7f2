#pragma once
// What the rbx0 preview benchmarks share: a file of 10 float32 items with a given number of steps,
// and the process's resident memory from the kernel.
#include "bench/PeakMemory.h"
#include "platform/rbx/RbxWriter.h"
#include "platform/units/Units.h"
#include "tests/support/ScratchFolder.h"

#include <fstream>
#include <map>
#include <string>

namespace benchfiles {

constexpr int kItems = 10;

// Writes (once per process) an rbx0 file of `steps` ten-minute steps; empty when it cannot.
inline std::string MakeRbxFile(long steps)
{
    static std::map<long, std::string> made;
    if (auto found = made.find(steps); found != made.end())
        return found->second;
    const std::string path = testsupport::ProgramScratchFile(std::to_string(steps) + ".rbx0");
    rbx::FileDefinition definition;
    definition.timeUnitKey = units::kUnitSecond;
    definition.calendarStart = COleDateTime(2000, 1, 1, 0, 0, 0);
    for (int i = 0; i < kItems; ++i) {
        rbx::ItemInfo item;
        item.name = "Item" + std::to_string(i + 1);
        item.dataType = rbx::kFloat32;
        definition.items.push_back(item);
    }
    rbx::CRbxWriter writer;
    if (!writer.Open(path, definition))
        return std::string();
    double values[kItems];
    for (long t = 0; t < steps; ++t) {
        for (int i = 0; i < kItems; ++i)
            values[i] = (t % 1000) * 0.25 + i;
        writer.WriteStep(t * 600.0, values);
    }
    writer.Close();
    made[steps] = path;
    return path;
}

using benchmemory::ResetPeak;
using benchmemory::StatusKilobytes;

inline double StatusBytes(const char* key) { return static_cast<double>(StatusKilobytes(key)) * 1024.0; }

} // namespace benchfiles
