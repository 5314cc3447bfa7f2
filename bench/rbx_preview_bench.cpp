// The rbx0 preview reads every time step into the result table. Measures the time of a parse and its
// memory: the table's own bytes (vectors and strings, counted from their capacities) against the
// process's peak resident memory during the parse, and what showing the preview adds to that peak.
#include "bench/RbxBenchFiles.h"
#include "parsers/RbxPreviewFileParser.h"

#include <benchmark/benchmark.h>

#include <cstdio>
#include <string>

namespace {

using benchfiles::MakeRbxFile;
using benchfiles::ResetPeak;
using benchfiles::StatusKilobytes;

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

void BM_RbxPreviewParse(benchmark::State& state)
{
    const std::string path = MakeRbxFile(state.range(0));
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
