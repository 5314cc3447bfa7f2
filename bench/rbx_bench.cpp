// Writing and reading 1M steps of 10 float items through the streaming writer and reader; the
// counters report rows (steps) per second.
#include "platform/rbx/RbxReader.h"
#include "platform/rbx/RbxWriter.h"
#include "tests/support/ScratchFolder.h"

#include <benchmark/benchmark.h>

#include <cstdio>
#include <string>
#include <vector>

namespace {

constexpr std::size_t kSteps = 1000000;
constexpr std::size_t kItems = 10;

std::string BenchPath() { return testsupport::ProgramScratchFile("bench.rbx0"); }

rbx::FileDefinition Definition()
{
    rbx::FileDefinition definition;
    definition.title = "Benchmark";
    definition.calendarStart = COleDateTime(2000, 1, 1, 0, 0, 0);
    for (std::size_t i = 0; i < kItems; ++i) {
        rbx::ItemInfo item;
        item.name = "Item " + std::to_string(i + 1);
        item.dataType = rbx::kFloat32;
        definition.items.push_back(item);
    }
    return definition;
}

void WriteFile(const std::string& path)
{
    rbx::CRbxWriter writer;
    if (!writer.Open(path, Definition()))
        return;
    double values[kItems];
    for (std::size_t s = 0; s < kSteps; ++s) {
        for (std::size_t i = 0; i < kItems; ++i)
            values[i] = static_cast<double>(s % 1000) * 0.25 + static_cast<double>(i);
        writer.WriteStep(static_cast<double>(s) * 60.0, values);
    }
    writer.Close();
}

void BM_WriteSteps(benchmark::State& state)
{
    const std::string path = BenchPath();
    for (auto _ : state)
        WriteFile(path);
    state.counters["rows/s"] = benchmark::Counter(static_cast<double>(kSteps), benchmark::Counter::kIsIterationInvariantRate);
    std::remove(path.c_str());
}

void BM_ReadSteps(benchmark::State& state)
{
    const std::string path = BenchPath();
    WriteFile(path);
    const auto verify = state.range(0) ? rbx::VerifyChecksum::AtEnd : rbx::VerifyChecksum::AtOpen;
    std::vector<double> times(4096), values(4096 * kItems);
    std::size_t total = 0;
    for (auto _ : state) {
        rbx::CRbxReader reader;
        if (!reader.Open(path, verify)) {
            state.SkipWithError(reader.status().problem().Describe().c_str());
            break;
        }
        std::size_t got = 0;
        total = 0;
        while (reader.ReadSteps(times.size(), times.data(), values.data(), got) && got > 0)
            total += got;
        benchmark::DoNotOptimize(values.data());
    }
    if (total != kSteps)
        state.SkipWithError("not every step was read");
    state.counters["rows/s"] = benchmark::Counter(static_cast<double>(kSteps), benchmark::Counter::kIsIterationInvariantRate);
    std::remove(path.c_str());
}

} // namespace

BENCHMARK(BM_WriteSteps)->Unit(benchmark::kMillisecond)->UseRealTime();
// 0: checksum verified in a pass at open; 1: verified while streaming.
BENCHMARK(BM_ReadSteps)->Arg(0)->Arg(1)->Unit(benchmark::kMillisecond)->UseRealTime();
BENCHMARK_MAIN();
