#pragma once
// Reads whole sheets of a workbook row by row, for conversions: each row's cells come with their
// raw value and the text the sheet displays. Memory stays bounded by one row plus what the
// reader holds for the whole workbook (.xlsx: the shared strings; .xls: the shared texts).
#include "formats/workbook/CellValue.h"
#include "formats/workbook/WorkbookImport.h"

#include <functional>
#include <string>
#include <vector>

namespace sheet {

struct RowCell {
    int column = 0; // from 1
    Variant value;  // Number (dates as serial numbers), Text, Boolean or Error
    std::string text; // what the sheet displays; empty for a non-text cell outside the text columns
    unsigned style = 0;
    bool formulaWithoutResult = false; // an empty text that stands for a formula's missing result
};

class WorkbookReader {
public:
    // Receives the row number (from 1) and the row's non-blank cells in column order; returns
    // false to stop reading. Rows without cells are not reported.
    using RowCallback = std::function<bool(int row, const std::vector<RowCell>& cells)>;

    explicit WorkbookReader(ImportLimits limits = ImportLimits()) : m_limits(limits) {}

    // Opens `path` (the content tells .xlsx from .xls) and reads its sheet names, stopping
    // before the first cell: damage further in shows when the rows are read. A failure's message
    // names the file and the cause as automation words it ("Cannot open <path>: <why>").
    sys::Status Open(const std::string& path);
    int SheetCount() const { return static_cast<int>(m_sheetNames.size()); }
    const std::vector<std::string>& SheetNames() const { return m_sheetNames; }

    // Reads sheet `sheet` (from 1) from its first row to its last, or until `onRow` says stop.
    // With `textColumns`, numbers, booleans and errors get their displayed text only in the
    // columns it marks true (indexed by column): rendering a number through its format costs
    // more than reading it, and a conversion needs the texts of a few columns only.
    sys::Status ReadRows(int sheet, const RowCallback& onRow, const std::vector<bool>* textColumns = nullptr);

    // What the sheet displays for `cell`, for one read without its text.
    std::string DisplayedText(const RowCell& cell) const { return m_styles.Format(cell.style).Render(cell.value); }
    // True when the cell's number format shows numbers as dates or times.
    bool ShowsDateTime(const RowCell& cell) const { return m_styles.Format(cell.style).IsDateTime(); }

    // How the last Open or ReadRows ended.
    const sys::Status& status() const { return m_status; }

private:
    ImportLimits m_limits;
    std::string m_path;
    std::vector<std::string> m_sheetNames;
    StyleTable m_styles;
    sys::Status m_status;
};

} // namespace sheet
