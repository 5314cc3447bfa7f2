// The object model over .xlsx workbooks written by libxlsxwriter, driven in the order the
// Excel parser drives it.
#include "tests/support/TestWorkbooks.h"

#include "platform/spreadsheet/SpreadsheetApplication.h"
#include "tests/support/ScopedEnv.h"

#include <gtest/gtest.h>

#include <cstdlib>

using namespace sheet;
using sheettest::XlsxBuilder;
using testsupport::ScopedEnv;

namespace {


// Sheet 1: a title row, names in row 2, dates and values from row 3, starting in column C.
std::string MakeSeriesWorkbook()
{
    static std::string path;
    if (!path.empty())
        return path;
    XlsxBuilder book(sheettest::TempFile("series.xlsx"));
    lxw_worksheet* data = book.AddSheet("Data");
    book.AddSheet("Second");
    book.Text(data, 1, 3, "Flow station");
    book.Text(data, 2, 3, "Date");
    book.Text(data, 2, 4, "A");
    book.Text(data, 2, 5, "B");
    for (int row = 3; row <= 6; ++row) {
        book.Number(data, row, 3, 44333 + row - 3, "yyyy/mm/dd");
        book.Number(data, row, 4, 1.5 * row, "0.00");
        book.Number(data, row, 5, 1000.0 * row, "#,##0");
    }
    book.Boolean(data, 7, 4, true);
    book.Formula(data, 7, 5, "=E6*2", 12000);
    book.FormulaText(data, 8, 5, "=\"x\"&\"y\"", "xy");
    path = book.Close();
    return path;
}

std::shared_ptr<Application> StartWithWindow(int retainedRows = 1000)
{
    ApplicationSettings settings;
    settings.load.retainedRows = retainedRows;
    return StartApplication(settings);
}

std::shared_ptr<Worksheet> FirstSheet(const std::shared_ptr<Application>& app, const std::string& path)
{
    auto book = app->Workbooks()->Open(path);
    return book->Worksheets()->Item(1);
}

std::string TextAt(Worksheet& sheet, const std::string& address)
{
    return sheet.Range(address)->Text().text;
}

} // namespace

TEST(SpreadsheetApplication, StartsInvisibleWithDefaultVersion)
{
    ScopedEnv presence("VELMORA_SPREADSHEET", std::nullopt);
    ScopedEnv version("VELMORA_SPREADSHEET_VERSION", std::nullopt);
    auto app = CreateApplication();
    ASSERT_NE(app, nullptr);
    app->Visible(false);
    EXPECT_EQ(app->Version(), "16.0");
    app->Quit();
    EXPECT_THROW(app->Version(), AutomationError);
}

TEST(SpreadsheetApplication, EnvironmentMakesItAbsentOrOlder)
{
    {
        ScopedEnv presence("VELMORA_SPREADSHEET", "absent");
        EXPECT_EQ(CreateApplication(), nullptr);
    }
    ScopedEnv version("VELMORA_SPREADSHEET_VERSION", "11.0");
    auto app = CreateApplication();
    ASSERT_NE(app, nullptr);
    EXPECT_EQ(app->Version(), "11.0");
}

TEST(SpreadsheetApplication, SheetsAreCountedAndIndexedFromOne)
{
    auto app = StartWithWindow();
    auto sheets = app->Workbooks()->Open(MakeSeriesWorkbook())->Worksheets();
    EXPECT_EQ(sheets->Count(), 2);
    EXPECT_NE(sheets->Item(2), nullptr);
    EXPECT_THROW(sheets->Item(3), AutomationError);
    EXPECT_THROW(sheets->Item(0), AutomationError);
}

TEST(SpreadsheetApplication, TextShowsTheFormattedValueAndValue2TheRawOne)
{
    auto app = StartWithWindow();
    auto sheet = FirstSheet(app, MakeSeriesWorkbook());
    EXPECT_EQ(TextAt(*sheet, "C3"), "2021/05/17");
    EXPECT_EQ(TextAt(*sheet, "D3"), "4.50");
    EXPECT_EQ(TextAt(*sheet, "E4"), "4,000");
    EXPECT_EQ(TextAt(*sheet, "D7"), "TRUE");
    EXPECT_EQ(TextAt(*sheet, "E7"), "12000");
    EXPECT_EQ(TextAt(*sheet, "E8"), "xy");
    EXPECT_EQ(TextAt(*sheet, "A1"), "");

    Variant date = sheet->Range("C3")->Value2();
    EXPECT_EQ(date.type, Variant::Number);
    EXPECT_DOUBLE_EQ(date.number, 44333);
    EXPECT_EQ(sheet->Range("D7")->Value2().type, Variant::Boolean);
    EXPECT_EQ(sheet->Range("C2")->Value2().text, "Date");
    EXPECT_TRUE(sheet->Range("B2")->Value2().IsEmpty());
}

