#include "TemplateTestSupport.h"

#include "templates/AsciiSpecification.h"
#include "templates/ExcelSpecification.h"

#include "platform/ui/UserInterface.h"
#include "resources/StringTable.h"
#include "tests/support/ScratchLocale.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <clocale>
#include <ctime>
#include <string>
#include <utility>
#include <vector>

namespace {

using Call = std::pair<std::string, int>; // the field returned and pos after the call

// Calls NextField until pos is -1 and records every call; a runaway loop fails the test.
std::vector<Call> Fields(const CSpecification& spec, std::string line)
{
    std::vector<Call> calls;
    int pos = 0;
    while (pos != -1) {
        std::string field = spec.NextField(line, pos);
        calls.emplace_back(field, pos);
        if (calls.size() > 100) {
            ADD_FAILURE() << "NextField does not reach the end of the line";
            break;
        }
    }
    return calls;
}

CAsciiSpecification Ascii(const char* delimiter, int consecutive, int leading)
{
    CAsciiSpecification spec;
    spec.m_strDelimiter = delimiter;
    spec.m_bIgnoreConsecutiveDelimiters = consecutive;
    spec.m_bIgnoreBegginingOfLineDelimiters = leading;
    return spec;
}

std::string Today(const char* format)
{
    std::time_t now = std::time(nullptr);
    std::tm local {};
    localtime_r(&now, &local);
    char buffer[32];
    return std::string(buffer, std::strftime(buffer, sizeof(buffer), format, &local));
}

} // namespace

// Every stored default is checked value by value by the JSON listing test; here the clock values
// and the values no file stores.
TEST(TemplateModel, BothKindsStartWithTheDefaults)
{
    std::string dayBefore = Today("%Y-%m-%d");
    CAsciiSpecification ascii;
    CExcelSpecification excel;
    std::string dayAfter = Today("%Y-%m-%d");
    excel.m_TimeDesc.m_strGlobalDate = ascii.m_TimeDesc.m_strGlobalDate; // the clock may tick in between
    excel.m_TimeDesc.m_strGlobalTime = ascii.m_TimeDesc.m_strGlobalTime;
    EXPECT_EQ(testsupport::Describe(ascii), testsupport::Describe(excel));
    EXPECT_THAT(ascii.m_TimeDesc.m_strGlobalDate, testing::AnyOf(dayBefore, dayAfter));
    EXPECT_THAT(ascii.m_TimeDesc.m_strGlobalTime, testing::MatchesRegex("[0-2][0-9]:[0-5][0-9]:[0-6][0-9]"));
    EXPECT_EQ(ascii.m_bLoaded, 0);
    EXPECT_EQ(ascii.m_strTemplateFile, "");
    EXPECT_EQ(ascii.m_strSaveFile, "");
    EXPECT_EQ(ascii.m_DataDesc.m_nExcelSheet, 1);
}

TEST(TemplateModel, SeparatorNamesAreExactAndUnknownNamesGiveABlank)
{
    struct Case {
        const char* name;
        int result;
        const char* text;
    } cases[] = {
        {"Dot", 1, "."},        {"Comma", 1, ","},        {"Tab", 1, "\t"},  {"Semi Colon", 1, ";"},
        {"Space", 1, " "},      {"comma", 0, " "},        {"TAB", 0, " "},   {"", 0, " "},
        {"User Defined", 0, " "}, {"Semicolon", 0, " "},
    };
    for (const Case& c : cases) {
        CString text = "unchanged";
        EXPECT_EQ(CSpecification::MapSeparatorName(c.name, text), c.result) << c.name;
        EXPECT_EQ(text, c.text) << c.name;
    }
}

