#include "ParserTestSupport.h"
#include "parsers/AsciiFilePreviewParser.h"
#include "parsers/FileException.h"
#include "templates/AsciiSpecification.h"
#include "tests/support/ScratchLocale.h"

#include <gtest/gtest.h>

namespace {

using parsertest::MessageIds;
using Ids = std::vector<int>;

// Most cases give types, units and value types for all items, so the header rows do not matter.
class AsciiParserTest : public parsertest::AsciiParserFixture {
protected:
    // A tab file: a header line, the name line, then `lines` data lines.
    static std::string TabFile(int lines)
    {
        std::string content = "Gauge 7\nTime\tA\tB\n";
        for (int i = 0; i < lines; ++i)
            content += "2020/01/01 " + std::to_string(10 + i % 10) + ":00:00\t" + std::to_string(i) + ".5\t2\n";
        return content;
    }
};

TEST_F(AsciiParserTest, TabLayoutGivesNamesMetadataAndStampedRows)
{
    Bind("Station X\nTime\tA\tB\n2020/01/01 12:00:00\t1.5\t2.5\n2020/01/01 13:00:00\t1.75\t-1\n");
    ASSERT_EQ(parser.Parse(""), 1);
    EXPECT_TRUE(ui.boxes.empty());
    EXPECT_EQ(parser.m_vecItemNames, (CStringList{"Time", "A", "B"}));
    const ui::Rows expected = {
        {"", "Undefined", "Undefined"},
        {"", "Undefined", "Undefined"},
        {"", "Instantaneous", "Instantaneous"},
        {"2020/01/01 12:00:00", "1.5", "2.5"},
        {"2020/01/01 13:00:00", "1.75", "-1"},
    };
    EXPECT_EQ(parser.m_vecRows, expected);
    int count = 0;
    ASSERT_EQ(parser.GetItemCount(count), 1);
    EXPECT_EQ(count, 2);
}

TEST_F(AsciiParserTest, SpaceLayoutDateTimeSpansTwoFields)
{
    spec.m_strDelimiter = "Space";
    Bind("head\nDate Time A B\n2020/01/01 12:00:00 1.5 2.5\n2020/01/02 00:30:00 3 4\n");
    ASSERT_EQ(parser.Parse(""), 1) << ::testing::PrintToString(MessageIds(ui));
    EXPECT_EQ(parser.m_vecItemNames, (CStringList{"Date", "A", "B"}));
    ASSERT_EQ(parser.m_vecRows.size(), 5u);
    EXPECT_EQ(parser.m_vecRows[3], (ui::Row{"2020/01/01 12:00:00", "1.5", "2.5"}));
    EXPECT_EQ(parser.m_vecRows[4], (ui::Row{"2020/01/02 00:30:00", "3", "4"}));
    CStringList names;
    ASSERT_EQ(parser.GetItemNames(names), 1);
    EXPECT_EQ(names, (CStringList{"A", "B"}));
}

TEST_F(AsciiParserTest, SpaceLayoutNameLineMustLeaveRoomForBothDateTimeTitles)
{
    spec.m_strDelimiter = "Space";
    Bind("head\nTime A B\n2020/01/01 12:00:00 1.5 2.5\n");
    EXPECT_EQ(parser.Parse(""), 0);
    EXPECT_EQ(MessageIds(ui), (Ids{res::IDS_NAME_COLUMNS_MISMATCH}));
}

TEST_F(AsciiParserTest, DateTimeElsewhereStillStampsFirst)
{
    struct Case {
        const char* delimiter;
        int column;
        const char* file;
        CStringList names;
    };
    const Case cases[] = {
        {"Space", 2, "h\nA When Clock B\n1 2020/01/01 12:00:00 2\n", {"When", "A", "B"}},
        {"Tab", 3, "h\nA\tB\tTime\n1\t2\t2020/01/01 12:00:00\n", {"Time", "A", "B"}},
    };
    for (const Case& c : cases) {
        spec.m_strDelimiter = c.delimiter;
        spec.m_TimeDesc.m_nDateTimeCol = c.column;
        Bind(c.file);
        ASSERT_EQ(parser.Parse(""), 1) << c.file << ::testing::PrintToString(MessageIds(ui));
        EXPECT_EQ(parser.m_vecItemNames, c.names);
        EXPECT_EQ(parser.m_vecRows.back(), (ui::Row{"2020/01/01 12:00:00", "1", "2"}));
    }
}

TEST_F(AsciiParserTest, GlobalDateAndGlobalTimeStamps)
{
    struct Case {
        int option;
        const char* file;
        const char* stamp;
    };
    const Case cases[] = {
        {1, "h\nTime\tQ\n06:00\t1\n", "2020-05-01  06:00"},
        {2, "h\nDay\tQ\n2020/05/03\t1\n", "2020/05/03  07:30:00"},
    };
    for (const Case& c : cases) {
        spec.m_TimeDesc.m_nDateTimeOption = c.option;
        spec.m_TimeDesc.m_strGlobalDate = "2020-05-01";
        spec.m_TimeDesc.m_strGlobalTime = "07:30:00";
        Bind(c.file);
        ASSERT_EQ(parser.Parse(""), 1) << c.option;
        EXPECT_EQ(parser.m_vecRows.back(), (ui::Row{c.stamp, "1"})) << c.option;
    }
}

TEST_F(AsciiParserTest, DecimalSeparatorCheck)
{
    struct Case {
        const char* separator;
        const char* value;
        bool accepted;
    };
    const Case cases[] = {
        {"Dot", "3,5", false}, {"Dot", "3.5", true},   {"Dot", "1,234.5", true},
        {"Comma", "3.5", false}, {"Comma", "3,5", true}, {"Comma", "1.234,5", true},
        {"Dot", "", true},
        {"User Locale", "3,5", false}, // the "C" locale below, whose separator is the point
    };
    const testsupport::ScopedEnv cLocale("LC_ALL", "C");
    for (const Case& c : cases) {
        ui.boxes.clear();
        spec.m_strDecimalSeparator = c.separator;
        Bind(std::string("h\nTime\tA\tB\n2020/01/01 00:00:00\t") + c.value + "\t1\n");
        EXPECT_EQ(parser.Parse(""), c.accepted ? 1 : 0) << c.separator << " " << c.value;
        EXPECT_EQ(MessageIds(ui), c.accepted ? Ids{} : Ids{res::IDS_DECIMAL_SEPARATOR_MISMATCH}) << c.value;
    }
}

TEST_F(AsciiParserTest, UserLocaleFollowsTheEnvironment)
{
    const testsupport::ScratchLocale& german = testsupport::ScratchLocale::German();
    if (!german.Available())
        GTEST_SKIP() << "localedef cannot build de_DE.UTF-8 here (no localedef or no locale sources)";
    const testsupport::LocaleEnvironment environment(german, nullptr, nullptr, testsupport::ScratchLocale::kName);
    spec.m_strDecimalSeparator = "User Locale";
    for (const auto& [value, accepted] : {std::pair{"3,5", true}, std::pair{"3.5", false}, std::pair{"1.234,5", true}}) {
        ui.boxes.clear();
        Bind(std::string("h\nTime\tA\n2020/01/01 00:00:00\t") + value + "\n");
        EXPECT_EQ(parser.Parse(""), accepted ? 1 : 0) << value;
        EXPECT_EQ(MessageIds(ui), accepted ? Ids{} : Ids{res::IDS_DECIMAL_SEPARATOR_MISMATCH}) << value;
    }
}

TEST_F(AsciiParserTest, TwentyDataLinesAtMostWithHeaderRawLines)
{
    Bind(TabFile(100));
    ASSERT_EQ(parser.Parse(""), 1);
    EXPECT_EQ(parser.m_vecRows.size(), 3u + CAsciiFilePreviewParser::kPreviewLines);
    ASSERT_EQ(parser.m_vecRawLines.size(), 2u + CAsciiFilePreviewParser::kPreviewLines);
    EXPECT_EQ(parser.m_vecRawLines[0], ui::Row{"Gauge 7"});
    EXPECT_EQ(parser.m_vecRawLines[1], ui::Row{"Time    A    B"}); // tabs shown as four blanks
    EXPECT_EQ(parser.m_vecRawLines.back(), ui::Row{"2020/01/01 19:00:00    19.5    2"});
}

TEST_F(AsciiParserTest, BlankDataLineIsSkippedButCounts)
{
    std::string content = TabFile(1) + "\n" + TabFile(30).substr(std::string("Gauge 7\nTime\tA\tB\n").size());
    Bind(content);
    ASSERT_EQ(parser.Parse(""), 1);
    EXPECT_EQ(parser.m_vecRows.size(), 3u + 19u);
    EXPECT_EQ(parser.m_vecRawLines.size(), 2u + 20u);
    EXPECT_EQ(parser.m_vecRawLines[3], ui::Row{""});
}

TEST_F(AsciiParserTest, WindowsLineEndsAreRemoved)
{
    Bind("h\r\nTime\tA\r\n2020/01/01 00:00:00\t1.5\r\n");
    ASSERT_EQ(parser.Parse(""), 1);
    EXPECT_EQ(parser.m_vecItemNames, (CStringList{"Time", "A"}));
    EXPECT_EQ(parser.m_vecRows.back(), (ui::Row{"2020/01/01 00:00:00", "1.5"}));
}

TEST_F(AsciiParserTest, DeleteValueFromTheTemplateText)
{
    spec.m_DataDesc.m_nDeleteValueCheck = 1;
    spec.m_DataDesc.m_nDeleteValueRadio = 0;
    spec.m_DataDesc.m_strDeleteValue = "-999";
    Bind("h\nTime\tA\t-999\n2020/01/01 00:00:00\t-999\t-999.0\n");
    ASSERT_EQ(parser.Parse(""), 1);
    EXPECT_EQ(parser.m_vecItemNames, (CStringList{"Time", "A", ""}));
    EXPECT_EQ(parser.m_vecRows.back(), (ui::Row{"2020/01/01 00:00:00", "", "-999.0"}));

    spec.m_DataDesc.m_strDeleteValue = "NaN"; // compared without regard to case
    Bind("h\nTime\tA\n2020/01/01 00:00:00\tnan\n");
    ASSERT_EQ(parser.Parse(""), 1);
    EXPECT_EQ(parser.m_vecRows.back(), (ui::Row{"2020/01/01 00:00:00", ""}));

    spec.m_DataDesc.m_nDeleteValueCheck = 0; // not in use: nothing is deleted
    ASSERT_EQ(parser.Parse(""), 1);
    EXPECT_EQ(parser.m_vecRows.back(), (ui::Row{"2020/01/01 00:00:00", "nan"}));
}

TEST_F(AsciiParserTest, DeleteValueFromARowIsTheWholeLine)
{
    spec.m_DataDesc.m_nDeleteValueCheck = 1;
    spec.m_DataDesc.m_nDeleteValueRadio = 1;
    spec.m_DataDesc.m_nDeleteValueRow = 1;
    spec.m_DataDesc.m_strDeleteValue = "1"; // not used with a delete value row
    Bind("-999\nTime\tA\tB\n2020/01/01 00:00:00\t-999\t1\n");
    ASSERT_EQ(parser.Parse(""), 1);
    EXPECT_EQ(parser.m_vecRows.back(), (ui::Row{"2020/01/01 00:00:00", "", "1"}));

    spec.m_strDelimiter = "Semi Colon";
    Bind("-999;-999\nTime;A;B\n2020/01/01 00:00:00;-999;1\n");
    ASSERT_EQ(parser.Parse(""), 1);
    EXPECT_EQ(parser.m_vecRows.back(), (ui::Row{"2020/01/01 00:00:00", "-999", "1"}));
}

TEST_F(AsciiParserTest, ItemTypeLookupByKeyAndByName)
{
    spec.m_DataDesc.m_nUnitTypeOption = 1;
    spec.m_DataDesc.m_nUnitTypeRow = 1;
    struct Case {
        const char* typeLine;
        CStringList types;
    };
    const Case cases[] = {
        {"102\twater level", {"102", "water level"}},
        {"Discharge [m^3/s]\tWater Level[m]", {"Water Level"}}, // the blank before "[" stays, no match
        {"Gauge\tDischarge\tRainfall", {"Discharge"}},          // no date/time field is passed over
        {"NoSuchType\t7", {}},
    };
    for (const Case& c : cases) {
        Bind(std::string(c.typeLine) + "\nTime\tA\tB\n2020/01/01 00:00:00\t1\t2\n");
        CStringList types;
        ASSERT_EQ(parser.GetItemTypes(types), 1) << c.typeLine;
        EXPECT_EQ(types, c.types) << c.typeLine;
    }
}

TEST_F(AsciiParserTest, ParseFailsWithoutAnyKnownItemType)
{
    spec.m_DataDesc.m_nUnitTypeOption = 1;
    Bind("Nothing\tKnown\nTime\tA\tB\n2020/01/01 00:00:00\t1\t2\n");
    EXPECT_EQ(parser.Parse(""), 0);
    EXPECT_TRUE(ui.boxes.empty());
}

TEST_F(AsciiParserTest, UnitsFromTheUnitRow)
{
    spec.m_DataDesc.m_nUnitOption = 1;
    spec.m_DataDesc.m_nUnitRow = 1;
    Bind("Level [m]\tFlow [m^3/s]\tExtra [x]\nTime\tA\tB\n2020/01/01 00:00:00\t1\t2\n");
    CStringList units;
    ASSERT_EQ(parser.GetUnits(units), 1);
    EXPECT_EQ(units, (CStringList{"m", "m^3/s"}));
}

TEST_F(AsciiParserTest, HandDefinedTitlesAndNumberedNames)
{
    spec.m_DataDesc.m_nItemTitleOption = 1;
    spec.m_DataDesc.m_vecItemDefs = {{"Level", "Water Level", "m", "Instantaneous"},
                                     {"Flow", "Discharge", "m^3/s", "Instantaneous"}};
    Bind("h\nignored\n2020/01/01 00:00:00\t1\t2\t3\n");
    CStringList names;
    ASSERT_EQ(parser.GetItemNames(names), 1);
    EXPECT_EQ(names, (CStringList{"Item1", "Item2", "Item3"}));

    spec.m_DataDesc.m_vecItemDefs.push_back({"Rain", "Rainfall", "mm", "Accumulated"});
    ASSERT_EQ(parser.Parse(""), 1);
    EXPECT_EQ(parser.m_vecItemNames, (CStringList{"Level", "Flow", "Rain"})); // no date/time title
    EXPECT_EQ(parser.m_vecRows.back(), (ui::Row{"2020/01/01 00:00:00", "1", "2", "3"}));
}

TEST_F(AsciiParserTest, ValueTypeRows)
{
    spec.m_DataDesc.m_nValueTypeOption = 1;
    spec.m_DataDesc.m_nValueTypeRow = 1;
    struct Case {
        const char* valueLine;
        int items;
        int result;
        CStringList valueTypes;
        Ids messages;
    };
    const Case cases[] = {
        {"Rain:Accumulated\tFlow:Instantaneous", 2, 1, {"Accumulated", "Instantaneous"}, {}},
        {"step_accumulated\tMean_Step_Accumulated", 2, 1, {"step_accumulated", "Mean_Step_Accumulated"}, {}},
        {"Time\tAccumulated\tInstantaneous", 2, 0, {}, {res::IDS_VALUE_TYPE_INVALID}},
        // The field that comes with the end of the line is taken unchecked.
        {"Accumulated", 2, 1, {"Accumulated", ""}, {}},
        {"Accumulated", 3, 0, {"Accumulated", ""}, {res::IDS_VALUE_TYPE_LINE_SHORT}},
        {"", 2, 0, {}, {res::IDS_VALUE_TYPE_LINE_EMPTY}},
    };
    for (const Case& c : cases) {
        ui.boxes.clear();
        std::string names = "Time", values = "2020/01/01 00:00:00";
        for (int i = 0; i < c.items; ++i) {
            names += "\tI" + std::to_string(i);
            values += "\t" + std::to_string(i);
        }
        Bind(std::string(c.valueLine) + "\n" + names + "\n" + values + "\n");
        CStringList valueTypes;
        EXPECT_EQ(parser.GetValueTypes(valueTypes), c.result) << c.valueLine;
        EXPECT_EQ(valueTypes, c.valueTypes) << c.valueLine;
        EXPECT_EQ(MessageIds(ui), c.messages) << c.valueLine;
    }
}

TEST_F(AsciiParserTest, GlobalValueTypeMustBeKnown)
{
    spec.m_DataDesc.m_strGlobalValueType = "Average";
    Bind("h\nTime\tA\n2020/01/01 00:00:00\t1\n");
    CStringList valueTypes;
    EXPECT_EQ(parser.GetValueTypes(valueTypes), 0);
    EXPECT_EQ(MessageIds(ui), (Ids{res::IDS_VALUE_TYPE_INVALID}));
    spec.m_DataDesc.m_strGlobalValueType = "INSTANTANEOUS";
    EXPECT_EQ(parser.GetValueTypes(valueTypes), 1);
}

TEST_F(AsciiParserTest, EachMessageWithItsCondition)
{
    struct Case {
        const char* name;
        const char* file;
        void (*adjust)(CAsciiSpecification&);
        int message;
    };
    auto none = [](CAsciiSpecification&) {};
    const Case cases[] = {
        {"empty name line", "h\n\n2020/01/01 00:00:00\t1\n", none, res::IDS_ITEM_NAME_LINE_EMPTY},
        {"name line without delimiter", "h\nTime A\n2020/01/01 00:00:00\t1\n", none,
         res::IDS_ITEM_NAME_LINE_NO_DELIMITER},
        {"empty item type line", "\nTime\tA\n2020/01/01 00:00:00\t1\n",
         [](CAsciiSpecification& s) { s.m_DataDesc.m_nUnitTypeOption = 1; }, res::IDS_ITEM_TYPE_LINE_EMPTY},
        {"empty unit line", "\nTime\tA\n2020/01/01 00:00:00\t1\n",
         [](CAsciiSpecification& s) { s.m_DataDesc.m_nUnitOption = 1; }, res::IDS_UNIT_LINE_EMPTY},
        {"start line without delimiter", "h\nTime\tA\n2020/01/01 00:00:00\n", none,
         res::IDS_START_ROW_NO_DELIMITER},
        {"no item column", "h\nDate Time A\n2020/01/01 12:00:00\n",
         [](CAsciiSpecification& s) { s.m_strDelimiter = "Space"; }, res::IDS_ITEM_COUNT_WRONG},
        {"data line with an extra field", "h\nTime\tA\n2020/01/01 00:00:00\t1\n2020/01/01 01:00:00\t1\t2\n", none,
         res::IDS_ITEM_COUNT_WRONG},
        {"data line with a field less", "h\nTime\tA\tB\n2020/01/01 00:00:00\t1\t2\n2020/01/01 01:00:00\t1\n", none,
         res::IDS_ITEM_COUNT_WRONG},
        {"name line shorter than data", "h\nTime\tA\n2020/01/01 00:00:00\t1\t2\n", none,
         res::IDS_NAME_COLUMNS_MISMATCH},
        {"data line without delimiter", "h\nTime\tA\n2020/01/01 00:00:00\t1\n2020/01/01 01:00:00\n", none,
         res::IDS_NO_DELIMITERS},
        {"date/time column never reached", "h\nA\tB\tC\n1\t2\t3\n",
         [](CAsciiSpecification& s) { s.m_TimeDesc.m_nDateTimeCol = 5; }, res::IDS_NO_DATETIME_COLUMN},
        {"line ends inside the date/time", "h\nA Date Time Zone\n1 2020/01/01 12:00 X\n1 2020/01/01\n",
         [](CAsciiSpecification& s) {
             s.m_strDelimiter = "Space";
             s.m_TimeDesc.m_nDateTimeCol = 2;
             s.m_TimeDesc.m_strDateTimeFormat = "YYYY/MM/DD HH:mm ss";
         },
         res::IDS_DATETIME_UNPARSABLE},
    };
    for (const Case& c : cases) {
        ui.boxes.clear();
        CAsciiSpecification fresh;
        fresh.m_DataDesc.m_nUnitTypeOption = 0;
        fresh.m_DataDesc.m_nUnitOption = 0;
        fresh.m_DataDesc.m_nValueTypeOption = 0;
        c.adjust(fresh);
        spec = fresh;
        Bind(c.file);
        EXPECT_EQ(parser.Parse(""), 0) << c.name;
        EXPECT_EQ(MessageIds(ui), Ids{c.message}) << c.name;
    }
}

TEST_F(AsciiParserTest, ItemNamesFromTheNameLine)
{
    // A trailing delimiter counts as a field, so the line passes the count and ends in an empty name.
    Bind("h\nTime\tA\t\n2020/01/01 00:00:00\t1\t2\n");
    CStringList names{"stale"};
    ASSERT_EQ(parser.GetItemNames(names), 1);
    EXPECT_EQ(names, (CStringList{"A", ""}));

    Bind("h\nTime\tA\tB\tC\n2020/01/01 00:00:00\t1\t2\n"); // a longer name line is accepted
    ASSERT_EQ(parser.GetItemNames(names), 1);
    EXPECT_EQ(names, (CStringList{"A", "B"}));

    spec.m_TimeDesc.m_nDateTimeCol = 2; // names before and after the date/time title
    Bind("h\nA\tTime\tB\n1\t2020/01/01 00:00:00\t2\n");
    ASSERT_EQ(parser.GetItemNames(names), 1);
    EXPECT_EQ(names, (CStringList{"A", "B"}));
    EXPECT_TRUE(ui.boxes.empty());
}

TEST_F(AsciiParserTest, DateTimeOptionOutsideTheRangeEndsTheParse)
{
    for (int option : {3, -1, 1000}) {
        ui.boxes.clear();
        spec.m_TimeDesc.m_nDateTimeOption = option;
        Bind("h\nTime\tA\n2020/01/01 00:00:00\t1\n");
        EXPECT_EQ(parser.Parse(""), 0) << option;
        EXPECT_EQ(MessageIds(ui), (Ids{res::IDS_NO_DATETIME_COLUMN})) << option;
    }
}

TEST_F(AsciiParserTest, FormatThatSpansNoFieldEndsTheParse)
{
    spec.m_TimeDesc.m_strDateTimeFormat = "";
    Bind("h\nTime\tA\n2020/01/01 00:00:00\t1\n");
    EXPECT_EQ(parser.Parse(""), 0);
    EXPECT_EQ(MessageIds(ui), (Ids{res::IDS_DATETIME_UNPARSABLE}));
}

TEST_F(AsciiParserTest, MissingFileOrTemplateFailsSilently)
{
    parser.SetFile(folder.File("absent.txt"));
    int count = 7;
    CStringList list;
    EXPECT_EQ(parser.GetItemCount(count), 0);
    EXPECT_EQ(parser.GetItemNames(list), 0);
    EXPECT_EQ(parser.GetItemTypes(list), 0);
    EXPECT_EQ(parser.GetUnits(list), 0);
    EXPECT_EQ(parser.GetValueTypes(list), 0);
    EXPECT_EQ(parser.Parse(""), 0);
    EXPECT_EQ(parser.ReadRawLines(""), 0);
    CString line;
    EXPECT_EQ(parser.ReadLine(1, line), 0);

    Bind(TabFile(2));
    parser.m_pSpecification = nullptr;
    EXPECT_EQ(parser.Parse(""), 0);
    EXPECT_EQ(parser.GetItemCount(count), 0);
    EXPECT_TRUE(ui.boxes.empty());
}

TEST_F(AsciiParserTest, UnreadableFileRaisesTheFileException)
{
    parser.SetFile(folder.File("")); // the folder exists but cannot be read as a file
    EXPECT_THROW(parser.Parse(""), CFileException);
    CString line;
    EXPECT_THROW(parser.ReadLine(1, line), CFileException);
}

TEST_F(AsciiParserTest, ReadLineCountsFromOne)
{
    Bind("one\ntwo\nthree");
    CString line = "x";
    EXPECT_EQ(parser.ReadLine(3, line), 1);
    EXPECT_EQ(line, "three");
    EXPECT_EQ(parser.ReadLine(4, line), 1);
    EXPECT_EQ(line, "");
    EXPECT_EQ(parser.ReadLine(0, line), 1);
    EXPECT_EQ(line, "");
    EXPECT_EQ(parser.ReadLine(-1, line), 0);
}

TEST_F(AsciiParserTest, ReadRawLinesIgnoresTheTemplate)
{
    Bind(TabFile(40));
    ASSERT_EQ(parser.Parse(""), 1);
    parser.m_pSpecification = nullptr;
    ASSERT_EQ(parser.ReadRawLines(""), 1);
    EXPECT_TRUE(parser.m_vecItemNames.empty());
    EXPECT_TRUE(parser.m_vecRows.empty());
    EXPECT_EQ(parser.m_vecRawLines.size(), 20u);

    const std::string other = folder.Write("other.txt", "a\tb\n");
    ASSERT_EQ(parser.ReadRawLines(other), 1);
    EXPECT_EQ(parser.m_vecRawLines, (ui::Rows{{"a    b"}}));
}

TEST_F(AsciiParserTest, ParseReadsTheBoundFileNotThePathGiven)
{
    Bind(TabFile(3));
    const std::string other = folder.Write("other.txt", "nothing here");
    ASSERT_EQ(parser.Parse(other), 1);
    EXPECT_EQ(parser.m_vecRows.size(), 6u);
}

TEST_F(AsciiParserTest, FailureKeepsWhatWasFilled)
{
    Bind("h\nTime\tA\n2020/01/01 00:00:00\t1\n2020/01/01 01:00:00\t1,5\n");
    EXPECT_EQ(parser.Parse(""), 0);
    EXPECT_EQ(parser.m_vecItemNames, (CStringList{"Time", "A"}));
    EXPECT_EQ(parser.m_vecRows.size(), 4u); // three metadata rows and the first data row
    EXPECT_EQ(parser.m_vecRawLines.size(), 4u);
}

} // namespace

TEST_F(AsciiParserTest, DateTimeColumnPastATrailingDelimiterFailsWithoutReadingPastTheLine)
{
    // The trailing delimiter yields a last empty field and leaves the position one past the end;
    // a date/time column after it must not take text from beyond the line.
    spec.m_TimeDesc.m_nDateTimeCol = 3;
    Bind("head\nA\tB\tTime\n1.5\t\n");
    int result = -1;
    EXPECT_NO_THROW(result = parser.Parse(""));
    ASSERT_EQ(result, 1);
    EXPECT_EQ(parser.m_vecRows.back(), (ui::Row{"", "1.5", ""}));
}
