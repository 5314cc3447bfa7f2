// The .xls reader record by record, over workbooks written by tests/data/spreadsheet/
// make_test_files.py: shared texts spread over CONTINUE records, every cell record kind, formula
// results, 1904 dates, Excel 5.0 byte texts, and damage that must be named.
#include "tests/support/TestWorkbooks.h"

#include "formats/workbook/WorkbookReader.h"
#include "formats/xls/BiffStream.h"
#include "platform/spreadsheet/SpreadsheetApplication.h"

#include <gtest/gtest.h>

#include <cmath>

using namespace sheet;
using sheettest::DataFile;

namespace {

class RecordsWorkbook : public testing::Test {
protected:
    void SetUp() override
    {
        app = StartApplication(ApplicationSettings());
        sheet = app->Workbooks()->Open(DataFile("records.xls"))->Worksheets()->Item(1);
    }
    std::string Text(const std::string& address) { return sheet->Range(address)->Text().text; }
    Variant Value(const std::string& address) { return sheet->Range(address)->Value2(); }

    std::shared_ptr<Application> app;
    std::shared_ptr<Worksheet> sheet;
};

} // namespace

TEST_F(RecordsWorkbook, SharedTextsSurviveEveryWayOfBeingSplitAcrossRecords)
{
    const char* expected[] = {"Flow", "Pegel 水位", "rich", "ext", "😀 Q", "Ende!", "last"};
    const char* columns = "ABCDEFG";
    for (int i = 0; i < 7; ++i)
        EXPECT_EQ(Text(std::string(1, columns[i]) + "1"), expected[i]) << "shared text " << i;
}

TEST_F(RecordsWorkbook, NumbersOfEveryRecordKindWithTheirFormats)
{
    EXPECT_EQ(Value("A2").number, 42);
    EXPECT_EQ(Value("B2").number, 12.34);
    EXPECT_EQ(Text("B2"), "12.34");
    EXPECT_EQ(Value("C2").number, 1.5);
    EXPECT_EQ(Value("D2").number, -7);
    EXPECT_EQ(Text("A3"), "3.142"); // the workbook's own "0.000"
    EXPECT_EQ(Value("B3").type, Variant::Boolean);
    EXPECT_EQ(Text("B3"), "TRUE");
    EXPECT_EQ(Value("C3").type, Variant::Error);
    EXPECT_EQ(Text("C3"), "#DIV/0!");
    EXPECT_EQ(Text("A5"), "label €");
}

TEST_F(RecordsWorkbook, FormulaCellsGiveTheirLastResult)
{
    EXPECT_EQ(Value("A4").number, 2.5);
    EXPECT_EQ(Text("B4"), "from formula");
    EXPECT_EQ(Value("C4").type, Variant::Boolean);
    EXPECT_EQ(Text("D4"), "#N/A");
    EXPECT_EQ(Value("E4").type, Variant::Text);
    EXPECT_EQ(Text("E4"), "");
}

TEST(XlsRecords, AnEmptyFormulaResultIsMarkedAsMissing)
{
    WorkbookReader reader;
    ASSERT_TRUE(reader.Open(DataFile("records.xls"))) << reader.status().problem().message;
    std::vector<int> marked;
    ASSERT_TRUE(reader.ReadRows(1, [&](int row, const std::vector<RowCell>& cells) {
        for (const RowCell& cell : cells)
            if (cell.formulaWithoutResult)
                marked.push_back(row * 100 + cell.column);
        return true;
    })) << reader.status().problem().message;
    EXPECT_EQ(marked, std::vector<int>{405}); // E4; A4 to D4 hold results
}

TEST_F(RecordsWorkbook, FormattedBlanksWidenTheUsedRangeButAnEmbeddedChartDoesNot)
{
    auto used = sheet->UsedRange();
    EXPECT_EQ(used->Column(), 1);
    EXPECT_EQ(used->Count(), 10 * 7);
    EXPECT_TRUE(Value("A21").IsEmpty());
}

