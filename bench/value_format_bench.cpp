// The shortest text of a value, per kind of value: the counter reports values per second. Each
// kind takes its own way through the formatter (four decimals below 10^4, eight significant
// digits, up to fifteen, sixteen, and the library's general form for full-precision doubles).
#include "converter/NumberText.h"

#include <benchmark/benchmark.h>

#include <cmath>
#include <random>
#include <vector>

namespace {

enum Kind { kFourDecimals, kEightDigits, kElevenDigits, kSixteenDigits, kFullPrecision };

std::vector<double> Values(Kind kind)
{
    std::mt19937_64 random(42);
    std::vector<double> values(1 << 16);
    for (double& value : values) {
        switch (kind) {
        case kFourDecimals: value = static_cast<double>(random() % 10000000) / 1e4; break;    // 0 to 999.9999
        case kEightDigits: value = static_cast<double>(random() % 100000000) / 1e2; break;    // to 999999.99
        case kElevenDigits: value = static_cast<double>(random() % 100000000000) / 1e6; break; // to 99999.999999
        case kSixteenDigits: value = 1.0 + static_cast<double>(random() % 1000000000000000) / 1e15; break;
        case kFullPrecision: value = std::ldexp(static_cast<double>(random() >> 11), -40); break;
        }
    }
    return values;
}

void FormatValues(benchmark::State& state)
{
    const std::vector<double> values = Values(static_cast<Kind>(state.range(0)));
    std::vector<char> text(values.size() * 33);
    for (auto _ : state) {
        char* out = text.data();
        for (double value : values) {
            out = converter::FormatValue(value, out);
            *out++ = '\t';
        }
        benchmark::DoNotOptimize(out);
    }
    state.counters["values/s"] =
        benchmark::Counter(static_cast<double>(state.iterations() * values.size()), benchmark::Counter::kIsRate);
}

BENCHMARK(FormatValues)->Arg(kFourDecimals)->Arg(kEightDigits)->Arg(kElevenDigits)->Arg(kSixteenDigits)->Arg(kFullPrecision);

} // namespace

BENCHMARK_MAIN();
