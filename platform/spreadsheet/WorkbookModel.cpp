#include "platform/spreadsheet/WorkbookModel.h"

#include <algorithm>
#include <climits>

namespace sheet {

void CellRect::Include(int row, int column)
{
    if (IsEmpty()) {
        firstRow = lastRow = row;
        firstColumn = lastColumn = column;
        return;
    }
    firstRow = std::min(firstRow, row);
    lastRow = std::max(lastRow, row);
    firstColumn = std::min(firstColumn, column);
    lastColumn = std::max(lastColumn, column);
}

const StoredCell* SheetModel::Find(int row, int column) const
{
    auto found = m_cells.find({row, column});
    return found == m_cells.end() ? nullptr : &found->second;
}

std::optional<long long> SheetModel::CountValues(const CellRect& block) const
{
    if (block.IsEmpty() || m_used.IsEmpty() || block.lastRow < m_used.firstRow || block.firstRow > m_used.lastRow ||
        block.lastColumn < m_used.firstColumn || block.firstColumn > m_used.lastColumn)
        return 0; // no cell of the sheet lies there
    long long count = 0;
    if (block.firstRow <= m_used.firstRow && block.lastRow >= m_used.lastRow) {
        const int last = std::min<int>(block.lastColumn, static_cast<int>(m_valuesInColumn.size()) - 1);
        for (int column = std::max(block.firstColumn, 0); column <= last; ++column)
            count += m_valuesInColumn[static_cast<size_t>(column)];
        return count;
    }
    if (!Holds(block.lastRow))
        return std::nullopt;
    for (int row = block.firstRow; row <= block.lastRow; ++row)
        for (auto it = m_cells.lower_bound({row, block.firstColumn});
             it != m_cells.end() && it->first.first == row && it->first.second <= block.lastColumn; ++it)
            count += it->second.type != Variant::Empty ? 1 : 0;
    return count;
}

void SheetModel::Add(const ImportedCell& cell, bool keep)
{
    m_used.Include(cell.row, cell.column);
    if (cell.type != Variant::Empty) {
        if (static_cast<size_t>(cell.column) >= m_valuesInColumn.size())
            m_valuesInColumn.resize(static_cast<size_t>(cell.column) + 1, 0);
        ++m_valuesInColumn[static_cast<size_t>(cell.column)];
    }
    if (!keep)
        return;
    m_cells[{cell.row, cell.column}] = StoredCell{cell.type, cell.number, cell.text, cell.style};
}

void SheetModel::LimitTo(int rows)
{
    m_complete = false;
    m_heldRows = rows;
    m_cells.erase(m_cells.lower_bound({rows + 1, 0}), m_cells.end());
}

Variant WorkbookModel::ValueOf(const StoredCell* cell)
{
    Variant value;
    if (cell == nullptr)
        return value;
    value.type = cell->type;
    value.number = cell->number;
    value.text = cell->text;
    return value;
}

std::string WorkbookModel::TextOf(const StoredCell* cell) const
{
    if (cell == nullptr)
        return std::string();
    return styles.Format(cell->style).Render(ValueOf(cell));
}

namespace {

// Keeps the cells of the first rows of every sheet within the cell budget; the used range is
// counted over every cell.
class ModelBuilder : public ImportSink {
public:
    ModelBuilder(WorkbookModel& model, const LoadOptions& options) : m_model(model), m_options(options) {}

    bool AddSheet(const std::string& name) override
    {
        m_model.sheets.emplace_back(name);
        return true;
    }

    bool AddCell(int sheet, const ImportedCell& cell) override
    {
        SheetModel& target = m_model.sheets.at(static_cast<size_t>(sheet));
        bool inWindow = m_options.retainedRows == 0 || cell.row <= m_options.retainedRows;
        bool keep = inWindow && cell.row <= Cutoff(sheet);
        if (keep && m_stored >= m_options.maxStoredCells) {
            // Out of budget: this sheet stays complete only up to the row before this one.
            m_cutoff[sheet] = cell.row - 1;
            target.LimitTo(cell.row - 1);
            keep = false;
        }
        size_t before = target.StoredCount();
        target.Add(cell, keep);
        m_stored += target.StoredCount() - before;
        return true;
    }

    bool EndSheet(int sheet) override
    {
        SheetModel& target = m_model.sheets.at(static_cast<size_t>(sheet));
        if (m_cutoff.count(sheet) == 0 && m_options.retainedRows != 0 &&
            target.UsedRect().lastRow > m_options.retainedRows)
            target.LimitTo(m_options.retainedRows);
        return true;
    }

private:
    int Cutoff(int sheet) const
    {
        auto found = m_cutoff.find(sheet);
        return found == m_cutoff.end() ? INT_MAX : found->second;
    }

    WorkbookModel& m_model;
    const LoadOptions& m_options;
    std::uint64_t m_stored = 0;
    std::map<int, int> m_cutoff;
};

// Counts the cells with a value inside one block of one sheet, and stops after that sheet.
class ValueCounter : public ImportSink {
public:
    ValueCounter(int sheet, const CellRect& block) : m_sheet(sheet), m_block(block) {}

    bool AddSheet(const std::string&) override { return true; }
    bool AddCell(int sheet, const ImportedCell& cell) override
    {
        if (sheet == m_sheet && cell.type != Variant::Empty && cell.row >= m_block.firstRow &&
            cell.row <= m_block.lastRow && cell.column >= m_block.firstColumn && cell.column <= m_block.lastColumn)
            ++count;
        return true;
    }
    bool EndSheet(int sheet) override { return sheet != m_sheet; }

    long long count = 0;

private:
    int m_sheet;
    CellRect m_block;
};

} // namespace

sys::Status CountValuesInFile(const std::string& path, int sheet, const CellRect& block, const ImportLimits& limits,
                              long long& count)
{
    ValueCounter counter(sheet, block);
    StyleTable styles;
    const sys::Status status = ImportWorkbook(path, counter, styles, limits);
    count = counter.count;
    return status;
}

sys::Status LoadWorkbook(const std::string& path, const LoadOptions& options, std::unique_ptr<WorkbookModel>& model)
{
    model = std::make_unique<WorkbookModel>();
    model->path = path;
    ModelBuilder builder(*model, options);
    return ImportWorkbook(path, builder, model->styles, options.limits);
}

} // namespace sheet