TEST(SpreadsheetApplication, UsedRangeIsTheSmallestBlockHoldingEveryValue)
{
    auto app = StartWithWindow();
    auto sheet = FirstSheet(app, MakeSeriesWorkbook());
    auto used = sheet->UsedRange();
    EXPECT_EQ(used->Column(), 3);
    EXPECT_EQ(used->Count(), 8 * 3);
    Variant values = used->Value2();
    ASSERT_EQ(values.type, Variant::Array);
    EXPECT_EQ(values.rows, 8);
    EXPECT_EQ(values.columns, 3);
    EXPECT_EQ(values.At(1, 1).text, "Flow station");
    EXPECT_TRUE(values.At(1, 2).IsEmpty());
    EXPECT_DOUBLE_EQ(values.At(3, 2).number, 4.5);
}

TEST(SpreadsheetApplication, EmptySheetHasTheFirstCellAsUsedRange)
{
    auto app = StartWithWindow();
    auto sheets = app->Workbooks()->Open(MakeSeriesWorkbook())->Worksheets();
    auto used = sheets->Item(2)->UsedRange();
    EXPECT_EQ(used->Count(), 1);
    EXPECT_EQ(used->Column(), 1);
    EXPECT_TRUE(used->Value2().IsEmpty());
}

TEST(SpreadsheetApplication, RangeBetweenTwoCellsInEitherOrder)
{
    auto app = StartWithWindow();
    auto sheet = FirstSheet(app, MakeSeriesWorkbook());
    for (auto range : {sheet->Range("C2", "E3"), sheet->Range("E3", "C2"), sheet->Range("C2:E3")}) {
        EXPECT_EQ(range->Count(), 6);
        EXPECT_EQ(range->Column(), 3);
        Variant values = range->Value2();
        ASSERT_EQ(values.type, Variant::Array);
        EXPECT_EQ(values.At(1, 2).text, "A");
        EXPECT_DOUBLE_EQ(values.At(2, 1).number, 44333);
    }
    // Several cells: one text when they agree, none when they differ.
    EXPECT_EQ(sheet->Range("A1", "B2")->Text().type, Variant::Text);
    EXPECT_TRUE(sheet->Range("C2", "D2")->Text().IsEmpty());
}

TEST(SpreadsheetApplication, BadAddressesFailLikeAutomationErrors)
{
    auto app = StartWithWindow();
    auto sheet = FirstSheet(app, MakeSeriesWorkbook());
    for (const char* address : {"", "3C", "A0", "XFE1", "A1048577", "A1B", "AAAAA1"})
        EXPECT_THROW(sheet->Range(address), AutomationError) << address;
    EXPECT_NO_THROW(sheet->Range("$XFD$1048576"));
}

TEST(SpreadsheetApplication, ClosedWorkbookObjectsAreDisconnected)
{
    auto app = StartWithWindow();
    auto book = app->Workbooks()->Open(MakeSeriesWorkbook());
    auto sheets = book->Worksheets();
    auto sheet = sheets->Item(1);
    auto range = sheet->Range("C3");
    book->Close(false);
    EXPECT_THROW(sheets->Count(), AutomationError);
    EXPECT_THROW(sheet->UsedRange(), AutomationError);
    EXPECT_THROW(range->Text(), AutomationError);
    EXPECT_THROW(book->Worksheets(), AutomationError);
    // The application itself keeps running and opens the next workbook.
    EXPECT_EQ(app->Workbooks()->Open(MakeSeriesWorkbook())->Worksheets()->Count(), 2);
}

TEST(SpreadsheetApplication, QuitDisconnectsEverything)
{
    auto app = StartWithWindow();
    auto workbooks = app->Workbooks();
    auto sheet = FirstSheet(app, MakeSeriesWorkbook());
    app->Quit();
    EXPECT_THROW(workbooks->Open(MakeSeriesWorkbook()), AutomationError);
    EXPECT_THROW(sheet->Range("A1"), AutomationError);
    EXPECT_THROW(app->Workbooks(), AutomationError);
}

TEST(SpreadsheetApplication, MissingFileFailsToOpenNamingIt)
{
    auto app = StartWithWindow();
    std::string missing = sheettest::TempFile("no-such.xlsx");
    try {
        app->Workbooks()->Open(missing);
        FAIL() << "opened a missing file";
    } catch (const AutomationError& e) {
        EXPECT_NE(std::string(e.what()).find(missing), std::string::npos) << e.what();
    }
}