TEST(TemplateModel, UserLocaleSeparatorComesFromTheEnvironmentNotTheProcess)
{
    using testsupport::LocaleEnvironment;
    using testsupport::ScratchLocale;
    const ScratchLocale& german = ScratchLocale::German();
    if (!german.Available())
        GTEST_SKIP() << "localedef cannot build de_DE.UTF-8 here (no localedef or no locale sources)";
    CString text;
    {
        const LocaleEnvironment environment(german, nullptr, ScratchLocale::kName, nullptr);
        EXPECT_EQ(CSpecification::MapSeparatorName("User Locale", text), 1);
        EXPECT_EQ(text, ",");
    }
    // A process that switched its own locale still gets the environment's separator.
    const LocaleEnvironment environment(german, "C", nullptr, nullptr);
    const std::string previous = std::setlocale(LC_NUMERIC, nullptr);
    ASSERT_NE(std::setlocale(LC_NUMERIC, ScratchLocale::kName), nullptr);
    CSpecification::MapSeparatorName("User Locale", text);
    std::setlocale(LC_NUMERIC, previous.c_str());
    EXPECT_EQ(text, ".");
}

TEST(TemplateModel, DelimiterString)
{
    struct Case {
        const char* name;
        const char* user;
        const char* expected;
    } cases[] = {
        {"Comma", "", ","},
        {"comma", "", " "},
        {"User Defined", "", "\t"},
        {"user defined", "", "\t"},
        {"USER DEFINED", "#", "#"},
        {"User Defined", "::", "::"},
        {"Semi Colon", "#", ";"},
        {"Dot", "", "."},
    };
    for (const Case& c : cases) {
        CAsciiSpecification spec;
        spec.m_strDelimiter = c.name;
        spec.m_strDefDelimiter = c.user;
        EXPECT_EQ(spec.GetDelimiterString(), c.expected) << c.name << " / " << c.user;
    }
    CExcelSpecification excel;
    excel.m_strDecimalSeparator = "Comma";
    EXPECT_EQ(excel.GetDecimalSeparatorString(), ",");
    excel.m_strDecimalSeparator = "Space Dot";
    EXPECT_EQ(excel.GetDecimalSeparatorString(), " ");
}

TEST(NextField, SplitsLinesByTheFlags)
{
    struct Case {
        const char* label;
        const char* delimiter;
        int consecutive;
        int leading;
        const char* line;
        std::vector<Call> calls;
    } cases[] = {
        {"empty fields kept", "Comma", 0, 0, "a,,b", {{"a", 2}, {"", 3}, {"b", 4}, {"", -1}}},
        {"runs collapse", "Comma", 1, 0, "a,,b", {{"a", 3}, {"b", 4}, {"", -1}}},
        {"leading run is one empty field", "Comma", 1, 0, ",,a", {{"", 0}, {"a", 1}, {"", -1}}},
        {"leading run skipped", "Comma", 1, 1, ",,a,,b", {{"a", 5}, {"b", 6}, {"", -1}}},
        {"leading delimiters removed", "Comma", 0, 1, ",,a,,b", {{"a", 2}, {"", 3}, {"b", 4}, {"", -1}}},
        {"trailing delimiter", "Comma", 0, 0, "a,b,", {{"a", 2}, {"b", 4}, {"", 5}, {"", -1}}},
        {"trailing run, collapsing", "Comma", 1, 0, "a,,", {{"a", 3}, {"", 4}, {"", -1}}},
        {"empty line", "Comma", 0, 0, "", {{"", -1}}},
        {"only delimiters, removed", "Comma", 0, 1, ",,,", {{"", -1}}},
        {"quoted field", "Comma", 0, 0, "\"x\",y", {{"x", 4}, {"y", 5}, {"", -1}}},
        {"quoted last field", "Comma", 0, 0, "y,\"x\"", {{"y", 2}, {"x", 5}, {"", -1}}},
        {"doubled opening quotes", "Comma", 0, 0, "\"\"x\",y", {{"x", 5}, {"y", 6}, {"", -1}}},
        {"only quotes", "Comma", 0, 0, "\"\"\"", {{"", -1}}},
        {"quoted field keeps delimiter", "Tab", 0, 0, "\"a\tb\"\tc", {{"a\tb", 6}, {"c", 7}, {"", -1}}},
        {"quoted then run", "Comma", 1, 0, "\"x\",,,y", {{"x", 6}, {"y", 7}, {"", -1}}},
        {"tab", "Tab", 0, 0, "1\t2", {{"1", 2}, {"2", 3}, {"", -1}}},
        {"space", "Space", 1, 1, "  1   2 ", {{"1", 6}, {"2", 8}, {"", 9}, {"", -1}}},
    };
    for (const Case& c : cases) {
        ui::ScriptedUserInterface boxes;
        ui::ScopedUserInterface scope(boxes);
        EXPECT_EQ(Fields(Ascii(c.delimiter, c.consecutive, c.leading), c.line), c.calls) << c.label;
        EXPECT_TRUE(boxes.boxes.empty()) << c.label;
    }
}

