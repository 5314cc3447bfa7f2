// Parse of a generated .xlsx through the in-process spreadsheet application: one cell per Range
// call, rows up to 20. The sheet holds 5000 rows so that opening the workbook is part of the cost;
// the argument is the number of item columns.
#include "parsers/ExcelFilePreviewParser.h"
#include "templates/ExcelSpecification.h"

#include <benchmark/benchmark.h>
#include <xlsxwriter.h>

#include <cstdio>
#include <string>
#include <unistd.h>

namespace {

constexpr int kRows = 5000;

std::string WriteWorkbook(int items)
{
    const std::string path = "/tmp/velmora_excel_bench_" + std::to_string(getpid()) + "_" + std::to_string(items) + ".xlsx";
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

BENCHMARK(BM_ExcelOpen)->Arg(2)->Arg(50)->Unit(benchmark::kMillisecond);
BENCHMARK(BM_ExcelParse)->Arg(2)->Arg(50)->Arg(150)->Unit(benchmark::kMillisecond);

} // namespace

BENCHMARK_MAIN();
