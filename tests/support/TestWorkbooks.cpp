#include "tests/support/TestWorkbooks.h"
#include "tests/support/ScratchFolder.h"

#include <stdexcept>

namespace sheettest {

std::string TempFile(const std::string& name)
{
    return testsupport::ProgramScratchFile(name);
}

std::string DataFile(const std::string& name)
{
    return std::string(VELMORA_TEST_DATA) + "/spreadsheet/" + name;
}

XlsxBuilder::XlsxBuilder(const std::string& path, bool constantMemory) : m_path(path)
{
    lxw_workbook_options options{};
    options.constant_memory = constantMemory ? LXW_TRUE : LXW_FALSE;
    m_workbook = workbook_new_opt(path.c_str(), &options);
    if (m_workbook == nullptr)
        throw std::runtime_error("cannot create " + path);
}

XlsxBuilder::~XlsxBuilder()
{
    if (m_workbook != nullptr)
        workbook_close(m_workbook);
}

lxw_worksheet* XlsxBuilder::AddSheet(const std::string& name)
{
    return workbook_add_worksheet(m_workbook, name.c_str());
}

lxw_format* XlsxBuilder::Format(const std::string& code)
{
    if (code.empty())
        return nullptr;
    auto& format = m_formats[code];
    if (format == nullptr) {
        format = workbook_add_format(m_workbook);
        format_set_num_format(format, code.c_str());
    }
    return format;
}

lxw_format* XlsxBuilder::FormatIndex(int builtinId)
{
    auto& format = m_formats["#builtin" + std::to_string(builtinId)];
    if (format == nullptr) {
        format = workbook_add_format(m_workbook);
        format_set_num_format_index(format, static_cast<uint8_t>(builtinId));
    }
    return format;
}

void XlsxBuilder::Number(lxw_worksheet* sheet, int row, int column, double value, const std::string& code)
{
    worksheet_write_number(sheet, static_cast<lxw_row_t>(row - 1), static_cast<lxw_col_t>(column - 1), value, Format(code));
}

void XlsxBuilder::Text(lxw_worksheet* sheet, int row, int column, const std::string& value, const std::string& code)
{
    worksheet_write_string(sheet, static_cast<lxw_row_t>(row - 1), static_cast<lxw_col_t>(column - 1), value.c_str(), Format(code));
}

void XlsxBuilder::Boolean(lxw_worksheet* sheet, int row, int column, bool value)
{
    worksheet_write_boolean(sheet, static_cast<lxw_row_t>(row - 1), static_cast<lxw_col_t>(column - 1), value ? 1 : 0, nullptr);
}

void XlsxBuilder::Formula(lxw_worksheet* sheet, int row, int column, const std::string& formula, double result)
{
    worksheet_write_formula_num(sheet, static_cast<lxw_row_t>(row - 1), static_cast<lxw_col_t>(column - 1), formula.c_str(), nullptr, result);
}

void XlsxBuilder::FormulaText(lxw_worksheet* sheet, int row, int column, const std::string& formula, const std::string& result)
{
    worksheet_write_formula_str(sheet, static_cast<lxw_row_t>(row - 1), static_cast<lxw_col_t>(column - 1), formula.c_str(), nullptr, result.c_str());
}

void XlsxBuilder::Blank(lxw_worksheet* sheet, int row, int column, const std::string& code)
{
    worksheet_write_blank(sheet, static_cast<lxw_row_t>(row - 1), static_cast<lxw_col_t>(column - 1), Format(code));
}

std::string XlsxBuilder::Close()
{
    lxw_error error = workbook_close(m_workbook);
    m_workbook = nullptr;
    if (error != LXW_NO_ERROR)
        throw std::runtime_error("cannot write " + m_path);
    return m_path;
}

} // namespace sheettest
