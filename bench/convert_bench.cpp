// Conversion speed: a generated time-series text (a "YYYY/MM/DD HH:mm:ss" stamp and 10 values a
// row) converted to rbx0 and back, and to .xlsx, with MB/s, rows/s and the process's peak memory;
// and the reading of its values alone.
// Rows: VELMORA_BENCH_ROWS (default 1,000,000; the .xlsx case takes a tenth).
#include "converter/Converter.h"
#include "converter/NumberText.h"
#include "converter/StampText.h"
#include "templates/Specification.h"
#include "tests/support/ScratchFolder.h"

#include <benchmark/benchmark.h>

#include <algorithm>
#include <charconv>
#include <cstdio>
#include <cstdlib>
#include <filesystem>
#include <random>
#include <string>
#include <sys/resource.h>

namespace {

namespace fs = std::filesystem;

size_t Rows()
{
    const char* rows = std::getenv("VELMORA_BENCH_ROWS");
    return rows ? std::strtoull(rows, nullptr, 10) : 1000000;
}

fs::path Folder()
{
    static const testsupport::ScratchFolder folder("velmora-bench");
    return folder.Path();
}

std::string MakeText(size_t rows)
{
    const fs::path path = Folder() / ("series-" + std::to_string(rows) + ".txt");
    if (fs::exists(path))
        return path.string();
    std::FILE* out = std::fopen(path.c_str(), "wb");
    std::string head;
    for (int i = 0; i < 10; ++i)
        head += std::string(i ? "\t" : "") + "Undefined[Undefined]:Instantaneous";
    std::fprintf(out, "%s\nDate/time", head.c_str());
    for (int i = 0; i < 10; ++i)
        std::fprintf(out, "\tV%d", i);
    std::fputc('\n', out);
    std::mt19937 random(1);
    std::uniform_real_distribution<double> value(0, 1000);
    converter::Stamp stamp = *converter::StampFromFields({2000, 1, 1, 0, 0, 0});
    char line[256];
    for (size_t r = 0; r < rows; ++r, stamp += 60) {
        char* p = converter::FormatStamp(stamp, line);
        for (int i = 0; i < 10; ++i)
            p += std::snprintf(p, 16, "\t%.4f", value(random));
        *p++ = '\n';
        std::fwrite(line, 1, static_cast<size_t>(p - line), out);
    }
    std::fclose(out);
    return path.string();
}

double PeakMegabytes()
{
    rusage usage{};
    getrusage(RUSAGE_SELF, &usage);
    return static_cast<double>(usage.ru_maxrss) / 1024.0;
}

void Run(benchmark::State& state, sys::FileFormat in, const std::string& input, sys::FileFormat out, size_t rows)
{
    const std::string output = (Folder() / (std::string("out") + sys::FormatInfo(out).outputExtension)).string();
    std::unique_ptr<CSpecification> spec;
    sys::Status status;
    spec = converter::LoadTemplate(in, "", status);
    const double inputBytes = static_cast<double>(fs::file_size(input));
    for (auto _ : state) {
        converter::FileJob job{in, input, spec.get(), {}, out, output, "bench"};
        converter::FileReport report = converter::ConvertFile(job);
        if (!report.converted)
            state.SkipWithError(report.problem.Describe().c_str());
    }
    state.counters["MB/s"] = benchmark::Counter(inputBytes / 1e6, benchmark::Counter::kIsIterationInvariantRate);
    state.counters["rows/s"] = benchmark::Counter(static_cast<double>(rows), benchmark::Counter::kIsIterationInvariantRate);
    state.counters["peak_MB"] = PeakMegabytes();
}

void TextToRbx0(benchmark::State& state)
{
    Run(state, sys::FileFormat::Ascii, MakeText(Rows()), sys::FileFormat::Rbx0, Rows());
}

void Rbx0ToText(benchmark::State& state)
{
    const std::string text = MakeText(Rows());
    const std::string rbx0 = (Folder() / "in.rbx0").string();
    sys::Status status;
    auto spec = converter::LoadTemplate(sys::FileFormat::Ascii, "", status);
    converter::ConvertFile({sys::FileFormat::Ascii, text, spec.get(), {}, sys::FileFormat::Rbx0, rbx0, ""});
    Run(state, sys::FileFormat::Rbx0, rbx0, sys::FileFormat::Ascii, Rows());
}

void TextToXlsx(benchmark::State& state)
{
    const size_t rows = std::max<size_t>(1, Rows() / 10);
    Run(state, sys::FileFormat::Ascii, MakeText(rows), sys::FileFormat::Excel, rows);
}

// Reading the benchmark's values ("%.4f" of 0 to 1000), ten fields a line: each plain field reader
// this processor has (argument: its place in the list, the fastest last), and the digit loop.
struct ValueLines {
    std::string text;
    std::vector<converter::FieldSpan> spans;
};

const ValueLines& MakeValueLines()
{
    static const ValueLines lines = [] {
        ValueLines made;
        std::mt19937 random(1);
        std::uniform_real_distribution<double> value(0, 1000);
        char field[32];
        for (size_t i = 0; i < 10 * 100000; ++i) {
            const int length = std::snprintf(field, sizeof field, "%.4f", value(random));
            made.spans.push_back({static_cast<std::uint32_t>(made.text.size()), static_cast<std::uint32_t>(length)});
            made.text.append(field, static_cast<size_t>(length));
            made.text.push_back('\t');
        }
        made.text.append(converter::kPlainFieldReach, ' ');
        return made;
    }();
    return lines;
}

void PlainFields(benchmark::State& state)
{
    const ValueLines& lines = MakeValueLines();
    const auto readers = converter::PlainFieldsReadersOfThisProcessor();
    const auto choice = static_cast<size_t>(state.range(0));
    if (choice >= readers.size()) {
        state.SkipWithError("this processor has no such reader");
        return;
    }
    std::vector<double> values(10);
    for (auto _ : state)
        for (size_t line = 0; line < lines.spans.size(); line += 10) {
            if (readers[choice](lines.text.data(), lines.spans.data() + line, 10, values.data()) != 10)
                state.SkipWithError("a value did not read");
            benchmark::DoNotOptimize(values.data());
        }
    state.counters["values/s"] = benchmark::Counter(static_cast<double>(lines.spans.size()), benchmark::Counter::kIsIterationInvariantRate);
}

void DigitLoop(benchmark::State& state)
{
    const ValueLines& lines = MakeValueLines();
    for (auto _ : state)
        for (const converter::FieldSpan& span : lines.spans) {
            double value = 0;
            const char* const field = lines.text.data() + span.start;
            benchmark::DoNotOptimize(converter::ScanPlainDecimal(field, field + span.length, value));
            benchmark::DoNotOptimize(value);
        }
    state.counters["values/s"] = benchmark::Counter(static_cast<double>(lines.spans.size()), benchmark::Counter::kIsIterationInvariantRate);
}

// Values that are not plain decimals, the general reading's work: 4 decimals after a comma
// (range 0: "123,4567"), 8 decimals after a comma (1), scientific form with a point (2). A fourth of
// them negative.
std::vector<std::string> GeneralNumbers(int kind)
{
    std::mt19937_64 random(1);
    std::vector<std::string> fields;
    for (int i = 0; i < 4096; ++i) {
        std::string field;
        if (kind == 0)
            field = std::to_string(random() % 1000) + "," + std::to_string(10000 + random() % 90000).substr(1);
        else if (kind == 1)
            field = std::to_string(random() % 100000) + "," + std::to_string(1000000000 + random() % 900000000).substr(1);
        else
            field = std::to_string(random() % 10) + "." + std::to_string(10000 + random() % 90000).substr(1) + "e" +
                    std::to_string(random() % 30);
        fields.push_back(random() % 4 == 0 ? "-" + field : field);
    }
    return fields;
}

// The reader as conversions use it (NumberReader with the template's separator).
void GeneralNumberReading(benchmark::State& state)
{
    const int kind = static_cast<int>(state.range(0));
    const std::vector<std::string> fields = GeneralNumbers(kind);
    const converter::NumberReader reader(kind == 2 ? "." : ",");
    for (auto _ : state)
        for (const std::string& field : fields) {
            double value = 0;
            if (reader.Read(field, value) != converter::ValueText::Number)
                state.SkipWithError("a value did not read");
            benchmark::DoNotOptimize(value);
        }
    state.counters["values/s"] = benchmark::Counter(static_cast<double>(fields.size()), benchmark::Counter::kIsIterationInvariantRate);
}

// The same texts, the separator written as a point, read by std::from_chars as the reader did before
// it took fast_float.
void GeneralNumberFromChars(benchmark::State& state)
{
    std::vector<std::string> fields = GeneralNumbers(static_cast<int>(state.range(0)));
    for (std::string& field : fields)
        std::replace(field.begin(), field.end(), ',', '.');
    for (auto _ : state)
        for (const std::string& field : fields) {
            double value = 0;
            std::from_chars(field.data(), field.data() + field.size(), value);
            benchmark::DoNotOptimize(value);
        }
    state.counters["values/s"] = benchmark::Counter(static_cast<double>(fields.size()), benchmark::Counter::kIsIterationInvariantRate);
}

BENCHMARK(PlainFields)->Arg(0)->Arg(1)->Unit(benchmark::kMillisecond);
BENCHMARK(GeneralNumberReading)->DenseRange(0, 2);
BENCHMARK(GeneralNumberFromChars)->DenseRange(0, 2);
BENCHMARK(DigitLoop)->Unit(benchmark::kMillisecond);
BENCHMARK(TextToRbx0)->Unit(benchmark::kMillisecond)->Iterations(3)->UseRealTime();
BENCHMARK(Rbx0ToText)->Unit(benchmark::kMillisecond)->Iterations(3)->UseRealTime();
BENCHMARK(TextToXlsx)->Unit(benchmark::kMillisecond)->Iterations(1)->UseRealTime();

} // namespace

int main(int argc, char** argv)
{
    benchmark::Initialize(&argc, argv);
    benchmark::RunSpecifiedBenchmarks();
    benchmark::Shutdown();
    return 0;
}
