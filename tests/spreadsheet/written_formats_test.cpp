// Number formats as an independent writer stores them (libxlsxwriter maps known codes to
// built-in ids and numbers the others from 164), read back through the object model; the
// expected texts are worked out by hand.
#include "tests/support/TestWorkbooks.h"

#include "platform/spreadsheet/SpreadsheetApplication.h"

#include <gtest/gtest.h>

using namespace sheet;

namespace {

struct Written {
    const char* code; // "" with a built-in id instead
    int builtinId;
    double value;
    const char* text;
};

const Written kWritten[] = {
    {"General", 0, 1234.5678, "1234.5678"},
    {"0", 0, 1234.5678, "1235"},
    {"0.00", 0, 1234.5678, "1234.57"},
    {"#,##0", 0, 1234.5678, "1,235"},
    {"#,##0.00", 0, 1234.5678, "1,234.57"},
    {"0%", 0, 0.125, "13%"},
    {"0.00%", 0, 0.125, "12.50%"},
    {"0.00E+00", 0, 1234.5678, "1.23E+03"},
    {"yyyy/mm/dd", 0, 44333.25, "2021/05/17"},
    {"m/d/yyyy", 0, 44333.25, "5/17/2021"},
    {"hh:mm:ss", 0, 44333.25, "06:00:00"},
    {"yyyy/mm/dd hh:mm:ss", 0, 44333 + 3723.0 / 86400, "2021/05/17 01:02:03"},
    {"d mmm yyyy", 0, 44333, "17 May 2021"},
    {"h:mm AM/PM", 0, 0.25, "6:00 AM"},
    {"0.000\" m3/s\"", 0, 2.5, "2.500 m3/s"},
    {"#,##0.00;[Red]-#,##0.00", 0, -1234.5, "-1,234.50"},
    {"", 14, 44333, "5/17/2021"},
    {"", 15, 44333, "17-May-21"},
    {"", 20, 0.5, "12:00"},
    {"", 22, 44333.5, "5/17/2021 12:00"},
    {"", 10, 0.5, "50.00%"},
    {"", 49, 12.5, "12.5"},
};

} // namespace

TEST(WrittenFormats, TextsMatchWhatTheWriterMeant)
{
    sheettest::XlsxBuilder builder(sheettest::TempFile("formats.xlsx"));
    lxw_worksheet* sheet = builder.AddSheet("Formats");
    int row = 1;
    for (const Written& w : kWritten) {
        lxw_format* format = w.code[0] != '\0' ? builder.Format(w.code) : builder.FormatIndex(w.builtinId);
        worksheet_write_number(sheet, static_cast<lxw_row_t>(row - 1), 0, w.value, format);
        ++row;
    }
    builder.Text(sheet, row, 1, "plain text", "0.00");
    std::string path = builder.Close();

    auto app = StartApplication(ApplicationSettings());
    auto ws = app->Workbooks()->Open(path)->Worksheets()->Item(1);
    row = 1;
    for (const Written& w : kWritten) {
        std::string address = "A" + std::to_string(row++);
        EXPECT_EQ(ws->Range(address)->Text().text, w.text) << (w.code[0] ? w.code : "built-in") << " id " << w.builtinId;
        EXPECT_DOUBLE_EQ(ws->Range(address)->Value2().number, w.value) << address;
    }
    EXPECT_EQ(ws->Range("A" + std::to_string(row))->Text().text, "plain text");
}
