// The Excel parser against an in-memory spreadsheet: layouts, header rows, time stamps and failures.
#include "FakeSpreadsheet.h"
#include "parsers/ExcelFilePreviewParser.h"
#include "platform/system/FileSystem.h"
#include "resources/StringTable.h"
#include "templates/ExcelSpecification.h"
#include "tests/support/ScratchFolder.h"

#include <gtest/gtest.h>

#include <fstream>

namespace {

using Strings = std::vector<std::string>;

class ExcelParserTest : public ::testing::Test {
protected:
    void SetUp() override
    {
        m_path = m_scratch.Write("book.xlsx", "workbook stand-in");
        m_app = std::make_shared<fake::Application>();
        m_book = &m_app->AddWorkbook(m_path, 2);
        // Globals for the three header rows unless a test wants them read from the sheet.
        m_spec.m_DataDesc.m_nUnitTypeOption = 0;
        m_spec.m_DataDesc.m_nUnitOption = 0;
        m_spec.m_DataDesc.m_nValueTypeOption = 0;
        m_parser = std::make_unique<CExcelFilePreviewParser>([this] { return m_app; });
        m_parser->m_pSpecification = &m_spec;
        m_parser->SetFile(m_path);
    }

    void TearDown() override
    {
        m_parser.reset();
    }

    fake::Sheet& Sheet1() { return *m_book->sheets[0]; }

    // Title in row 1, names Date, A, B in row 2, daily data from row 3.
    void WriteDailySheet(int dataRows)
    {
        Sheet1().Put("A1", "Station 7");
        Sheet1().Put("A2", "Date");
        Sheet1().Put("B2", "A");
        Sheet1().Put("C2", "B");
        for (int i = 0; i < dataRows; ++i) {
            const std::string row = std::to_string(3 + i);
            Sheet1().Put("A" + row, 44333.0 + i, "17/05/2021");
            Sheet1().Put("B" + row, 1.5 + i, "1.50");
            Sheet1().Put("C" + row, 2.0, "2.00");
        }
    }

    std::vector<std::string> MessageTexts() const
    {
        std::vector<std::string> texts;
        for (const auto& box : m_ui.boxes)
            texts.push_back(box.text);
        return texts;
    }

