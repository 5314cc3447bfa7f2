#include "converter/XlsxSeriesWriter.h"

#include "converter/StampText.h"

#include <xlsxwriter.h>

namespace converter {

namespace {

std::string MetadataCell(const ItemInfo& item)
{
    // The units cell must hold text in brackets, or the workbook reader refuses the unit row.
    auto part = [](std::string text, const std::string& fallback) {
        for (char& c : text)
            if (c == '[' || c == ']' || c == ':')
                c = ' ';
        return text.empty() ? fallback : text;
    };
    return part(item.type, "Undefined") + "[" + part(item.unit, "Undefined") + "]:" +
           part(item.valueType, "Instantaneous");
}

// Header texts go in as formulas with their text result: in constant-memory mode a plain string
// becomes an inline string, which the workbook reader (liborcus 0.17) passes over, while a
// formula's cached text result is read by it and shown by every spreadsheet program.
void WriteText(lxw_worksheet* sheet, lxw_row_t row, lxw_col_t column, const std::string& text)
{
    std::string formula = "=\"";
    for (char c : text)
        formula += c == '"' ? std::string("\"\"") : std::string(1, c);
    formula += '"';
    worksheet_write_formula_str(sheet, row, column, formula.c_str(), nullptr, text.c_str());
}

} // namespace

XlsxSeriesWriter::~XlsxSeriesWriter()
{
    // A workbook that was never finished is closed here so the library frees it; the file it leaves
    // is the temporary one, which the caller removes.
    if (m_workbook)
        workbook_close(m_workbook);
}

Status XlsxSeriesWriter::Begin(const std::string& path, const SeriesHeader& header, const std::string& title)
{
    m_path = path;
    m_title = title;
    if (header.items.size() + 1 > kMaxColumns)
        return Status::Fail(path, 0, std::to_string(header.items.size()) + " items do not fit the " +
                                         std::to_string(kMaxColumns - 1) + " value columns of a worksheet");
    lxw_workbook_options options{};
    options.constant_memory = LXW_TRUE;
    m_workbook = workbook_new_opt(path.c_str(), &options);
    if (!m_workbook)
        return Status::Fail(path, 0, "cannot create the workbook");
    m_sheet = workbook_add_worksheet(m_workbook, nullptr);
    m_dateFormat = workbook_add_format(m_workbook);
    format_set_num_format(m_dateFormat, "yyyy/mm/dd hh:mm:ss");
    if (!m_title.empty()) {
        lxw_doc_properties properties{};
        properties.title = m_title.data(); // the library keeps its own copy
        workbook_set_properties(m_workbook, &properties);
    }
    worksheet_set_column(m_sheet, 0, 0, 20, nullptr);
    for (size_t i = 0; i < header.items.size(); ++i) {
        const auto column = static_cast<lxw_col_t>(i + 1);
        WriteText(m_sheet, 0, column, MetadataCell(header.items[i]));
    }
    WriteText(m_sheet, 1, 0, header.timeTitle.empty() ? "Date/time" : header.timeTitle);
    for (size_t i = 0; i < header.items.size(); ++i) {
        const auto column = static_cast<lxw_col_t>(i + 1);
        // An empty name would read back as "Item<n>"; the cell stays blank as the input had it.
        if (!header.items[i].name.empty())
            WriteText(m_sheet, 1, column, header.items[i].name);
    }
    return Status::Ok();
}

Status XlsxSeriesWriter::Write(const Row& row)
{
    if (m_row >= kMaxRows)
        return Status::Fail(m_path, 0, "more rows than a worksheet holds (" + std::to_string(kMaxRows) + ")");
    worksheet_write_number(m_sheet, m_row, 0, StampToSerialDays(row.stamp), m_dateFormat);
    for (size_t i = 0; i < row.values.size(); ++i)
        if (!IsMissing(row.values[i]))
            worksheet_write_number(m_sheet, m_row, static_cast<lxw_col_t>(i + 1), row.values[i], nullptr);
    ++m_row;
    return Status::Ok();
}

Status XlsxSeriesWriter::Finish()
{
    const lxw_error error = workbook_close(m_workbook);
    m_workbook = nullptr;
    if (error != LXW_NO_ERROR)
        return Status::Fail(m_path, 0, std::string("cannot write the workbook: ") + lxw_strerror(error));
    return Status::Ok();
}

} // namespace converter
