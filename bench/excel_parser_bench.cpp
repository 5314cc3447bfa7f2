// The Excel preview parser and the engine's Excel header reading over generated .xlsx files:
// BM_ExcelParse and BM_ExcelOpen over 5000 rows of 2 to 150 item columns (one cell per Range call,
// rows up to 20); the preview of tall sheets (time and peak memory); headers of up to 16,000 columns.
#include "converter/Converter.h"
#include "parsers/ExcelFilePreviewParser.h"
#include "templates/ExcelSpecification.h"

#include "PeakMemory.h"
#include "tests/support/ScratchFolder.h"

#include <benchmark/benchmark.h>
#include <xlsxwriter.h>

#include <cstdio>
#include <fstream>
#include <string>

namespace {

constexpr int kRows = 5000;

std::string WriteWorkbook(int items)
{
    const std::string path = testsupport::ProgramScratchFile(std::to_string(items) + ".xlsx");
    lxw_workbook* book = workbook_new(path.c_str());
    lxw_worksheet* sheet = workbook_add_worksheet(book, nullptr);
    lxw_format* date = workbook_add_format(book);
    format_set_num_format(date, "yyyy/mm/dd hh:mm");
    lxw_format* number = workbook_add_format(book);
    format_set_num_format(number, "0.00");
    worksheet_write_string(sheet, 1, 0, "Date", nullptr);
    for (int c = 1; c <= items; ++c)
        worksheet_write_string(sheet, 1, static_cast<lxw_col_t>(c), ("Item " + std::to_string(c)).c_str(), nullptr);
    for (int r = 2; r < kRows + 2; ++r) {
        worksheet_write_number(sheet, static_cast<lxw_row_t>(r), 0, 44333.0 + r / 24.0, date);
        for (int c = 1; c <= items; ++c)
            worksheet_write_number(sheet, static_cast<lxw_row_t>(r), static_cast<lxw_col_t>(c), r * 0.5 + c, number);
    }
    workbook_close(book);
    return path;
}

void BM_ExcelParse(benchmark::State& state)
{
    const int items = static_cast<int>(state.range(0));
    const std::string path = WriteWorkbook(items);
    CExcelSpecification spec;
    spec.m_DataDesc.m_nUnitTypeOption = 0;
    spec.m_DataDesc.m_nUnitOption = 0;
    spec.m_DataDesc.m_nValueTypeOption = 0;
    CExcelFilePreviewParser parser;
    parser.m_pSpecification = &spec;
    for (auto _ : state) {
        parser.SetFile(path); // forget the cached column count, as a new file would
        if (!parser.Parse(""))
            state.SkipWithError("parse failed");
    }
    state.counters["cells"] = benchmark::Counter(static_cast<double>(20 * (items + 1)), benchmark::Counter::kIsIterationInvariantRate);
    std::remove(path.c_str());
}

// Opening and closing alone, for comparison.
void BM_ExcelOpen(benchmark::State& state)
{
    const std::string path = WriteWorkbook(static_cast<int>(state.range(0)));
    CExcelFilePreviewParser parser;
    CString message;
    for (auto _ : state) {
        if (!parser.OpenWorkbook(path, message))
            state.SkipWithError("open failed");
        parser.CloseWorkbook();
    }
    std::remove(path.c_str());
}

using benchmemory::ResetPeak;
using benchmemory::StatusKilobytes;

// A sheet in the engine's layout: types in row 1, names in row 2, then `rows` rows of a date and
// `items` values, written row by row (libxlsxwriter's constant memory mode).
std::string WriteEngineLayout(const std::string& name, int rows, int items)
{
    const std::string path = testsupport::ProgramScratchFile(name + ".xlsx");
    lxw_workbook_options options{};
    options.constant_memory = LXW_TRUE;
    lxw_workbook* book = workbook_new_opt(path.c_str(), &options);
    lxw_worksheet* sheet = workbook_add_worksheet(book, nullptr);
    lxw_format* date = workbook_add_format(book);
    format_set_num_format(date, "yyyy/mm/dd hh:mm:ss");
    for (int c = 1; c <= items; ++c)
        worksheet_write_string(sheet, 0, static_cast<lxw_col_t>(c), "Undefined[Undefined]:Instantaneous", nullptr);
    worksheet_write_string(sheet, 1, 0, "Date", nullptr);
    for (int c = 1; c <= items; ++c)
        worksheet_write_string(sheet, 1, static_cast<lxw_col_t>(c), ("Item " + std::to_string(c)).c_str(), nullptr);
    for (int r = 2; r < rows + 2; ++r) {
        worksheet_write_number(sheet, static_cast<lxw_row_t>(r), 0, 44333.0 + r / 1440.0, date);
        for (int c = 1; c <= items; ++c)
            worksheet_write_number(sheet, static_cast<lxw_row_t>(r), static_cast<lxw_col_t>(c), r * 0.5 + c, nullptr);
    }
    workbook_close(book);
    return path;
}

// The preview of a tall sheet (argument: data rows; 10 items): the parser reads the used range's
// size and rows 1 to 20 only, yet opening counts every cell of the sheet once.
void BM_ExcelPreviewTall(benchmark::State& state)
{
    const std::string path = WriteEngineLayout("tall", static_cast<int>(state.range(0)), 10);
    CExcelSpecification spec;
    CExcelFilePreviewParser parser;
    parser.m_pSpecification = &spec;
    for (auto _ : state) {
        ResetPeak();
        const double before = static_cast<double>(StatusKilobytes("VmRSS:"));
        parser.SetFile(path);
        if (!parser.Parse(""))
            state.SkipWithError("parse failed");
        state.counters["peak_growth_MB"] = (static_cast<double>(StatusKilobytes("VmHWM:")) - before) / 1024.0;
    }
    state.counters["peak_MB"] = static_cast<double>(StatusKilobytes("VmHWM:")) / 1024.0;
    std::remove(path.c_str());
}

// A header of many columns (argument: items; one data row): the engine's reading of the header rows
// and the preview's parse.
void BM_ExcelSeriesHeaderWide(benchmark::State& state)
{
    const std::string path = WriteEngineLayout("wide", 1, static_cast<int>(state.range(0)));
    sys::Status status;
    std::unique_ptr<CSpecification> spec = converter::LoadTemplate(sys::FileFormat::Excel, "", status);
    for (auto _ : state) {
        std::unique_ptr<converter::SeriesReader> reader = converter::MakeReader(sys::FileFormat::Excel, spec.get());
        if (!reader->Open(path) || reader->Header().items.size() != static_cast<size_t>(state.range(0)))
            state.SkipWithError("open failed");
    }
    std::remove(path.c_str());
}

void BM_ExcelPreviewWide(benchmark::State& state)
{
    const std::string path = WriteEngineLayout("wide", 1, static_cast<int>(state.range(0)));
    CExcelSpecification spec;
    CExcelFilePreviewParser parser;
    parser.m_pSpecification = &spec;
    for (auto _ : state) {
        parser.SetFile(path);
        if (!parser.Parse("") || parser.m_vecItemNames.size() != static_cast<size_t>(state.range(0)) + 1)
            state.SkipWithError("parse failed");
    }
    std::remove(path.c_str());
}

BENCHMARK(BM_ExcelOpen)->Arg(2)->Arg(50)->Unit(benchmark::kMillisecond);
BENCHMARK(BM_ExcelParse)->Arg(2)->Arg(50)->Arg(150)->Unit(benchmark::kMillisecond);
BENCHMARK(BM_ExcelPreviewTall)->Arg(100000)->Arg(1000000)->Unit(benchmark::kMillisecond)->Iterations(1);
BENCHMARK(BM_ExcelSeriesHeaderWide)->Arg(1000)->Arg(4000)->Arg(16000)->Unit(benchmark::kMillisecond);
BENCHMARK(BM_ExcelPreviewWide)->Arg(1000)->Arg(4000)->Arg(16000)->Unit(benchmark::kMillisecond);

} // namespace

BENCHMARK_MAIN();