    testsupport::ScratchFolder m_scratch{"velmora-excel"};
    std::string m_path;
    std::shared_ptr<fake::Application> m_app;
    fake::Workbook* m_book = nullptr;
    CExcelSpecification m_spec;
    ui::ScriptedUserInterface m_ui;
    ui::ScopedUserInterface m_scope {m_ui};
    std::unique_ptr<CExcelFilePreviewParser> m_parser;
};

TEST_F(ExcelParserTest, DateValuesInFirstColumnGiveStampsAndNames)
{
    WriteDailySheet(2);
    ASSERT_EQ(m_parser->Parse(""), 1);

    EXPECT_EQ(m_parser->m_vecItemNames, (Strings {"DateTime", "A", "B"}));
    ASSERT_EQ(m_parser->m_vecRows.size(), 5u);
    EXPECT_EQ(m_parser->m_vecRows[0], (Strings {"", "Undefined", "Undefined"}));
    EXPECT_EQ(m_parser->m_vecRows[2], (Strings {"", "Instantaneous", "Instantaneous"}));
    EXPECT_EQ(m_parser->m_vecRows[3], (Strings {"2021/05/17 00:00:00", "1.50", "2.00"}));
    EXPECT_EQ(m_parser->m_vecRows[4], (Strings {"2021/05/18 00:00:00", "1.50", "2.00"}));
    // Header rows, then each data row as the sheet displays it.
    ASSERT_EQ(m_parser->m_vecRawLines.size(), 4u);
    EXPECT_EQ(m_parser->m_vecRawLines[0], (Strings {"Station 7", "", ""}));
    EXPECT_EQ(m_parser->m_vecRawLines[2], (Strings {"17/05/2021", "1.50", "2.00"}));
    EXPECT_TRUE(m_ui.boxes.empty());
    EXPECT_FALSE(m_parser->IsWorkbookOpen());
    EXPECT_EQ(m_app->log.back(), "Close");
}

TEST_F(ExcelParserTest, DateAndTimeInTwoCellsAreJoinedAndReadByTheFormat)
{
    Sheet1().Put("A2", "Date");
    Sheet1().Put("B2", "Time");
    Sheet1().Put("C2", "A");
    Sheet1().Put("D2", "B");
    Sheet1().Put("A3", 44333.0, "2021/05/17");
    Sheet1().Put("B3", 0.43090277777, "10:20:30");
    Sheet1().Put("C3", "1");
    Sheet1().Put("D3", "2");
    m_spec.m_TimeDesc.m_bUseDTFormat = 1;
    m_spec.m_TimeDesc.m_strDateTimeFormat = "YYYY/MM/DD|HH:mm:ss";

    ASSERT_EQ(m_parser->Parse(""), 1);
    EXPECT_EQ(m_parser->m_vecItemNames, (Strings {"DateTime", "A", "B"}));
    ASSERT_EQ(m_parser->m_vecRows.size(), 4u);
    EXPECT_EQ(m_parser->m_vecRows[3], (Strings {"2021/05/17 10:20:30", "1", "2"}));
}

TEST_F(ExcelParserTest, SheetBeyondTheWorkbookShowsMessageAndFails)
{
    WriteDailySheet(1);
    m_spec.m_DataDesc.m_nExcelSheet = 3;
    EXPECT_EQ(m_parser->Parse(""), 0);
    EXPECT_EQ(MessageTexts(), (Strings {res::LoadString(res::IDS_SHEET_INDEX_TOO_LARGE)}));
    EXPECT_EQ(m_ui.boxes[0].type, ui::MB_OK | ui::MB_ICONEXCLAMATION);
    EXPECT_FALSE(m_parser->IsWorkbookOpen());
}

TEST_F(ExcelParserTest, CheckSheetIndexBounds)
{
    CString message;
    EXPECT_EQ(m_parser->CheckSheetIndex(1), 0) << "no workbook open";
    ASSERT_EQ(m_parser->OpenWorkbook(m_path, message), 1);
    EXPECT_EQ(m_parser->CheckSheetIndex(1), 1);
    EXPECT_EQ(m_parser->CheckSheetIndex(2), 1);
    EXPECT_TRUE(m_ui.boxes.empty());
    EXPECT_EQ(m_parser->CheckSheetIndex(0), 0);
    EXPECT_EQ(m_parser->CheckSheetIndex(3), 0);
    EXPECT_EQ(m_ui.boxes.size(), 2u);
    // A count the application cannot give is not held against the index.
    m_book->countFails = true;
    EXPECT_EQ(m_parser->CheckSheetIndex(7), 1);
}

TEST_F(ExcelParserTest, UsedRangeStartingInThirdColumn)
{
    // Date in column C (the first used column): values follow it.
    Sheet1().Put("C2", "Date");
    Sheet1().Put("D2", "A");
    Sheet1().Put("E2", "B");
    Sheet1().Put("C3", 44333.0, "17/05/2021");
    Sheet1().Put("D3", "1");
    Sheet1().Put("E3", "2");
    m_spec.m_TimeDesc.m_nDateTimeCol = 3;
    ASSERT_EQ(m_parser->Parse(""), 1);
    EXPECT_EQ(m_parser->m_vecItemNames, (Strings {"DateTime", "A", "B"}));
    EXPECT_EQ(m_parser->m_vecRows.back(), (Strings {"2021/05/17 00:00:00", "1", "2"}));
    EXPECT_EQ(m_parser->m_vecRawLines.back(), (Strings {"", "", "17/05/2021", "1", "2"}));
}

TEST_F(ExcelParserTest, UsedRangeStartingInThirdColumnWithDateInItsLastColumn)
{
    Sheet1().Put("C2", "A");
    Sheet1().Put("D2", "B");
    Sheet1().Put("E2", "Date");
    Sheet1().Put("C3", "1");
    Sheet1().Put("D3", "2");
    Sheet1().Put("E3", 44333.0, "17/05/2021");
    m_spec.m_TimeDesc.m_nDateTimeCol = 5;
    ASSERT_EQ(m_parser->Parse(""), 1);
    EXPECT_EQ(m_parser->m_vecItemNames, (Strings {"DateTime", "A", "B"}));
    EXPECT_EQ(m_parser->m_vecRows.back(), (Strings {"2021/05/17 00:00:00", "1", "2"}));
}

TEST_F(ExcelParserTest, StartRowBeyondThePreviewBoundReadsNoDataRows)
{
    WriteDailySheet(30);
    m_spec.m_DataDesc.m_nStartRow = 25;
    ASSERT_EQ(m_parser->Parse(""), 1);
    EXPECT_EQ(m_parser->m_vecRows.size(), 3u) << "metadata rows only";
    EXPECT_EQ(m_parser->m_vecRawLines.size(), 20u) << "header rows up to row 20";

    // A row before the first has no cells: the data end at once.
    m_spec.m_DataDesc.m_nStartRow = -2000000000;
    ASSERT_EQ(m_parser->Parse(""), 1);
    EXPECT_EQ(m_parser->m_vecRows.size(), 3u);
    EXPECT_TRUE(m_parser->m_vecRawLines.empty());
}

TEST_F(ExcelParserTest, DataRowsEndAtRowTwentyAndAtTheFirstUnreadableStamp)
{
    WriteDailySheet(30);
    ASSERT_EQ(m_parser->Parse(""), 1);
    EXPECT_EQ(m_parser->m_vecRows.size(), 3u + 18u);
    EXPECT_EQ(m_parser->m_vecRawLines.size(), 20u);

    Sheet1().cells.erase({6, 1});
    ASSERT_EQ(m_parser->Parse(""), 1);
    EXPECT_EQ(m_parser->m_vecRows.size(), 3u + 3u) << "rows 3 to 5";
    EXPECT_TRUE(m_ui.boxes.empty());
}

TEST_F(ExcelParserTest, EmptyNameCellIsNamedAfterItsPlace)
{
    WriteDailySheet(1);
    Sheet1().Put("D3", 4.0, "4"); // the name cell D2 stays empty
    ASSERT_EQ(m_parser->Parse(""), 1);
    EXPECT_EQ(m_parser->m_vecItemNames, (Strings {"DateTime", "A", "B", "Item4"}));
}

TEST_F(ExcelParserTest, ItemNamesDefinedByHand)
{
    WriteDailySheet(1);
    m_spec.m_DataDesc.m_nItemTitleOption = 1;
    m_spec.m_DataDesc.m_vecItemDefs = {{"Rain", "", "", ""}};
    CString message;
    ASSERT_EQ(m_parser->OpenWorkbook(m_path, message), 1);
    Strings names;
    ASSERT_EQ(m_parser->GetItemNames(names), 1);
    EXPECT_EQ(names, (Strings {"Item1", "Item2"})) << "fewer definitions than items";
    m_spec.m_DataDesc.m_vecItemDefs.push_back({"Flow", "", "", ""});
    m_spec.m_DataDesc.m_vecItemDefs.push_back({"Spare", "", "", ""});
    names.clear();
    ASSERT_EQ(m_parser->GetItemNames(names), 1);
    EXPECT_EQ(names, (Strings {"Rain", "Flow"}));
}

struct HeaderRowCase {
    const char* name;
    const char* cellB;
    const char* cellC;
    Strings types;
    Strings units;
    Strings valueTypes;
};

void PrintTo(const HeaderRowCase& c, std::ostream* out) { *out << c.name; }

class ExcelHeaderRowTest : public ExcelParserTest, public ::testing::WithParamInterface<HeaderRowCase> {};

TEST_P(ExcelHeaderRowTest, CutsTheRowIntoItemTypesUnitsAndValueTypes)
{
    const HeaderRowCase& c = GetParam();
    WriteDailySheet(1);
    Sheet1().Put("A1", "Header");
    Sheet1().Put("B1", c.cellB);
    Sheet1().Put("C1", c.cellC);
    CString message;
    ASSERT_EQ(m_parser->OpenWorkbook(m_path, message), 1);
    m_spec.m_DataDesc.m_nUnitTypeOption = 1;
    m_spec.m_DataDesc.m_nUnitOption = 1;
    m_spec.m_DataDesc.m_nValueTypeOption = 1;
    Strings types, units, valueTypes;
    EXPECT_EQ(m_parser->GetItemTypes(types), c.types.empty() ? 0 : 1);
    EXPECT_EQ(m_parser->GetUnits(units), c.units.empty() ? 0 : 1);
    EXPECT_EQ(m_parser->GetValueTypes(valueTypes), c.valueTypes.empty() ? 0 : 1);
    if (!c.types.empty()) {
        EXPECT_EQ(types, c.types);
    }
    if (!c.units.empty()) {
        EXPECT_EQ(units, c.units);
    }
    if (!c.valueTypes.empty()) {
        EXPECT_EQ(valueTypes, c.valueTypes);
    }
}

INSTANTIATE_TEST_SUITE_P(
    Cells, ExcelHeaderRowTest,
    ::testing::Values(HeaderRowCase {"PlainNames", "Flow", "Rain", {"Flow", "Rain"}, {"Flow", "Rain"}, {"Flow", "Rain"}},
                      HeaderRowCase {"Bracketed", "Rain [mm]", "Flow [m3/s]", {"Rain ", "Flow "}, {"mm", "m3/s"},
                                     {"Rain [mm]", "Flow [m3/s]"}},
                      HeaderRowCase {"Colons", "Rain:Accumulated", "x:y:z", {"Rain:Accumulated", "x:y:z"},
                                     {"Rain:Accumulated", "x:y:z"}, {"Accumulated", "y"}},
                      HeaderRowCase {"EmptyBrackets", "Flow []", "Rain", {"Flow ", "Rain"}, {}, {"Flow []", "Rain"}},
                      HeaderRowCase {"NothingBeforeBracketOrAfterColon", "Rain:", "[x]", {}, {"Rain:", "x"}, {}}),
    [](const auto& test) { return std::string(test.param.name); });

TEST_F(ExcelParserTest, EmptyHeaderValuesShowTheirMessages)
{
    WriteDailySheet(1);
    Sheet1().Put("B1", "[mm]");
    Sheet1().Put("C1", "Flow []");
    CString message;
    ASSERT_EQ(m_parser->OpenWorkbook(m_path, message), 1);
    m_spec.m_DataDesc.m_nUnitTypeOption = 1;
    m_spec.m_DataDesc.m_nUnitOption = 1;
    Strings list;
    EXPECT_EQ(m_parser->GetItemTypes(list), 0);
    EXPECT_EQ(m_parser->GetUnits(list), 0);
    EXPECT_EQ(MessageTexts(),
              (Strings {res::LoadString(res::IDS_NO_ITEM_TYPE), res::LoadString(res::IDS_NO_UNIT_TYPE)}));
}

TEST_F(ExcelParserTest, UnitRowWithEmptyBracketsFailsTheParse)
{
    WriteDailySheet(1);
    Sheet1().Put("B1", "Flow");
    Sheet1().Put("C1", "Flow []");
    m_spec.m_DataDesc.m_nUnitOption = 1;
    EXPECT_EQ(m_parser->Parse(""), 0);
    EXPECT_EQ(MessageTexts(), (Strings {res::LoadString(res::IDS_NO_UNIT_TYPE)}));
    EXPECT_EQ(m_parser->m_vecRows.size(), 1u) << "the item types were read before";
    EXPECT_FALSE(m_parser->IsWorkbookOpen());
}

TEST_F(ExcelParserTest, DescriptionsFromDefinitionsAndUnknownOptions)
{
    WriteDailySheet(1);
    m_spec.m_DataDesc.m_vecItemDefs = {{"A", "Rain", "mm", "Accumulated"}, {"B", "Flow", "m3/s", "Bogus"}};
    m_spec.m_DataDesc.m_nUnitTypeOption = 2;
    m_spec.m_DataDesc.m_nUnitOption = 2;
    m_spec.m_DataDesc.m_nValueTypeOption = 2;
    CString message;
    ASSERT_EQ(m_parser->OpenWorkbook(m_path, message), 1);
    Strings types, units, valueTypes;
    EXPECT_EQ(m_parser->GetItemTypes(types), 1);
    EXPECT_EQ(m_parser->GetUnits(units), 1);
    EXPECT_EQ(m_parser->GetValueTypes(valueTypes), 1);
    EXPECT_EQ(types, (Strings {"Rain", "Flow"}));
    EXPECT_EQ(units, (Strings {"mm", "m3/s"}));
    EXPECT_EQ(valueTypes, (Strings {"Accumulated", "Bogus"}));
    m_spec.m_DataDesc.m_nUnitOption = 3;
    EXPECT_EQ(m_parser->GetUnits(units), 0);
}

TEST_F(ExcelParserTest, ValuesAreTheDisplayedTextsAndDeleteValuesEmptyThem)
{
    WriteDailySheet(2);
    Sheet1().Put("B4", 2.0, "-999");
    Sheet1().Put("C3", 44333.0, "17.05.2021");
    m_spec.m_DataDesc.m_nDeleteValueCheck = 1;
    m_spec.m_DataDesc.m_nDeleteValueRadio = 0;
    m_spec.m_DataDesc.m_strDeleteValue = "-999";
    ASSERT_EQ(m_parser->Parse(""), 1);
    EXPECT_EQ(m_parser->m_vecRows[3], (Strings {"2021/05/17 00:00:00", "1.50", "17.05.2021"}));
    EXPECT_EQ(m_parser->m_vecRows[4], (Strings {"2021/05/18 00:00:00", "", "2.00"}));
    EXPECT_EQ(m_parser->m_vecRawLines[3][1], "-999") << "raw rows keep the value";

    // Read from column A of the delete-value row instead; case does not matter.
    Sheet1().Put("A1", "n/a");
    Sheet1().Put("C4", "N/A");
    m_spec.m_DataDesc.m_nDeleteValueRadio = 1;
    ASSERT_EQ(m_parser->Parse(""), 1);
    EXPECT_EQ(m_parser->m_vecRows[4], (Strings {"2021/05/18 00:00:00", "-999", ""}));

    m_spec.m_DataDesc.m_nDeleteValueCheck = 0;
    ASSERT_EQ(m_parser->Parse(""), 1);
    EXPECT_EQ(m_parser->m_vecRows[4], (Strings {"2021/05/18 00:00:00", "-999", "N/A"}));
}

TEST_F(ExcelParserTest, OpenAndCloseWorkbook)
{
    CString message;
    EXPECT_EQ(m_parser->OpenWorkbook(m_path + ".missing", message), 0);
    EXPECT_EQ(message, "") << "a missing file gives no message";

    // A file the application refuses.
    const std::string other = m_path + ".other";
    std::ofstream(other) << "x";
    EXPECT_EQ(m_parser->OpenWorkbook(other, message), 0);
    EXPECT_EQ(message, "Failed to open file: " + other);
    sys::DeleteFile(other);

    ASSERT_EQ(m_parser->OpenWorkbook(m_path, message), 1);
    ASSERT_EQ(m_parser->OpenWorkbook(m_path, message), 1);
    EXPECT_EQ(m_app->log, (Strings {"Visible false", "Open " + other, "Open " + m_path, "Close", "Open " + m_path}));
    EXPECT_EQ(m_parser->CloseWorkbook(), 1);
    EXPECT_EQ(m_parser->CloseWorkbook(), 1);
    EXPECT_EQ(std::count(m_app->log.begin(), m_app->log.end(), "Close"), 2);
    EXPECT_EQ(m_parser->CheckSheetIndex(1), 0) << "the sheets went with the workbook";
}

TEST_F(ExcelParserTest, DestructionClosesTheWorkbookAndQuits)
{
    CString message;
    ASSERT_EQ(m_parser->OpenWorkbook(m_path, message), 1);
    m_parser.reset();
    ASSERT_GE(m_app->log.size(), 2u);
    EXPECT_EQ(m_app->log[m_app->log.size() - 2], "Close");
    EXPECT_EQ(m_app->log.back(), "Quit");
}

TEST_F(ExcelParserTest, WithoutTheApplicationEverythingFailsSilently)
{
    WriteDailySheet(2);
    CExcelFilePreviewParser parser([] { return std::shared_ptr<sheet::Application>(); });
    parser.m_pSpecification = &m_spec;
    parser.SetFile(m_path);
    CString message;
    EXPECT_FALSE(parser.HasApplication());
    EXPECT_EQ(parser.OpenWorkbook(m_path, message), 0);
    EXPECT_EQ(parser.Parse(""), 0);
    EXPECT_EQ(parser.ReadRawLines(""), 0);
    EXPECT_EQ(message, "");
    EXPECT_TRUE(m_ui.boxes.empty());

    CExcelFilePreviewParser throwing([]() -> std::shared_ptr<sheet::Application> {
        throw sheet::AutomationError("cannot start");
    });
    EXPECT_FALSE(throwing.HasApplication());
}

TEST_F(ExcelParserTest, ParseWithoutTemplateOrFileFails)
{
    WriteDailySheet(1);
    m_parser->m_pSpecification = nullptr;
    EXPECT_EQ(m_parser->Parse(""), 0);
    m_parser->m_pSpecification = &m_spec;
    m_parser->SetFile("");
    EXPECT_EQ(m_parser->Parse(""), 0);
    EXPECT_EQ(m_parser->Parse(m_path), 0) << "the header rows need the bound file";
    EXPECT_FALSE(m_parser->IsWorkbookOpen());
}

TEST_F(ExcelParserTest, UsedColumnsCountColumnsHoldingAnyValue)
{
    CString message;
    Sheet1().Put("B2", "x");
    ASSERT_EQ(m_parser->OpenWorkbook(m_path, message), 1);
    int count = 99;
    EXPECT_EQ(m_parser->CountUsedColumns(count), 0) << "a single cell";
    EXPECT_EQ(count, 0);

    Sheet1().PutEmptyText("C5"); // an empty text is a value
    Sheet1().Put("F3", "y");     // D and E stay empty inside the range
    ASSERT_EQ(m_parser->CountUsedColumns(count), 1);
    EXPECT_EQ(count, 3);
    EXPECT_EQ(m_parser->m_nUsedColumns, 3);
    int first = 0;
    ASSERT_EQ(m_parser->GetFirstUsedColumn(first), 1);
    EXPECT_EQ(first, 2);
}

TEST_F(ExcelParserTest, ItemCountIsCachedUntilTheFileChanges)
{
    WriteDailySheet(1);
    CString message;
    ASSERT_EQ(m_parser->OpenWorkbook(m_path, message), 1);
    int count = 0;
    ASSERT_EQ(m_parser->GetItemCount(count), 1);
    EXPECT_EQ(count, 2);

    Sheet1().Put("D3", "more");
    ASSERT_EQ(m_parser->GetItemCount(count), 1);
    EXPECT_EQ(count, 2) << "cached";
    m_parser->SetFile(m_path); // the same file: only the cache is forgotten
    ASSERT_EQ(m_parser->GetItemCount(count), 1);
    EXPECT_EQ(count, 3);

    // Two columns spanned by the date/time leave one item.
    m_spec.m_TimeDesc.m_bUseDTFormat = 1;
    m_spec.m_TimeDesc.m_strDateTimeFormat = "YYYY/MM/DD|HH:mm";
    m_parser->SetFile(m_path);
    count = 0;
    ASSERT_EQ(m_parser->GetItemCount(count), 1);
    EXPECT_EQ(count, 2);
}

TEST_F(ExcelParserTest, SheetWithOneUsedColumnHasNoItems)
{
    Sheet1().Put("A3", 44333.0, "17/05/2021");
    Sheet1().Put("A4", 44334.0, "18/05/2021");
    CString message;
    ASSERT_EQ(m_parser->OpenWorkbook(m_path, message), 1);
    int count = 7;
    EXPECT_EQ(m_parser->GetItemCount(count), 0);
    EXPECT_EQ(count, 7);
}

TEST_F(ExcelParserTest, SetFileKeepsTheTitleForTheSamePathInOtherCase)
{
    m_parser->m_strFileTitle = "kept";
    std::string upper = m_path;
    for (char& c : upper)
        c = static_cast<char>(std::toupper(static_cast<unsigned char>(c)));
    m_parser->m_nUsedColumns = 4;
    m_parser->SetFile(upper);
    EXPECT_EQ(m_parser->m_strFile, m_path);
    EXPECT_EQ(m_parser->m_strFileTitle, "kept");
    EXPECT_EQ(m_parser->m_nUsedColumns, -1);
    m_parser->SetFile("/elsewhere/data.xlsx");
    EXPECT_EQ(m_parser->m_strFileTitle, "data.xlsx");
}

TEST_F(ExcelParserTest, RawLinesWithoutTemplateReadSheetOne)
{
    WriteDailySheet(25);
    m_parser->m_pSpecification = nullptr;
    ASSERT_EQ(m_parser->ReadRawLines(""), 1);
    ASSERT_EQ(m_parser->m_vecRawLines.size(), 20u);
    EXPECT_EQ(m_parser->m_vecRawLines[1], (Strings {"Date", "A", "B"}));
    EXPECT_TRUE(m_parser->m_vecRows.empty());
    EXPECT_TRUE(m_parser->m_vecItemNames.empty());
    EXPECT_FALSE(m_parser->IsWorkbookOpen());
}

TEST_F(ExcelParserTest, RowCellsLeaveOutUnreadableCells)
{
    WriteDailySheet(1);
    CString message;
    ASSERT_EQ(m_parser->OpenWorkbook(m_path, message), 1);
    Strings cells {"stale"};
    EXPECT_EQ(m_parser->ReadRowCells(0, 1, 3, cells), 0);
    EXPECT_TRUE(cells.empty());
    EXPECT_EQ(m_parser->ReadRowCells(2, 3, 2, cells), 0);
    EXPECT_EQ(m_parser->ReadRowCells(2, -1, 2, cells), 0);
    ASSERT_EQ(m_parser->ReadRowCells(2, 1, 3, cells), 1);
    EXPECT_EQ(cells, (Strings {"Date", "A", "B"}));
    Sheet1().failingAddresses.insert("B2");
    ASSERT_EQ(m_parser->ReadRowCells(2, 0, 3, cells), 1);
    EXPECT_EQ(cells, (Strings {"Date", "B"}));
}

TEST_F(ExcelParserTest, UnreadableDateCellClosesTheWorkbook)
{
    WriteDailySheet(1);
    CString message;
    ASSERT_EQ(m_parser->OpenWorkbook(m_path, message), 1);
    std::vector<sheet::Variant> cells;
    ASSERT_EQ(m_parser->ReadDateTimeCells(3, 1, 1, cells, false), 1);
    ASSERT_EQ(cells.size(), 1u);
    EXPECT_EQ(cells[0].type, sheet::Variant::Number);
    ASSERT_EQ(m_parser->ReadDateTimeCells(3, 1, 2, cells, false), 1);
    EXPECT_EQ(cells[0].type, sheet::Variant::Text) << "several cells are read as texts";
    Sheet1().failingAddresses.insert("B3");
    EXPECT_EQ(m_parser->ReadDateTimeCells(3, 1, 2, cells, true), 0);
    EXPECT_FALSE(m_parser->IsWorkbookOpen());
}

} // namespace