TEST(NextField, LeadingDelimitersChangeTheCallersLine)
{
    CAsciiSpecification spec = Ascii("Comma", 0, 1);
    std::string line = ",,a,b";
    int pos = 0;
    EXPECT_EQ(spec.NextField(line, pos), "a");
    EXPECT_EQ(line, "a,b");

    spec = Ascii("Comma", 1, 0);
    line = ",,a";
    pos = 0;
    EXPECT_EQ(spec.NextField(line, pos), "");
    EXPECT_EQ(line, "a");
    EXPECT_EQ(pos, 0);
}

TEST(NextField, MalformedQuotedFieldsShowMessage2305)
{
    struct Case {
        const char* line;
        std::vector<Call> calls;
    } cases[] = {
        {"\"x\"y,z", {{"", 3}, {"y", 5}, {"z", 6}, {"", -1}}},
        {"\"x", {{"", 3}, {"", -1}}},
        {"a,\"b", {{"a", 2}, {"", 5}, {"", -1}}},
    };
    for (const Case& c : cases) {
        ui::ScriptedUserInterface boxes;
        ui::ScopedUserInterface scope(boxes);
        EXPECT_EQ(Fields(Ascii("Comma", 0, 0), c.line), c.calls) << c.line;
        ASSERT_EQ(boxes.boxes.size(), 1u) << c.line;
        EXPECT_EQ(boxes.boxes[0].text, "A quote ('\"') or delimiter is missing in the item description line.");
        EXPECT_EQ(boxes.boxes[0].text, res::LoadString(2305));
        EXPECT_EQ(boxes.boxes[0].caption, "");
        EXPECT_EQ(boxes.boxes[0].type, ui::MB_OK);
    }
}

TEST(NextField, RejectedQuotedFieldDoesNotSkipFollowingDelimiters)
{
    ui::ScriptedUserInterface boxes;
    ui::ScopedUserInterface scope(boxes);
    EXPECT_EQ(Fields(Ascii("Comma", 1, 0), "\"x\"y,,z"), (std::vector<Call> {{"", 3}, {"y", 6}, {"z", 7}, {"", -1}}));
    EXPECT_EQ(boxes.boxes.size(), 1u);
}

TEST(NextField, UserDefinedDelimiters)
{
    CAsciiSpecification spec = Ascii("User Defined", 0, 0);
    EXPECT_EQ(Fields(spec, "a\tb,c"), (std::vector<Call> {{"a", 2}, {"b,c", 5}, {"", -1}}));
    spec.m_strDefDelimiter = "|";
    EXPECT_EQ(Fields(spec, "a|b|"), (std::vector<Call> {{"a", 2}, {"b", 4}, {"", 5}, {"", -1}}));
    // A longer user delimiter separates only where the whole text stands.
    spec.m_strDefDelimiter = "::";
    EXPECT_EQ(Fields(spec, "a:b::c::::d::"),
              (std::vector<Call> {{"a:b", 5}, {"c", 8}, {"", 10}, {"d", 13}, {"", 14}, {"", -1}}));
    spec.m_bIgnoreConsecutiveDelimiters = 1;
    EXPECT_EQ(Fields(spec, "::::a::::b"), (std::vector<Call> {{"", 0}, {"a", 5}, {"b", 6}, {"", -1}}));
    spec.m_bIgnoreBegginingOfLineDelimiters = 1;
    ui::ScriptedUserInterface boxes;
    ui::ScopedUserInterface scope(boxes);
    // After the leading "::" a lone ":" remains, so the quote does not open the field.
    EXPECT_EQ(Fields(spec, ":::\"x\"::y"), (std::vector<Call> {{":\"x\"", 8}, {"y", 9}, {"", -1}}));
    EXPECT_TRUE(boxes.boxes.empty());
}

