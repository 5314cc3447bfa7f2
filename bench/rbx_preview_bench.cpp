// The rbx0 preview reads every time step into the result table. Measures the time of a parse and its
// memory: the table's own bytes (vectors and strings, counted from their capacities) against the
// process's peak resident memory during the parse, and what showing the preview adds to that peak.
#include "parsers/RbxPreviewFileParser.h"
#include "platform/rbx/RbxWriter.h"
#include "platform/units/Units.h"

#include "PeakMemory.h"

#include <benchmark/benchmark.h>

#include <cstdio>
#include <fstream>
#include <map>
#include <string>
#include <unistd.h>

namespace {

constexpr int kItems = 10;

std::string MakeFile(long steps)
{
    static std::map<long, std::string> made;
    if (auto found = made.find(steps); found != made.end())
        return found->second;
    const std::string path = "/tmp/velmora-bench-" + std::to_string(::getpid()) + "-" + std::to_string(steps) + ".rbx0";
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

// The bytes the table holds on the heap, without allocator overhead.
double TableBytes(const ui::Rows& rows)
{
    double bytes = static_cast<double>(rows.capacity() * sizeof(ui::Row));
    for (const ui::Row& row : rows) {
        bytes += static_cast<double>(row.capacity() * sizeof(std::string));
        for (const std::string& cell : row)
            if (cell.capacity() > 15) // longer texts live outside the string object
                bytes += static_cast<double>(cell.capacity() + 1);
    }
    return bytes;
}

using benchmemory::ResetPeak;
using benchmemory::StatusKilobytes;

void BM_RbxPreviewParse(benchmark::State& state)
{
    const std::string path = MakeFile(state.range(0));
    if (path.empty()) {
        state.SkipWithError("cannot write the rbx0 file");
        return;
    }
    for (auto _ : state) {
        ResetPeak();
        const double before = static_cast<double>(StatusKilobytes("VmRSS:")) * 1024.0;
        double table = 0.0, peak = 0.0;
        {
            CRbxPreviewFileParser parser;
            if (!parser.Parse(path)) {
                state.SkipWithError("the parse failed");
                return;
            }
            state.PauseTiming();
            table = TableBytes(parser.m_vecRows);
            peak = static_cast<double>(StatusKilobytes("VmHWM:")) * 1024.0;
            state.counters["rows"] = static_cast<double>(parser.m_vecRows.size());
            ui::SilentUserInterface silent;
            ui::ScopedUserInterface scope{silent};
            parser.ShowPreview("");
            state.counters["show_adds_MB"] = (static_cast<double>(StatusKilobytes("VmHWM:")) * 1024.0 - peak) / 1e6;
            state.ResumeTiming();
        }
        state.counters["table_MB"] = table / 1e6;
        state.counters["peak_growth_MB"] = (peak - before) / 1e6;
        state.counters["peak_per_table"] = table > 0 ? (peak - before) / table : 0.0;
    }
    std::remove(path.c_str());
}

} // namespace

BENCHMARK(BM_RbxPreviewParse)->Arg(100000)->Arg(1000000)->Arg(10000000)->Iterations(1)->Unit(benchmark::kMillisecond);

BENCHMARK_MAIN();
