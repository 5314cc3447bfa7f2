// An ASCII preview reads the header lines and at most 20 data lines, however long a line is. Measures
// a parse of files with one very long line in the header and with very wide data lines.
#include "parsers/AsciiFilePreviewParser.h"
#include "templates/AsciiSpecification.h"
#include "tests/support/ScratchFolder.h"

#include <benchmark/benchmark.h>

#include <cstdio>
#include <fstream>
#include <string>

namespace {

// A comment line of `bytes` characters, the name line, then 1000 short data lines.
std::string LongCommentFile(long bytes)
{
    const std::string path = testsupport::ProgramScratchFile("comment.txt");
    std::ofstream out(path, std::ios::binary);
    out << std::string(static_cast<size_t>(bytes), 'x') << "\nTime\tA\tB\n";
    for (int i = 0; i < 1000; ++i)
        out << "2020/01/01 00:00:00\t1.5\t2.5\n";
    return path;
}

// Names and data lines with `items` item columns (about 5 bytes a field).
std::string WideFile(long items)
{
    const std::string path = testsupport::ProgramScratchFile("wide.txt");
    std::ofstream out(path, std::ios::binary);
    out << "header\nTime";
    for (long i = 0; i < items; ++i)
        out << "\tI" << i % 1000;
    out << '\n';
    for (int line = 0; line < 25; ++line) {
        out << "2020/01/01 00:00:00";
        for (long i = 0; i < items; ++i)
            out << "\t1." << i % 10;
        out << '\n';
    }
    return path;
}

void Run(benchmark::State& state, const std::string& path)
{
    CAsciiSpecification spec;
    spec.m_DataDesc.m_nUnitTypeOption = 0;
    spec.m_DataDesc.m_nUnitOption = 0;
    spec.m_DataDesc.m_nValueTypeOption = 0;
    ui::SilentUserInterface silent;
    ui::ScopedUserInterface scope(silent);
    CAsciiFilePreviewParser parser;
    parser.m_pSpecification = &spec;
    parser.SetFile(path);
    for (auto _ : state) {
        if (!parser.Parse("")) {
            state.SkipWithError("the parse failed");
            break;
        }
    }
    std::ifstream file(path, std::ios::binary | std::ios::ate);
    state.counters["file_MB"] = static_cast<double>(file.tellg()) / 1e6;
    state.counters["rows"] = static_cast<double>(parser.m_vecRows.size());
    std::remove(path.c_str());
}

void BM_AsciiPreviewLongHeaderLine(benchmark::State& state) { Run(state, LongCommentFile(state.range(0))); }
void BM_AsciiPreviewWideLines(benchmark::State& state) { Run(state, WideFile(state.range(0))); }

} // namespace

// The longest comment line a text file may have (sys::kLongestTextLine bytes with its line end).
BENCHMARK(BM_AsciiPreviewLongHeaderLine)->Arg((4 << 20) - 1)->Unit(benchmark::kMillisecond);
BENCHMARK(BM_AsciiPreviewWideLines)->Arg(1000)->Arg(100000)->Unit(benchmark::kMillisecond);

BENCHMARK_MAIN();