TEST(CountFormatColumns, AsciiSplitsTheFormatAtTheDelimiter)
{
    struct Case {
        const char* delimiter;
        int option;
        int byOption;
        int expected;
    } cases[] = {
        {"Space", 0, 1, 2}, {"Tab", 0, 1, 1},   {"Comma", 0, 1, 1}, {"Space", 1, 1, 1},
        {"Space", 2, 1, 1}, {"Space", 3, 1, 0}, {"Space", 3, 0, 2}, {"Space", -1, 1, 0},
    };
    for (const Case& c : cases) {
        CAsciiSpecification spec;
        spec.m_strDelimiter = c.delimiter;
        spec.m_TimeDesc.m_nDateTimeOption = c.option;
        EXPECT_EQ(spec.CountFormatColumns(c.byOption), c.expected) << c.delimiter << " option " << c.option;
    }
    CAsciiSpecification spec;
    spec.m_strDelimiter = "Semi Colon";
    spec.m_TimeDesc.m_nDateTimeOption = 2;
    spec.m_TimeDesc.m_strDateFormat = ";YYYY;;MM;DD;";
    EXPECT_EQ(spec.CountFormatColumns(1), 3);
    spec.m_TimeDesc.m_strDateFormat = ";;";
    EXPECT_EQ(spec.CountFormatColumns(1), 0);
    spec.m_strDelimiter = "User Defined";
    spec.m_strDefDelimiter = "- ";
    spec.m_TimeDesc.m_strDateFormat = "YYYY-MM- DD";
    EXPECT_EQ(spec.CountFormatColumns(1), 2);
}

TEST(CountFormatColumns, ExcelCountsCellsOnlyWhenTheFormatApplies)
{
    struct Case {
        int option;
        int useDT, useT, useD;
        int byOption;
        int expected;
    } cases[] = {
        {1, 0, 0, 0, 1, 1}, {1, 0, 1, 0, 1, 3}, {1, 0, 1, 0, 0, 1}, {0, 1, 0, 0, 1, 2},
        {0, 0, 1, 1, 1, 1}, {2, 0, 0, 5, 1, 2}, {2, 0, 0, 0, 1, 1}, {4, 1, 1, 1, 1, 1},
    };
    for (const Case& c : cases) {
        CExcelSpecification spec;
        spec.m_strDelimiter = "Space";
        spec.m_TimeDesc.m_nDateTimeOption = c.option;
        spec.m_TimeDesc.m_strDateTimeFormat = "YYYY/MM/DD|HH:mm:ss";
        spec.m_TimeDesc.m_strTimeFormat = "HH|mm|ss";
        spec.m_TimeDesc.m_strDateFormat = "|YYYY||MM/DD|";
        spec.m_TimeDesc.m_bUseDTFormat = c.useDT;
        spec.m_TimeDesc.m_bUseTFormat = c.useT;
        spec.m_TimeDesc.m_bUseDFormat = c.useD;
        EXPECT_EQ(spec.CountFormatColumns(c.byOption), c.expected) << "option " << c.option;
    }
}

TEST(TemplateModel, DateTimeColumnFollowsTheOption)
{
    CExcelSpecification spec;
    spec.m_TimeDesc.m_nDateTimeCol = 4;
    spec.m_TimeDesc.m_nTimeCol = 5;
    spec.m_TimeDesc.m_nDateCol = 6;
    const int expected[] = {4, 5, 6, -1};
    for (int option = 0; option <= 3; ++option) {
        spec.m_TimeDesc.m_nDateTimeOption = option;
        EXPECT_EQ(spec.GetDateTimeColumn(), expected[option]);
    }
}

