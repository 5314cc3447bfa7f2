#pragma once
// A workbook as a spreadsheet program saves it, written with libxlsxwriter (a writer of the format
// independent of ours): shared strings, number formats, real date cells. Rows and columns count
// from 1, as the parsers count them; sheets are added as they are first written to.
#include <xlsxwriter.h>

#include <map>
#include <string>
#include <vector>

namespace testsupport {

class XlsxWorkbook {
public:
    explicit XlsxWorkbook(const std::string& path);
    ~XlsxWorkbook();
    XlsxWorkbook(const XlsxWorkbook&) = delete;
    XlsxWorkbook& operator=(const XlsxWorkbook&) = delete;

    void Text(int row, int column, const std::string& text, int sheet = 1);
    // `format` is a number format code ("0.00", "yyyy/mm/dd"); empty for none.
    void Number(int row, int column, double value, const std::string& format = "", int sheet = 1);
    void DateTime(int row, int column, const lxw_datetime& when, const std::string& format, int sheet = 1);
    // Writes the file (with at least one sheet); false when it could not be written. Once only.
    bool Close();

private:
    lxw_worksheet* Sheet(int number);
    lxw_format* Format(const std::string& code);

    lxw_workbook* m_book = nullptr;
    std::vector<lxw_worksheet*> m_sheets;
    std::map<std::string, lxw_format*> m_formats;
};

} // namespace testsupport
