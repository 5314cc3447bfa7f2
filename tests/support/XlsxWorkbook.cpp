#include "tests/support/XlsxWorkbook.h"

namespace testsupport {

namespace {

lxw_row_t Row(int row) { return static_cast<lxw_row_t>(row - 1); }
lxw_col_t Col(int column) { return static_cast<lxw_col_t>(column - 1); }

} // namespace

XlsxWorkbook::XlsxWorkbook(const std::string& path) : m_book(workbook_new(path.c_str())) {}

XlsxWorkbook::~XlsxWorkbook() { Close(); }

void XlsxWorkbook::Text(int row, int column, const std::string& text, int sheet)
{
    if (lxw_worksheet* target = Sheet(sheet))
        worksheet_write_string(target, Row(row), Col(column), text.c_str(), nullptr);
}

void XlsxWorkbook::Number(int row, int column, double value, const std::string& format, int sheet)
{
    if (lxw_worksheet* target = Sheet(sheet))
        worksheet_write_number(target, Row(row), Col(column), value, Format(format));
}

void XlsxWorkbook::DateTime(int row, int column, const lxw_datetime& when, const std::string& format, int sheet)
{
    lxw_datetime copy = when;
    if (lxw_worksheet* target = Sheet(sheet))
        worksheet_write_datetime(target, Row(row), Col(column), &copy, Format(format));
}

bool XlsxWorkbook::Close()
{
    if (!m_book)
        return false;
    Sheet(1);
    const bool written = workbook_close(m_book) == LXW_NO_ERROR;
    m_book = nullptr;
    return written;
}

lxw_worksheet* XlsxWorkbook::Sheet(int number)
{
    while (m_book && static_cast<int>(m_sheets.size()) < number)
        m_sheets.push_back(workbook_add_worksheet(m_book, nullptr));
    return m_book ? m_sheets[static_cast<size_t>(number - 1)] : nullptr;
}

lxw_format* XlsxWorkbook::Format(const std::string& code)
{
    if (code.empty() || !m_book)
        return nullptr;
    lxw_format*& format = m_formats[code];
    if (!format) {
        format = workbook_add_format(m_book);
        format_set_num_format(format, code.c_str());
    }
    return format;
}

} // namespace testsupport
