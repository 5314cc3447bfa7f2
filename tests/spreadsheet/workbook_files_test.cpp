// Workbook files of both kinds through the object model: .xls and hand-made .xlsx packages written by our own script
// (tests/data/spreadsheet/make_test_files.py), and damaged or hostile files, each of which must
// fail to open with a message naming the file and the cause.
#include "tests/support/TestWorkbooks.h"

#include "platform/spreadsheet/SpreadsheetApplication.h"

#include <gtest/gtest.h>

using namespace sheet;
using sheettest::DataFile;

namespace {

std::shared_ptr<Worksheet> OpenSheet(Application& app, const std::string& path, int sheet = 1)
{
    return app.Workbooks()->Open(path)->Worksheets()->Item(sheet);
}

std::string Text(Worksheet& sheet, const std::string& address)
{
    return sheet.Range(address)->Text().text;
}

// The message of the AutomationError that opening `path` raises ("" when it opens).
std::string OpenFailure(const std::string& path)
{
    auto app = StartApplication(ApplicationSettings());
    try {
        app->Workbooks()->Open(path);
    } catch (const AutomationError& e) {
        return e.what();
    }
    return std::string();
}

} // namespace

TEST(XlsWorkbooks, ValuesTextsAndUsedRangeOfABiffWorkbook)
{
    auto app = StartApplication(ApplicationSettings());
    auto book = app->Workbooks()->Open(DataFile("series.xls"));
    auto sheets = book->Worksheets();
    ASSERT_EQ(sheets->Count(), 2);
    auto sheet = sheets->Item(1);

    EXPECT_EQ(Text(*sheet, "C1"), "Flow station");
    EXPECT_EQ(Text(*sheet, "D2"), "A");
    // Cells show through their style's format (built-in 14 and 2 here); dates are serial numbers.
    EXPECT_EQ(Text(*sheet, "C3"), "5/17/2021");
    EXPECT_DOUBLE_EQ(sheet->Range("C3")->Value2().number, 44333);
    EXPECT_EQ(Text(*sheet, "D3"), "4.50");
    EXPECT_EQ(Text(*sheet, "E6"), "6000");

    auto used = sheet->UsedRange();
    EXPECT_EQ(used->Column(), 3);
    EXPECT_EQ(used->Count(), 7 * 3);
    Variant values = used->Value2();
    ASSERT_EQ(values.type, Variant::Array);
    EXPECT_EQ(values.At(1, 1).text, "Flow station");
    EXPECT_TRUE(values.At(7, 1).IsEmpty());

    auto empty = sheets->Item(2)->UsedRange();
    EXPECT_EQ(empty->Count(), 1);
    EXPECT_TRUE(empty->Value2().IsEmpty());
}

TEST(XlsWorkbooks, SmallWorkbookStreamIsReadFromTheMiniStream)
{
    auto app = StartApplication(ApplicationSettings());
    auto sheet = OpenSheet(*app, DataFile("small.xls"));
    EXPECT_EQ(Text(*sheet, "C1"), "Flow station");
    EXPECT_EQ(Text(*sheet, "E6"), "6000");
    EXPECT_EQ(sheet->UsedRange()->Count(), 7 * 3);
}

TEST(XlsWorkbooks, DateTimesAndTimesKeepTheirSeconds)
{
    auto app = StartApplication(ApplicationSettings());
    auto sheet = OpenSheet(*app, DataFile("stamps.xls"));
    // The workbook's own format code "yyyy/mm/dd hh:mm:ss".
    EXPECT_EQ(Text(*sheet, "A2"), "2021/05/17 01:02:03");
    EXPECT_EQ(Text(*sheet, "A4"), "2021/05/17 13:02:03");
    EXPECT_EQ(Text(*sheet, "B3"), "13:00:00");
    EXPECT_NEAR(sheet->Range("A2")->Value2().number, 44333 + 3723.0 / 86400, 1e-9);
    EXPECT_NEAR(sheet->Range("B2")->Value2().number, 0.5, 1e-9);
}

TEST(XlsxWorkbooks, ErrorAndInlineStringCellsCount)
{
    auto app = StartApplication(ApplicationSettings());
    auto sheet = OpenSheet(*app, DataFile("errors.xlsx"));
    Variant error = sheet->Range("A1")->Value2();
    EXPECT_EQ(error.type, Variant::Error);
    EXPECT_EQ(error.text, "#N/A");
    EXPECT_EQ(Text(*sheet, "B1"), "#DIV/0!");
    EXPECT_EQ(Text(*sheet, "C1"), "inline");
    auto used = sheet->UsedRange();
    EXPECT_EQ(used->Column(), 1);
    EXPECT_EQ(used->Count(), 30 * 26);
    EXPECT_EQ(Text(*sheet, "Z30"), "7");
}