TEST(TemplateModel, ValueTypeCodes)
{
    struct Case {
        const char* name;
        int result;
        int code;
    } cases[] = {
        {"accumulated", 1, 1},       {"Step_Accumulated", 1, 2},  {"MEAN_STEP_ACCUMULATED", 1, 3},
        {"Reverse_Mean_Step_Accumulated", 1, 4}, {"Instantaneous", 0, 77}, {"Accumulated ", 0, 77},
        {"", 0, 77},
    };
    for (const Case& c : cases) {
        int code = 77;
        EXPECT_EQ(CSpecification::GetValueTypeCode(c.name, code), c.result) << c.name;
        EXPECT_EQ(code, c.code) << c.name;
    }
}

TEST(TemplateModel, DateTimeFormatLetters)
{
    const char* good[] = {"YYYY/MM/DD HH:mm:ss", "yyyy-mm-ddThh.mm.ss", "DD|HH", "", "//  --", "s"};
    const char* bad[] = {"YYYY/MM/DD HH:mm:ss.fff", "hh:mm AM", "YYYY_MM", "tt", "YYYY,MM"};
    for (const char* format : good) {
        CString message = "untouched";
        EXPECT_EQ(CSpecification::IsValidDateTimeFormat(format, message), 1) << format;
        EXPECT_EQ(message, "untouched");
    }
    for (const char* format : bad) {
        CString message;
        EXPECT_EQ(CSpecification::IsValidDateTimeFormat(format, message), 0) << format;
        EXPECT_EQ(message, "Only the letters 'Y', 'y', 'M', 'm', 'D', 'd', 'H', 'h' are allowed when specifying "
                           "the date/time format.");
    }
}

TEST(TemplateModel, SelectedItemsText)
{
    CString text = "old";
    EXPECT_EQ(CSpecification::FormatSelItems({}, text), 0);
    EXPECT_EQ(text, "");
    EXPECT_EQ(CSpecification::FormatSelItems({1, 2, 3}, text), 1);
    EXPECT_EQ(text, "1,2,3");
    EXPECT_EQ(CSpecification::FormatSelItems({0}, text), 1);
    EXPECT_EQ(text, "0");

    struct Case {
        const char* text;
        CUIntArray items;
    } cases[] = {
        {" 3, 1,,2 ", {3, 1, 2}},
        {"", {}},
        {" \t ", {}},
        {",,,", {}},
        {"7x,abc,12", {7, 0, 12}},
        {"1 2,3", {12, 3}},
    };
    for (const Case& c : cases) {
        CUIntArray items = {99};
        CSpecification::ParseSelItems(c.text, items);
        EXPECT_EQ(items, c.items) << c.text;
    }
    // A negative number survives the text form both ways.
    CUIntArray items;
    CSpecification::ParseSelItems("-3", items);
    CSpecification::FormatSelItems(items, text);
    EXPECT_EQ(text, "-3");
}

TEST(TemplateModel, TemplateFileAndLoadedFlag)
{
    CAsciiSpecification spec;
    spec.SetTemplateFile("/t/A.xml");
    EXPECT_EQ(spec.m_strTemplateFile, "/t/A.xml");
    EXPECT_EQ(spec.m_bLoaded, 0);
    EXPECT_EQ(spec.CSpecification::Load("/t/a.XML"), 1); // same file without regard to case
    EXPECT_EQ(spec.m_bLoaded, 1);
    EXPECT_EQ(spec.m_strTemplateFile, "/t/A.xml");
    spec.SetTemplateFile("/T/A.XML");
    EXPECT_EQ(spec.m_bLoaded, 1);
    EXPECT_EQ(spec.CSpecification::Load("/t/b.xml"), 1);
    EXPECT_EQ(spec.m_bLoaded, 0);
    EXPECT_EQ(spec.m_strTemplateFile, "/t/b.xml");
    spec.CSpecification::Load("/t/b.xml");
    EXPECT_EQ(spec.m_bLoaded, 1);
    spec.SetTemplateFile("/t/c.xml");
    EXPECT_EQ(spec.m_bLoaded, 0);
}
