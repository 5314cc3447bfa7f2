#pragma once
// Readers of the XML parts of an .xlsx package that carry cells: the shared strings, the cell
// styles and the sheets. Each reads one part through an XmlScanner, so a sheet streams straight
// into the sink and is never held whole. Content that cannot be read throws XmlScanner::Error
// naming the part and the byte offset.
#include "formats/workbook/CellAddress.h"
#include "formats/workbook/WorkbookImport.h"
#include "formats/xlsx/XmlScanner.h"

#include <cstdint>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

namespace sheet::xlsx {

// The workbook's shared strings, kept in one block of characters.
class SharedStrings {
public:
    void Add(std::string_view text);
    std::size_t Count() const { return m_ends.size(); }
    std::string_view At(std::size_t index) const;

private:
    std::string m_chars;
    std::vector<std::size_t> m_ends;
};

// Excel itself keeps a workbook to 64,000 cell formats.
constexpr std::size_t kMaxCellFormats = 65536;

struct CellStyles {
    // For each cell format (xf) index: whether its number format shows dates or times.
    std::vector<bool> dateStyles;
};

// <sst>: each <si> is a plain <t>, or rich text whose <r><t> runs join; phonetic runs are left out.
void ReadSharedStrings(XmlScanner& xml, SharedStrings& strings);

// <styleSheet>: the number format of every cell format goes to `table` at the cell format's index.
CellStyles ReadStyles(XmlScanner& xml, StyleTable& table);

struct SheetContext {
    const SharedStrings& strings;
    const CellStyles& styles;
    bool date1904 = false;
    const ImportLimits& limits;
};

// One <c> element as read, before it becomes an ImportedCell.
struct RawCell {
    std::string reference;
    std::string type;
    unsigned style = 0;
    bool hasValue = false;
    bool hasFormula = false;
    std::string value; // <v>
    bool hasInline = false;
    std::string inlineText; // <is>
    std::uint64_t offset = 0; // of the <c> tag in its part
};

// Turns a sheet's <row> and <c> elements, in file order, into cells, whichever parser reads the
// XML. Content that cannot be read throws XmlScanner::Error naming the part and the byte offset.
class CellBuilder {
public:
    CellBuilder(const SheetContext& context, std::string part);

    // A <row> with its "r" attribute, if it has one, at `offset`.
    void StartRow(std::optional<std::string_view> number, std::uint64_t offset);
    // The cell, or null for a blank cell without a style of its own (it does not count).
    const ImportedCell* Build(const RawCell& raw);

private:
    void Place(const RawCell& raw, ImportedCell& cell);
    void Interpret(const RawCell& raw, ImportedCell& cell) const;
    [[noreturn]] void Fail(const std::string& why, std::uint64_t offset) const;
    [[noreturn]] void FailOutsideGrid(int row, int column, std::uint64_t offset) const;
    static std::string CellName(const ImportedCell& cell) { return ColumnLetters(cell.column) + std::to_string(cell.row); }

    const SheetContext& m_context;
    std::string m_part;
    int m_row = 0;    // of the last row or cell
    int m_column = 0; // of the last cell in the row
    ImportedCell m_cell;
};

// <worksheet>: every cell of <sheetData> goes to `sink` as a cell of sheet `index`; false when the
// sink stopped the reading.
bool ReadSheetCells(XmlScanner& xml, const SheetContext& context, int index, ImportSink& sink);

// A cell's number text ("1.5", "1E+15", " -2 "), correctly rounded; nothing when it is not one.
std::optional<double> ParseNumber(std::string_view text);
// ISO 8601 "2021-05-17", "2021-05-17T13:02:03.5Z" or "13:02:03" as a serial day number.
std::optional<double> ParseIsoDate(std::string_view text);

} // namespace sheet::xlsx