TEST(XlsSheets, ChartSheetsAreNotWorksheetsAndHiddenSheetsAre)
{
    WorkbookReader reader;
    ASSERT_TRUE(reader.Open(DataFile("records.xls"))) << reader.status().problem().message;
    EXPECT_EQ(reader.SheetNames(), (std::vector<std::string>{"Data", "Verborgen ä"}));
    int rows = 0;
    ASSERT_TRUE(reader.ReadRows(2, [&](int row, const std::vector<RowCell>& cells) {
        EXPECT_EQ(row, 1);
        EXPECT_EQ(cells.at(0).text, "1");
        return ++rows > 0;
    })) << reader.status().problem().message;
    EXPECT_EQ(rows, 1);
}

TEST(XlsDates, The1904SystemShiftsDateCellsOnly)
{
    auto app = StartApplication(ApplicationSettings());
    auto sheet = app->Workbooks()->Open(DataFile("dates1904.xls"))->Worksheets()->Item(1);
    EXPECT_EQ(sheet->Range("A1")->Value2().number, 1462);
    EXPECT_EQ(sheet->Range("A1")->Text().text, "1/1/1904");
    EXPECT_EQ(sheet->Range("B1")->Value2().number, 5);
}

TEST(XlsExcel5, ByteTextsReadInTheirCodePage)
{
    WorkbookReader reader;
    ASSERT_TRUE(reader.Open(DataFile("biff5.xls"))) << reader.status().problem().message;
    EXPECT_EQ(reader.SheetNames(), std::vector<std::string>{"Größe"});
    std::vector<std::string> texts;
    ASSERT_TRUE(reader.ReadRows(1, [&](int, const std::vector<RowCell>& cells) {
        texts.push_back(cells.at(0).text);
        return true;
    })) << reader.status().problem().message;
    EXPECT_EQ(texts, (std::vector<std::string>{"€ Größe", "2.3"})); // "0.0" rounds half up
}

TEST(XlsDamage, EachFaultIsNamedWithTheFile)
{
    struct Case {
        const char* file;
        const char* why;
    } cases[] = {
        {"foreign-codepage.xls", "code page 1251"},
        {"shared-text-index.xls", "refers to shared text 5 of 1"},
        {"short-number.xls", "is shorter than its content"},
        {"no-sheet-end.xls", "the sheet 'Data' ends without its EOF record"},
        {"password.xls", "password-protected"},
        {"lost-sheet.xls", "the sheet 'Data' does not start at byte 999999"},
        {"excel4.xls", "Excel 4.0 or older"},
        {"overlapping-sheets.xls", "the sheet 'One' runs into the next sheet without its EOF record"},
        {"shared-sheet-start.xls", "two sheets start at byte"},
    };
    for (const Case& c : cases) {
        // Damage inside a sheet shows when its rows are read, so read them all.
        WorkbookReader reader;
        std::string message;
        if (!reader.Open(DataFile(c.file)))
            message = reader.status().problem().message;
        else if (!reader.ReadRows(1, [](int, const std::vector<RowCell>&) { return true; }))
            message = reader.status().problem().message;
        EXPECT_NE(message.find(c.file), std::string::npos) << c.file << ": " << message;
        EXPECT_NE(message.find(c.why), std::string::npos) << c.file << ": " << message;
    }
}

TEST(BiffCursor, ACharacterCutInHalfByTheRecordEndIsDamage)
{
    const unsigned char wide[] = {3, 0, 1, 'a', 0, 'b'}; // three UTF-16 characters, two and a half bytes
    BiffCursor cursor{std::span<const unsigned char>(wide)};
    try {
        cursor.Text(BiffTextForm{}, 2);
        FAIL() << "read past the record";
    } catch (const BiffCursor::Short& s) {
        EXPECT_TRUE(s.inText);
    }
}

TEST(BiffCursor, RkValues)
{
    EXPECT_EQ(RkValue(0x3FF00000u), 1.0);
    EXPECT_EQ(RkValue(0x3FF00001u), 0.01);
    EXPECT_EQ(RkValue(static_cast<std::uint32_t>(-1 << 2 | 2)), -1.0);
    EXPECT_EQ(RkValue(static_cast<std::uint32_t>(-12345 << 2 | 3)), -123.45);
    EXPECT_EQ(RkValue(0x7FFFFFFEu), 536870911.0);
}
