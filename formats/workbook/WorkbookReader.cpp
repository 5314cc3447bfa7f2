#include "formats/workbook/WorkbookReader.h"

namespace sheet {

namespace {

// Collects the sheet names. Both readers list every sheet before the first cell (.xlsx even
// before its styles and shared strings), so the reading stops there.
class NameCollector : public ImportSink {
public:
    explicit NameCollector(std::vector<std::string>& names) : m_names(names) {}
    bool AddSheet(const std::string& name) override
    {
        m_names.push_back(name);
        return true;
    }
    bool AddCell(int, const ImportedCell&) override { return false; }
    bool EndSheet(int) override { return false; }

private:
    std::vector<std::string>& m_names;
};

// Gathers the cells of one row of the wanted sheet and hands the row on when the next begins.
class RowStreamer : public ImportSink {
public:
    RowStreamer(int sheet, const StyleTable& styles, const WorkbookReader::RowCallback& onRow,
                const std::vector<bool>* textColumns)
        : m_sheet(sheet), m_styles(styles), m_onRow(onRow), m_textColumns(textColumns) {}

    bool AddSheet(const std::string&) override { return true; }

    bool AddCell(int sheet, const ImportedCell& cell) override
    {
        if (sheet != m_sheet || cell.type == Variant::Empty)
            return true;
        if (cell.row != m_row && !Emit())
            return false;
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
        return true;
    }

    bool EndSheet(int sheet) override
    {
        if (sheet != m_sheet)
            return true;
        Emit();
        return false; // the later sheets are not needed
    }

private:
    bool WantsText(int column) const
    {
        return m_textColumns == nullptr ||
               (static_cast<size_t>(column) < m_textColumns->size() && (*m_textColumns)[static_cast<size_t>(column)]);
    }

    // Hands the row on; false when the caller wants no more.
    bool Emit()
    {
        if (m_cells.empty())
            return true;
        const bool goOn = m_onRow(m_row, m_cells);
        m_cells.clear();
        return goOn;
    }

    int m_sheet;
    const StyleTable& m_styles;
    const WorkbookReader::RowCallback& m_onRow;
    const std::vector<bool>* m_textColumns;
    int m_row = 0;
    std::vector<RowCell> m_cells;
};

} // namespace

sys::Status WorkbookReader::Open(const std::string& path)
{
    m_path = path;
    m_sheetNames.clear();
    NameCollector names(m_sheetNames);
    m_status = ImportWorkbook(path, names, m_styles, m_limits);
    if (!m_status)
        m_sheetNames.clear();
    return m_status;
}

sys::Status WorkbookReader::ReadRows(int sheet, const RowCallback& onRow, const std::vector<bool>* textColumns)
{
    if (sheet < 1 || sheet > SheetCount())
        return m_status = sys::Status::Fail(m_path, 0,
                                            "Cannot read " + m_path + ": the workbook has no sheet " + std::to_string(sheet) + ".");
    // Both readers fill the style table before the first cell arrives.
    RowStreamer streamer(sheet - 1, m_styles, onRow, textColumns);
    return m_status = ImportWorkbook(m_path, streamer, m_styles, m_limits);
}

} // namespace sheet
