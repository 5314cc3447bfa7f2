// What a workbook preview costs against the size of the workbook: opening an .xlsx through the
// spreadsheet application and reading the texts of rows 1..20 (the preview's bound), for sheets
// of growing height; the same with a window of every row; streaming a whole sheet through the
// row reader; and rendering number formats. Memory is reported as the process's peak resident
// size after each benchmark (it only grows, so run one benchmark per process to read it alone:
// --benchmark_filter=...).
#include "formats/workbook/NumberFormat.h"
#include "formats/workbook/WorkbookReader.h"
#include "platform/spreadsheet/SpreadsheetApplication.h"
#include "tests/support/ScratchFolder.h"

#include <benchmark/benchmark.h>
#include <xlsxwriter.h>

#include <cstdio>
#include <map>
#include <string>
#include <sys/resource.h>

namespace {

constexpr int kColumns = 5;

std::string MakeWorkbook(long rows)
{
    static std::map<long, std::string> made;
    if (auto found = made.find(rows); found != made.end())
        return found->second;
    const std::string path = testsupport::ProgramScratchFile(std::to_string(rows) + ".xlsx");
    lxw_workbook_options options{};
    options.constant_memory = LXW_TRUE;
    lxw_workbook* book = workbook_new_opt(path.c_str(), &options);
    lxw_worksheet* sheet = workbook_add_worksheet(book, "Data");
    lxw_format* date = workbook_add_format(book);
    format_set_num_format(date, "yyyy/mm/dd hh:mm");
    lxw_format* fixed = workbook_add_format(book);
    format_set_num_format(fixed, "0.00");
    for (long r = 0; r < rows; ++r) {
        worksheet_write_number(sheet, static_cast<lxw_row_t>(r), 0, 44333 + r / 144.0, date);
        for (int c = 1; c < kColumns; ++c)
            worksheet_write_number(sheet, static_cast<lxw_row_t>(r), static_cast<lxw_col_t>(c), (r % 1000) * 0.25 + c, fixed);
    }
    workbook_close(book);
    made[rows] = path;
    return path;
}

double PeakResidentMiB()
{
    rusage usage{};
    getrusage(RUSAGE_SELF, &usage);
    return static_cast<double>(usage.ru_maxrss) / 1024.0;
}

void Preview(benchmark::State& state, int retainedRows)
{
    const std::string path = MakeWorkbook(state.range(0));
    sheet::ApplicationSettings settings;
    settings.load.retainedRows = retainedRows;
    auto app = sheet::StartApplication(settings);
    for (auto _ : state) {
        auto book = app->Workbooks()->Open(path);
        auto ws = book->Worksheets()->Item(1);
        benchmark::DoNotOptimize(ws->UsedRange()->Count());
        for (int row = 1; row <= 20; ++row)
            for (char column = 'A'; column < 'A' + kColumns; ++column)
                benchmark::DoNotOptimize(ws->Range(std::string(1, column) + std::to_string(row))->Text());
        book->Close(false);
    }
    state.counters["peak_MiB"] = PeakResidentMiB();
    state.counters["rows"] = static_cast<double>(state.range(0));
}

void BM_PreviewFirst20Rows(benchmark::State& state) { Preview(state, 1000); }
void BM_PreviewHoldingEveryRow(benchmark::State& state) { Preview(state, 0); }

void BM_StreamWholeSheet(benchmark::State& state)
{
    const std::string path = MakeWorkbook(state.range(0));
    for (auto _ : state) {
        sheet::WorkbookReader reader;
        reader.Open(path);
        long cells = 0;
        reader.ReadRows(1, [&](int, const std::vector<sheet::RowCell>& row) {
            cells += static_cast<long>(row.size());
            return true;
        });
        benchmark::DoNotOptimize(cells);
    }
    state.counters["peak_MiB"] = PeakResidentMiB();
    state.SetItemsProcessed(state.iterations() * state.range(0) * kColumns);
}

void BM_RenderNumberFormats(benchmark::State& state)
{
    const sheet::NumberFormat formats[] = {sheet::NumberFormat("General"), sheet::NumberFormat("#,##0.00"),
                                           sheet::NumberFormat("yyyy/mm/dd hh:mm:ss"), sheet::NumberFormat("0.00E+00")};
    double value = 44333.123;
    for (auto _ : state) {
        for (const auto& format : formats)
            benchmark::DoNotOptimize(format.RenderNumber(value));
        value += 0.001;
    }
    state.SetItemsProcessed(state.iterations() * 4);
}

} // namespace

BENCHMARK(BM_PreviewFirst20Rows)->Arg(1000)->Arg(10000)->Arg(100000)->Arg(400000)->Unit(benchmark::kMillisecond);
BENCHMARK(BM_PreviewHoldingEveryRow)->Arg(1000)->Arg(10000)->Arg(100000)->Arg(400000)->Unit(benchmark::kMillisecond);
BENCHMARK(BM_StreamWholeSheet)->Arg(10000)->Arg(100000)->Unit(benchmark::kMillisecond);
BENCHMARK(BM_RenderNumberFormats);

BENCHMARK_MAIN();
