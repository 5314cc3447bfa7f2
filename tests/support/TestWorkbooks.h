#pragma once
// Test workbooks written by libxlsxwriter, an independent writer of the format, into a
// temporary folder that is removed when the test program ends.
#include "tests/support/Files.h"

#include <xlsxwriter.h>

#include <map>
#include <string>

namespace sheettest {

// A fresh path in the test program's temporary folder.
std::string TempFile(const std::string& name);
// A file of the test data folder (tests/data/spreadsheet).
std::string DataFile(const std::string& name);
using testsupport::WriteFile;

class XlsxBuilder {
public:
    explicit XlsxBuilder(const std::string& path, bool constantMemory = false);
    ~XlsxBuilder();

    lxw_worksheet* AddSheet(const std::string& name);
    // The format with number format `code` ("" for none), made once per code.
    lxw_format* Format(const std::string& code);
    lxw_format* FormatIndex(int builtinId);

    // Rows and columns from 1, like the object model.
    void Number(lxw_worksheet* sheet, int row, int column, double value, const std::string& code = "");
    void Text(lxw_worksheet* sheet, int row, int column, const std::string& value, const std::string& code = "");
    void Boolean(lxw_worksheet* sheet, int row, int column, bool value);
    void Formula(lxw_worksheet* sheet, int row, int column, const std::string& formula, double result);
    void FormulaText(lxw_worksheet* sheet, int row, int column, const std::string& formula, const std::string& result);
    void Blank(lxw_worksheet* sheet, int row, int column, const std::string& code);
    // Writes the file; returns its path.
    std::string Close();

private:
    std::string m_path;
    lxw_workbook* m_workbook = nullptr;
    std::map<std::string, lxw_format*> m_formats;
};

} // namespace sheettest
