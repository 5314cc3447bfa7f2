// A template guess reads the head of a file only: guessing a 1 GiB text file must take the time
// guessing its first megabyte takes. The two files hold the same lines; the large one goes on for
// a gigabyte (VELMORA_GUESS_BENCH_MIB changes its size). Also a guess of a 100,000-row workbook.
#include "guess/TemplateGuess.h"

#include <benchmark/benchmark.h>
#include <xlsxwriter.h>

#include <cstdio>
#include <cstdlib>
#include <string>
#include <unistd.h>

namespace {

std::string TempPath(const char* name) { return "/tmp/velmora-bench-" + std::to_string(::getpid()) + "-" + name; }

// A header (a title, item types, units, names) and then data lines one minute apart, until the file
// holds `bytes` bytes.
std::string SeriesFile(const char* name, long long bytes)
{
    const std::string path = TempPath(name);
    std::FILE* out = std::fopen(path.c_str(), "wb");
    std::fputs("# Velm at Oldbridge, exported for the benchmark\nWater Level\tDischarge\tRainfall\n[m]\t[m^3/s]\t[mm]\n"
               "Time\tLevel\tFlow\tRain\n",
               out);
    long long written = 0;
    char line[128];
    for (long long minute = 0; written < bytes; ++minute) {
        const long long day = minute / 1440;
        const int n = std::snprintf(line, sizeof line, "%04lld/%02lld/%02lld %02lld:%02lld:00\t%lld.%02lld\t%lld.5\t%s\n",
                                    2000 + day / 372, 1 + day / 31 % 12, 1 + day % 28, minute / 60 % 24, minute % 60,
                                    minute % 7, minute % 100, minute % 13, minute % 17 == 3 ? "-999" : "0.2");
        std::fwrite(line, 1, static_cast<size_t>(n), out);
        written += n;
    }
    std::fclose(out);
    return path;
}

void Guess(benchmark::State& state, const std::string& path, guess::InputKind kind)
{
    for (auto _ : state) {
        guess::TemplateGuess guessed = guess::GuessTemplate(path, kind);
        if (!guessed.spec) {
            state.SkipWithError(guessed.refusal ? guessed.refusal->reason.c_str() : "refused");
            break;
        }
        benchmark::DoNotOptimize(guessed);
    }
}

long long LargeBytes()
{
    const char* mib = std::getenv("VELMORA_GUESS_BENCH_MIB");
    return (mib && *mib ? std::atoll(mib) : 1024) * 1024 * 1024;
}

void BM_GuessFirstMegabyte(benchmark::State& state)
{
    const std::string path = SeriesFile("guess-1mib.txt", 1024 * 1024);
    Guess(state, path, guess::InputKind::Ascii);
    std::remove(path.c_str());
}
BENCHMARK(BM_GuessFirstMegabyte)->Unit(benchmark::kMillisecond);

void BM_GuessGigabyte(benchmark::State& state)
{
    const std::string path = SeriesFile("guess-1gib.txt", LargeBytes());
    Guess(state, path, guess::InputKind::Ascii);
    std::remove(path.c_str());
}
BENCHMARK(BM_GuessGigabyte)->Unit(benchmark::kMillisecond);

void BM_GuessWorkbook(benchmark::State& state)
{
    const std::string path = TempPath("guess.xlsx");
    lxw_workbook* book = workbook_new(path.c_str());
    lxw_worksheet* sheet = workbook_add_worksheet(book, nullptr);
    lxw_format* stamp = workbook_add_format(book);
    format_set_num_format(stamp, "yyyy/mm/dd hh:mm");
    worksheet_write_string(sheet, 0, 0, "Time", nullptr);
    worksheet_write_string(sheet, 0, 1, "Level", nullptr);
    for (lxw_row_t row = 1; row <= static_cast<lxw_row_t>(state.range(0)); ++row) {
        worksheet_write_number(sheet, row, 0, 43831 + row / 1440.0, stamp);
        worksheet_write_number(sheet, row, 1, row % 100 / 10.0, nullptr);
    }
    workbook_close(book);
    Guess(state, path, guess::InputKind::Excel);
    std::remove(path.c_str());
}
BENCHMARK(BM_GuessWorkbook)->Arg(1000)->Arg(100000)->Unit(benchmark::kMillisecond);

} // namespace

BENCHMARK_MAIN();
