#include "guess/SheetSample.h"

#include "formats/workbook/WorkbookReader.h"

namespace guess {
namespace {

SampleCell CellOf(const sheet::WorkbookReader& workbook, const sheet::RowCell& cell)
{
    SampleCell sampled;
    sampled.text = cell.text;
    switch (cell.value.type) {
    case sheet::Variant::Number:
    case sheet::Variant::Boolean:
        sampled.numberCell = true;
        sampled.number = cell.value.number;
        sampled.dateCell = cell.value.type == sheet::Variant::Number && workbook.ShowsDateTime(cell);
        break;
    case sheet::Variant::Error: sampled.text.clear(); break; // an error reads as a missing value
    default: break;
    }
    return sampled;
}

} // namespace

bool ReadSheetSample(const std::string& path, size_t maxRows, Sample& sample, std::string& error)
{
    sample = Sample();
    sample.excel = true;
    sheet::WorkbookReader workbook;
    if (const sys::Status opened = workbook.Open(path); !opened) {
        error = opened.problem().Describe();
        return false;
    }
    for (int number = 1; number <= workbook.SheetCount() && sample.rows.empty(); ++number) {
        sample.sheet = number;
        bool stopped = false;
        const sys::Status read = workbook.ReadRows(number, [&](int row, const std::vector<sheet::RowCell>& cells) {
            if (sample.rows.size() == maxRows) {
                stopped = true;
                return false;
            }
            SampleRow sampled;
            sampled.number = row;
            for (const sheet::RowCell& cell : cells) {
                if (cell.column < 1)
                    continue;
                sampled.cells.resize(static_cast<size_t>(cell.column));
                sampled.cells[static_cast<size_t>(cell.column - 1)] = CellOf(workbook, cell);
            }
            sample.rowsRead = row;
            sample.rows.push_back(std::move(sampled));
            return true;
        });
        if (!read && !stopped) {
            error = read.problem().Describe();
            return false;
        }
        sample.wholeFile = !stopped;
    }
    if (sample.rows.empty())
        sample.sheet = 1;
    return true;
}

} // namespace guess
