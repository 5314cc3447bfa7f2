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

void SheetModel::Add(const ImportedCell& cell, bool keep)
{
    m_used.Include(cell.row, cell.column);
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

    void AddSheet(const std::string& name) override { m_model.sheets.emplace_back(name); }

    void AddCell(int sheet, const ImportedCell& cell) override
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
    }

    void EndSheet(int sheet) override
    {
        SheetModel& target = m_model.sheets.at(static_cast<size_t>(sheet));
        if (m_cutoff.count(sheet) != 0)
            return;
        if (m_options.retainedRows != 0 && target.UsedRect().lastRow > m_options.retainedRows)
            target.LimitTo(m_options.retainedRows);
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

} // namespace

std::unique_ptr<WorkbookModel> LoadWorkbook(const std::string& path, const LoadOptions& options)
{
    auto model = std::make_unique<WorkbookModel>();
    model->path = path;
    ModelBuilder builder(*model, options);
    ImportWorkbook(path, builder, model->styles, options.limits);
    return model;
}

} // namespace sheet