// A package laid out unlike Excel's own (see make_test_files.py): its workbook part found through
// the package relationships, prefixed elements, the 1904 date system, rich shared strings.
TEST(XlsxWorkbooks, APackageOfAnotherWriterReadsInFull)
{
    auto app = StartApplication(ApplicationSettings());
    auto book = app->Workbooks()->Open(DataFile("features.xlsx"));
    ASSERT_EQ(book->Worksheets()->Count(), 2);
    auto sheet = book->Worksheets()->Item(1);
    EXPECT_EQ(Text(*sheet, "A1"), "Flow <m3/s>");
    EXPECT_EQ(Text(*sheet, "B1"), "Station A");
    EXPECT_EQ(Text(*sheet, "C1"), "inline");
    // Date-styled numbers of the 1904 system mean the same days as in the 1900 system.
    EXPECT_EQ(Text(*sheet, "A2"), "2021/05/17 01:02:03");
    EXPECT_EQ(Text(*sheet, "B2"), "5/17/2021");
    EXPECT_EQ(sheet->Range("B2")->Value2().number, 44333);
    EXPECT_EQ(Text(*sheet, "C2"), "4.50");
    EXPECT_EQ(sheet->Range("D2")->Value2().number, 44333);
    EXPECT_EQ(sheet->Range("A3")->Value2().number, 0.30000000000000004);
    EXPECT_EQ(sheet->Range("B3")->Value2().number, 1e15);
    EXPECT_EQ(sheet->Range("C3")->Value2().number, 123456789.12345678);
    EXPECT_EQ(sheet->Range("B6")->Value2().type, Variant::Boolean);
    EXPECT_EQ(sheet->Range("C6")->Value2().type, Variant::Error);
    EXPECT_EQ(Text(*sheet, "D6"), "TRUEx");
    EXPECT_EQ(Text(*sheet, "E6"), "2");
    auto used = sheet->UsedRange();
    EXPECT_EQ(used->Count(), 6 * 5);
    EXPECT_EQ(Text(*book->Worksheets()->Item(2), "B2"), "-2.5");
}

TEST(XlsxWorkbooks, FormattedBlankCellsWidenTheUsedRange)
{
    sheettest::XlsxBuilder builder(sheettest::TempFile("blank.xlsx"));
    lxw_worksheet* sheet = builder.AddSheet("S");
    builder.Number(sheet, 2, 2, 1);
    builder.Blank(sheet, 5, 4, "0.00");
    std::string path = builder.Close();
    auto app = StartApplication(ApplicationSettings());
    auto used = OpenSheet(*app, path)->UsedRange();
    EXPECT_EQ(used->Column(), 2);
    EXPECT_EQ(used->Count(), 4 * 3);
}

TEST(BadWorkbooks, EachFailsToOpenWithItsReason)
{
    struct Case {
        const char* file;
        const char* why;
    } cases[] = {
        {"empty.xls", "the file is empty"},
        {"text.xlsx", "not a workbook"},
        {"password.xlsx", "password-protected"},
        {"truncated.xls", "damaged"},
        {"no-workbook.xls", "no workbook stream"},
        {"bad-directory.xls", "bad directory entry"},
        {"lost-directory.xls", "directory lies outside the file"},
        {"long-record.xls", "longer than a record may be"},
        {"long-text.xls", "holds a text longer than itself"},
        {"truncated.xlsx", "damaged (no central directory)"},
        {"not-a-workbook.xlsx", "xl/workbook.xml is missing"},
        {"broken-xml.xlsx", "xl/worksheets/sheet1.xml, byte 163: the XML is damaged ('<' inside the tag <row>)"},
        {"bomb.xlsx", "zip bomb"},
        {"lying-sizes.xlsx", "runs past the end of the file"},
        {"wide.xlsx", "xl/worksheets/sheet1.xml, byte 137: the cell reference 'ACNV1' is malformed or lies outside the sheet's grid"},
        {"missing-sheet.xlsx", "the sheet 'Sheet1' has no part in the package (xl/worksheets/sheet1.xml is missing)"},
    };
    for (const Case& c : cases) {
        std::string path = DataFile(c.file);
        std::string message = OpenFailure(path);
        EXPECT_NE(message.find(path), std::string::npos) << c.file << ": " << message;
        EXPECT_NE(message.find(c.why), std::string::npos) << c.file << ": " << message;
    }
}

TEST(BadWorkbooks, LimitsAreConfigurable)
{
    ApplicationSettings settings;
    settings.load.limits.maxFileBytes = 1000;
    auto app = StartApplication(settings);
    EXPECT_THROW(app->Workbooks()->Open(DataFile("series.xls")), AutomationError);
}

TEST(LargeWorkbooks, AMillionRowsOpenWithBoundedMemoryButRefuseOneHugeArray)
{
    std::string path = sheettest::TempFile("million.xlsx");
    {
        sheettest::XlsxBuilder builder(path, true);
        lxw_worksheet* sheet = builder.AddSheet("Tall");
        for (int row = 1; row <= 1048576; ++row)
            worksheet_write_number(sheet, static_cast<lxw_row_t>(row - 1), 0, row, nullptr);
        builder.Close();
    }
    auto app = StartApplication(ApplicationSettings());
    auto sheet = OpenSheet(*app, path);
    EXPECT_EQ(Text(*sheet, "A20"), "20");
    auto used = sheet->UsedRange();
    EXPECT_EQ(used->Count(), 1048576);
    EXPECT_THROW(used->Value2(), AutomationError);
}
