#include "platform/spreadsheet/WorkbookReader.h"

namespace sheet {

namespace {

// Collects the sheet names. Both readers list every sheet before the first cell (.xlsx even
// before its styles and shared strings), so the reading stops there.
class NameCollector : public ImportSink {
public:
    explicit NameCollector(std::vector<std::string>& names) : m_names(names) {}
    void AddSheet(const std::string& name) override { m_names.push_back(name); }
    void AddCell(int, const ImportedCell&) override { throw StopImport(); }
    void EndSheet(int) override { throw StopImport(); }

private:
    std::vector<std::string>& m_names;
};

// Gathers the cells of one row of the wanted sheet and hands the row on when the next begins.
class RowStreamer : public ImportSink {
public:
    RowStreamer(int sheet, const StyleTable& styles, const WorkbookReader::RowCallback& onRow,
                const std::vector<bool>* textColumns)
        : m_sheet(sheet), m_styles(styles), m_onRow(onRow), m_textColumns(textColumns) {}

    void AddSheet(const std::string&) override {}

    void AddCell(int sheet, const ImportedCell& cell) override
    {
        if (sheet != m_sheet || cell.type == Variant::Empty)
            return;
        if (cell.row != m_row)
            Emit();
        m_row = cell.row;
        RowCell out;
        out.column = cell.column;
        out.value.type = cell.type;
        out.value.number = cell.number;
        out.value.text = cell.text;
        out.style = cell.style;
        out.formulaWithoutResult = cell.formulaWithoutResult;
        if (out.value.type == Variant::Text || WantsText(cell.column))
            out.text = m_styles.Format(cell.style).Render(out.value);
        m_cells.push_back(std::move(out));
    }

    void EndSheet(int sheet) override
    {
        if (sheet != m_sheet)
            return;
        Emit();
        throw StopImport(); // the later sheets are not needed
    }

private:
    bool WantsText(int column) const
    {
        return m_textColumns == nullptr ||
               (static_cast<size_t>(column) < m_textColumns->size() && (*m_textColumns)[static_cast<size_t>(column)]);
    }

    void Emit()
    {
        if (m_cells.empty())
            return;
        bool goOn = m_onRow(m_row, m_cells);
        m_cells.clear();
        if (!goOn)
            throw StopImport();
    }

    int m_sheet;
    const StyleTable& m_styles;
    const WorkbookReader::RowCallback& m_onRow;
    const std::vector<bool>* m_textColumns;
    int m_row = 0;
    std::vector<RowCell> m_cells;
};

} // namespace

bool WorkbookReader::Open(const std::string& path)
{
    m_path = path;
    m_sheetNames.clear();
    m_error.clear();
    NameCollector names(m_sheetNames);
    try {
        ImportWorkbook(path, names, m_styles, m_limits);
    } catch (const StopImport&) {
    } catch (const AutomationError& e) {
        m_error = e.what();
        m_sheetNames.clear();
        return false;
    }
    return true;
}

bool WorkbookReader::ReadRows(int sheet, const RowCallback& onRow, const std::vector<bool>* textColumns)
{
    m_error.clear();
    if (sheet < 1 || sheet > SheetCount()) {
        m_error = "Cannot read " + m_path + ": the workbook has no sheet " + std::to_string(sheet) + ".";
        return false;
    }
    // Both readers fill the style table before the first cell arrives.
    RowStreamer streamer(sheet - 1, m_styles, onRow, textColumns);
    try {
        ImportWorkbook(m_path, streamer, m_styles, m_limits);
    } catch (const StopImport&) {
    } catch (const AutomationError& e) {
        m_error = e.what();
        return false;
    }
    return true;
}

} // namespace sheet