TEST(SpreadsheetApplication, RowsBeyondTheHeldWindowAreReadOnDemand)
{
    XlsxBuilder book(sheettest::TempFile("tall.xlsx"));
    lxw_worksheet* sheet = book.AddSheet("Tall");
    for (int row = 1; row <= 300; ++row)
        book.Number(sheet, row, 1, row);
    std::string path = book.Close();

    auto app = StartWithWindow(20);
    auto ws = FirstSheet(app, path);
    EXPECT_EQ(TextAt(*ws, "A20"), "20");
    EXPECT_EQ(TextAt(*ws, "A250"), "250");
    Variant all = ws->UsedRange()->Value2();
    ASSERT_EQ(all.rows, 300);
    EXPECT_DOUBLE_EQ(all.At(300, 1).number, 300);
}

TEST(SpreadsheetApplication, OversizedRangeValuesFailInsteadOfExhaustingMemory)
{
    ApplicationSettings settings;
    settings.maxArrayCells = 100;
    auto app = StartApplication(settings);
    auto ws = FirstSheet(app, MakeSeriesWorkbook());
    EXPECT_THROW(ws->Range("A1", "J11")->Value2(), AutomationError);
    EXPECT_THROW(ws->Range("A1", "J11")->Text(), AutomationError);
    EXPECT_EQ(ws->Range("A1", "J11")->Count(), 110);
    EXPECT_THROW(ws->Range("A1", "XFD1048576")->Count(), AutomationError);
}

TEST(SpreadsheetApplication, CellBudgetBoundsWhatIsHeldEvenAfterRereading)
{
    XlsxBuilder book(sheettest::TempFile("budget.xlsx"));
    lxw_worksheet* sheet = book.AddSheet("Tall");
    for (int row = 1; row <= 300; ++row)
        book.Number(sheet, row, 1, row);
    std::string path = book.Close();

    ApplicationSettings settings;
    settings.load.maxStoredCells = 50;
    auto app = StartApplication(settings);
    auto ws = FirstSheet(app, path);
    EXPECT_EQ(TextAt(*ws, "A50"), "50");
    EXPECT_EQ(ws->UsedRange()->Count(), 300); // the used range still counts every row
    EXPECT_THROW(ws->Range("A250")->Text(), AutomationError);
}

// CountA counts the cells holding a value (an empty text too, a blank cell not) in any block: from
// the per-column counts when the block spans every used row, from the held rows when it lies in
// them, and by reading the file once more otherwise. Every way gives the same answer.
TEST(SpreadsheetApplication, CountAOfABlockWhereverItLies)
{
    XlsxBuilder book(sheettest::TempFile("counted.xlsx"));
    lxw_worksheet* sheet = book.AddSheet("Counted");
    for (int row = 2; row <= 300; ++row) {
        book.Number(sheet, row, 1, row);
        if (row % 6 == 0)
            book.FormulaText(sheet, row, 2, "=\"\"", ""); // an empty text
        else if (row % 3 == 0)
            book.Text(sheet, row, 2, "x");
        if (row % 10 == 0)
            book.Blank(sheet, row, 3, "0.00");
    }
    const std::string path = book.Close();

    struct Case {
        const char* from;
        const char* to;
        double values;
    } cases[] = {
        {"A2", "A300", 299},  {"A1", "A1048576", 299}, {"B2", "B300", 100}, // every used row
        {"C2", "C300", 0},    {"A2", "C300", 399},     {"D1", "D300", 0},
        {"A1", "B10", 12},    {"B3", "B3", 1},         {"B6", "B6", 1},     // held rows (an empty text counts)
        {"A250", "B299", 66}, {"B290", "C300", 4},     {"A301", "C400", 0}, // beyond the held rows
    };
    for (int window : {20, 1000}) {
        auto app = StartWithWindow(window);
        auto ws = FirstSheet(app, path);
        auto functions = app->WorksheetFunction();
        for (const Case& c : cases)
            EXPECT_EQ(functions->CountA(ws->Range(c.from, c.to)), c.values) << c.from << ":" << c.to << " window " << window;
    }
}

TEST(SpreadsheetApplication, RangesTellWhereTheyLieAndHowLarge)
{
    auto app = StartWithWindow();
    auto used = FirstSheet(app, MakeSeriesWorkbook())->UsedRange();
    EXPECT_EQ(used->Row(), 1);
    EXPECT_EQ(used->Column(), 3);
    EXPECT_EQ(used->RowCount(), 8);
    EXPECT_EQ(used->ColumnCount(), 3);
    app->Quit();
    EXPECT_THROW(used->RowCount(), AutomationError);
    EXPECT_THROW(app->WorksheetFunction(), AutomationError);
}
