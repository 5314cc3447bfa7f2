#pragma once
// A workbook as the object model serves it: per sheet the used range over the whole sheet, and
// the cells of its first rows (all rows when the caller asks for them and they fit the budget).
#include "formats/workbook/WorkbookImport.h"

#include <map>
#include <memory>
#include <optional>
#include <string>
#include <utility>
#include <vector>

namespace sheet {

// A block of cells, rows and columns from 1; empty while firstRow is 0.
struct CellRect {
    int firstRow = 0, firstColumn = 0, lastRow = 0, lastColumn = 0;

    bool IsEmpty() const { return firstRow == 0; }
    void Include(int row, int column);
    long long Rows() const { return IsEmpty() ? 0 : lastRow - firstRow + 1; }
    long long Columns() const { return IsEmpty() ? 0 : lastColumn - firstColumn + 1; }
    long long Cells() const { return Rows() * Columns(); }
};

struct StoredCell {
    Variant::Type type = Variant::Empty;
    double number = 0.0;
    std::string text;
    unsigned style = 0;
};

struct LoadOptions {
    int retainedRows = 1000;            // rows whose cells are kept; 0 keeps every row
    std::uint64_t maxStoredCells = 2'000'000; // across the workbook; rows past it are dropped
    ImportLimits limits;
};

class SheetModel {
public:
    explicit SheetModel(std::string name) : m_name(std::move(name)) {}

    const std::string& Name() const { return m_name; }
    // The smallest block holding every cell with a value or a style of its own.
    const CellRect& UsedRect() const { return m_used; }
    // Whether the cells of rows 1..row are all held.
    bool Holds(int row) const { return m_complete || row <= m_heldRows; }
    const StoredCell* Find(int row, int column) const;
    // The cells of `block` that hold a value, when what the sheet holds can tell: the block spans
    // every used row (values are counted per column over the whole sheet), or lies in the held rows.
    std::optional<long long> CountValues(const CellRect& block) const;

    void Add(const ImportedCell& cell, bool keep);
    // Cells are held up to `rows` only (every row before it stays complete).
    void LimitTo(int rows);
    void MarkComplete(bool complete) { m_complete = complete; }
    int HeldRows() const { return m_heldRows; }
    size_t StoredCount() const { return m_cells.size(); }

private:
    std::string m_name;
    CellRect m_used;
    std::vector<long long> m_valuesInColumn; // by column, over every row
    std::map<std::pair<int, int>, StoredCell> m_cells;
    int m_heldRows = 0;
    bool m_complete = true;
};

class WorkbookModel {
public:
    std::string path;
    std::vector<SheetModel> sheets;
    StyleTable styles;

    // Variant of a stored cell (Empty for a blank one).
    static Variant ValueOf(const StoredCell* cell);
    std::string TextOf(const StoredCell* cell) const;
};

// Reads `path` into `model`, keeping what `options` allows.
sys::Status LoadWorkbook(const std::string& path, const LoadOptions& options, std::unique_ptr<WorkbookModel>& model);

// Into `count`, the cells of `block` of sheet `sheet` (from 0) that hold a value, by reading the
// file once more without keeping its cells.
sys::Status CountValuesInFile(const std::string& path, int sheet, const CellRect& block, const ImportLimits& limits,
                              long long& count);

} // namespace sheet
