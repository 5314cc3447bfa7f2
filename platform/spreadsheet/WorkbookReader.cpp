#include "platform/spreadsheet/WorkbookReader.h"

namespace sheet {

namespace {

// Collects only the sheet names (the styles come with the reading); cells are passed over.
class NameCollector : public ImportSink {
public:
    explicit NameCollector(std::vector<std::string>& names) : m_names(names) {}
    void AddSheet(const std::string& name) override { m_names.push_back(name); }
    void AddCell(int, const ImportedCell&) override {}
    void EndSheet(int) override {}

private:
    std::vector<std::string>& m_names;
};

// Gathers the cells of one row of the wanted sheet and hands the row on when the next begins.
class RowStreamer : public ImportSink {
public:
    RowStreamer(int sheet, const StyleTable& styles, const WorkbookReader::RowCallback& onRow)
        : m_sheet(sheet), m_styles(styles), m_onRow(onRow) {}

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
    } catch (const AutomationError& e) {
        m_error = e.what();
        m_sheetNames.clear();
        return false;
    }
    return true;
}

bool WorkbookReader::ReadRows(int sheet, const RowCallback& onRow)
{
    m_error.clear();
    if (sheet < 1 || sheet > SheetCount()) {
        m_error = "Cannot read " + m_path + ": the workbook has no sheet " + std::to_string(sheet) + ".";
        return false;
    }
    // The texts need the styles before the cells: those Open read (the sheets precede the
    // styles in an .xlsx reading); this reading's own copy is not used.
    StyleTable scratch;
    RowStreamer streamer(sheet - 1, m_styles, onRow);
    try {
        ImportWorkbook(m_path, streamer, scratch, m_limits);
    } catch (const StopImport&) {
    } catch (const AutomationError& e) {
        m_error = e.what();
        return false;
    }
    return true;
}

} // namespace sheet
