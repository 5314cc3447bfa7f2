// Time stamps of data rows for every date/time option and flag, the date texts automation accepts,
// cell addresses and the version check.
#include "FakeSpreadsheet.h"
#include "parsers/ExcelFilePreviewParser.h"
#include "platform/system/FileSystem.h"
#include "templates/ExcelSpecification.h"
#include "tests/support/ScratchFolder.h"

#include <gtest/gtest.h>

#include <optional>

namespace {

// The cells A3 and B3 of a case.
struct Cells {
    Cells() = default;
    Cells(fake::Cell first) : a(std::move(first)) {}
    Cells(fake::Cell first, fake::Cell second) : a(std::move(first)), b(std::move(second)) {}
    std::optional<fake::Cell> a;
    std::optional<fake::Cell> b;
};

fake::Cell Num(double n, const char* shown) { return {fake::Number(n), shown}; }
fake::Cell Txt(const char* s) { return {fake::Text(s), s}; }

struct StampCase {
    const char* name;
    int option;
    int useDT, useT, useD;
    const char* format; // the format of the option in use
    const char* globalDate;
    const char* globalTime;
    Cells cells;
    int result;
    const char* stamp;
};

void PrintTo(const StampCase& c, std::ostream* out) { *out << c.name; }

class ExcelStampTest : public ::testing::TestWithParam<StampCase> {};

TEST_P(ExcelStampTest, StampOfRow)
{
    const StampCase& c = GetParam();
    const testsupport::ScratchFolder folder("velmora-stamp");
    const std::string path = folder.Write("stamp.xlsx", "x");
    auto app = std::make_shared<fake::Application>();
    fake::Sheet& sheet = *app->AddWorkbook(path).sheets[0];
    if (c.cells.a)
        sheet.cells[{3, 1}] = *c.cells.a;
    if (c.cells.b)
        sheet.cells[{3, 2}] = *c.cells.b;

    CExcelSpecification spec;
    CTimeDescription& td = spec.m_TimeDesc;
    td.m_nDateTimeOption = c.option;
    td.m_bUseDTFormat = c.useDT;
    td.m_bUseTFormat = c.useT;
    td.m_bUseDFormat = c.useD;
    td.m_strDateTimeFormat = td.m_strTimeFormat = td.m_strDateFormat = c.format;
    td.m_strGlobalDate = c.globalDate;
    td.m_strGlobalTime = c.globalTime;

    ui::ScriptedUserInterface silent;
    ui::ScopedUserInterface scope(silent);
    CExcelFilePreviewParser parser([&] { return app; });
    parser.m_pSpecification = &spec;
    CString message;
    ASSERT_EQ(parser.OpenWorkbook(path, message), 1);
    CString stamp = "untouched";
    EXPECT_EQ(parser.ReadRowDateTime(3, stamp), c.result);
    EXPECT_EQ(stamp, c.stamp);
    EXPECT_TRUE(silent.boxes.empty());
}

const Cells kNone {};

INSTANTIATE_TEST_SUITE_P(
    Options, ExcelStampTest,
    ::testing::Values(
        // Option 0: one value, or several cells read by the date/time format.
        StampCase {"SerialNumber", 0, 0, 0, 0, "", "", "", {Num(44333.5, "17/05/2021 12:00")}, 1, "2021/05/17 12:00:00"},
        StampCase {"DateText", 0, 0, 0, 0, "", "", "", {Txt("2021-05-17 10:00:00")}, 1, "2021/05/17 10:00:00"},
        StampCase {"UnreadableText", 0, 0, 0, 0, "", "", "", {Txt("soon")}, 0, "untouched"},
        StampCase {"EmptyCell", 0, 0, 0, 0, "", "", "", kNone, 0, "untouched"},
        StampCase {"OtherFlagReadsText", 0, 0, 1, 0, "", "", "", {Num(44333.0, "5/17/2021 10:00")}, 1,
                   "2021/05/17 10:00:00"},
        StampCase {"FormatOverTwoCells", 0, 1, 0, 0, "DD.MM.YYYY|HH:mm", "", "",
                   {Txt("17.05.2021"), Txt("06:30")}, 1, "2021/05/17 06:30:00"},
        StampCase {"FormatOfImpossibleDate", 0, 1, 0, 0, "YYYY/MM/DD", "", "", {Txt("2021/02/30")}, 1,
                   "Invalid DateTime"},
        StampCase {"FormatRefusesMonth13", 0, 1, 0, 0, "YYYY/MM/DD", "", "", {Txt("2021/13/01")}, 0, "untouched"},
        StampCase {"FormatOnEmptyCells", 0, 1, 0, 0, "YYYY/MM/DD|HH:mm", "", "", kNone, 0, "untouched"},
        // Option 1: one date for all rows.
        StampCase {"TimeFormat", 1, 0, 1, 0, "HH:mm:ss", "2021-05-17", "", {Txt("10:20:30")}, 1,
                   "2021/05/17 10:20:30"},
        StampCase {"TimeFormatUnreadableGlobalDate", 1, 0, 1, 0, "HH:mm:ss", "someday", "", {Txt("10:20:30")}, 1,
                   "Invalid DateTime"},
        StampCase {"TimeFormatGlobalDateWithTime", 1, 0, 1, 0, "HH:mm", "2021/05/17 23:00", "", {Txt("08:15")}, 1,
                   "2021/05/17 08:15:00"},
        StampCase {"TimeValue", 1, 0, 0, 0, "", "2021-05-17", "", {Num(0.75, "18:00")}, 1, "2021/05/17 18:00:00"},
        StampCase {"TimeValueTakesOnlyTheTime", 1, 0, 0, 0, "", "2021-05-17", "", {Num(40000.25, "x")}, 1,
                   "2021/05/17 06:00:00"},
        StampCase {"TimeValueUnreadableGlobalDate", 1, 0, 0, 0, "", "someday", "", {Num(0.75, "18:00")}, 0,
                   "untouched"},
        StampCase {"TimeValueUnconvertibleCell", 1, 0, 0, 0, "", "2021-05-17", "", {Txt("late")}, 1,
                   "Invalid DateTime"},
        StampCase {"TimeValueEmptyCell", 1, 0, 0, 0, "", "2021-05-17", "", kNone, 0, "untouched"},
        // Option 2: one time for all rows.
        StampCase {"DateFormat", 2, 0, 0, 1, "YYYY/MM/DD", "", "10:00:00", {Txt("2021/05/17")}, 1,
                   "2021/05/17 10:00:00"},
        StampCase {"DateFormatUnreadableGlobalTime", 2, 0, 0, 1, "YYYY/MM/DD", "", "noon", {Txt("2021/05/17")}, 1,
                   "Invalid DateTime"},
        StampCase {"DateValue", 2, 0, 0, 0, "", "", "23:59:59", {Num(44333.75, "17/05/2021")}, 1,
                   "2021/05/17 23:59:59"},
        StampCase {"DateValueFromText", 2, 0, 0, 0, "", "", "1:05 PM", {Txt("5/17/2021")}, 1, "2021/05/17 13:05:00"},
        StampCase {"DateValueUnreadableGlobalTime", 2, 0, 0, 0, "", "", "noon", {Num(44333.0, "x")}, 0, "untouched"},
        StampCase {"UnknownOption", 3, 0, 0, 0, "", "2021-05-17", "10:00:00", {Num(44333.0, "x")}, 0, "untouched"}),
    [](const auto& test) { return std::string(test.param.name); });

struct DateTextCase {
    const char* text;
    DateReading reading;
    const char* expected; // "%Y/%m/%d %H:%M:%S", or null when refused
};

TEST(ExcelDateText, ReadsCommonDateAndTimeTexts)
{
    const DateTextCase cases[] = {
        {"2021-05-17 10:00:00", DateReading::DateTime, "2021/05/17 10:00:00"},
        {"  2021/05/17  ", DateReading::DateTime, "2021/05/17 00:00:00"},
        {"2021.5.7", DateReading::DateTime, "2021/05/07 00:00:00"},
        {"2021-05-17T06:07:08", DateReading::DateTime, "2021/05/17 06:07:08"},
        {"5/17/2021 10:00", DateReading::DateTime, "2021/05/17 10:00:00"},
        {"17.05.2021", DateReading::DateTime, "2021/05/17 00:00:00"},
        {"17-05-21", DateReading::DateTime, "2021/05/17 00:00:00"},
        {"1/2/45", DateReading::DateTime, "1945/01/02 00:00:00"},
        {"10:20:30", DateReading::DateTime, "1899/12/30 10:20:30"},
        {"10:20:30.75", DateReading::DateTime, "1899/12/30 10:20:30"},
        {"12:00 AM", DateReading::DateTime, "1899/12/30 00:00:00"},
        {"12:30:00 pm", DateReading::DateTime, "1899/12/30 12:30:00"},
        {"2021-05-17 10:00:00", DateReading::DateOnly, "2021/05/17 00:00:00"},
        {"2021-05-17 10:00:00", DateReading::TimeOnly, "1899/12/30 10:00:00"},
        {"2021-05-17", DateReading::TimeOnly, "1899/12/30 00:00:00"},
        {"", DateReading::DateTime, nullptr},
        {"2021-02-30", DateReading::DateTime, nullptr},
        {"2021-13-01", DateReading::DateTime, nullptr},
        {"2021/05", DateReading::DateTime, nullptr},
        {"2021/05/17 25:00", DateReading::DateTime, nullptr},
        {"2021/05/17 10:60", DateReading::DateOnly, nullptr},
        {"10:5", DateReading::DateTime, nullptr},
        {"13:00 PM", DateReading::DateTime, nullptr},
        {"2021/05/17 PM", DateReading::DateTime, nullptr},
        {"2021-05-17 10:00 extra", DateReading::DateTime, nullptr},
        {"20210517", DateReading::DateTime, nullptr},
        {"May 17 2021", DateReading::DateTime, nullptr},
        {"-1/2/2021", DateReading::DateTime, nullptr},
        {"0099-01-01", DateReading::DateTime, nullptr},
    };
    for (const DateTextCase& c : cases) {
        COleDateTime value;
        const bool read = ReadDateText(c.text, c.reading, value);
        EXPECT_EQ(read, c.expected != nullptr) << '"' << c.text << '"';
        if (read && c.expected) {
            EXPECT_EQ(value.Format("%Y/%m/%d %H:%M:%S"), c.expected) << '"' << c.text << '"';
        }
    }
}

TEST(ExcelDateText, VariantsConvertByAutomationRules)
{
    COleDateTime date;
    EXPECT_TRUE(VariantToDate(fake::Number(44333.25), date));
    EXPECT_EQ(date.Format("%Y/%m/%d %H:%M:%S"), "2021/05/17 06:00:00");
    EXPECT_FALSE(VariantToDate(fake::Number(1e9), date)) << "beyond year 9999";
    EXPECT_TRUE(VariantToDate(fake::Text("2021/05/17"), date));
    EXPECT_FALSE(VariantToDate(sheet::Variant(), date));
    sheet::Variant error;
    error.type = sheet::Variant::Error;
    error.text = "#N/A";
    EXPECT_FALSE(VariantToDate(error, date));
    EXPECT_EQ(VariantText(error), "#N/A");
    EXPECT_EQ(VariantText(fake::Number(2.5)), "2.5");
    EXPECT_EQ(VariantText(sheet::Variant()), "");
}

TEST(ExcelCellAddress, LettersAndRow)
{
    const struct {
        int row, column;
        const char* address;
    } cases[] = {
        {1, 1, "A1"},       {5, 28, "AB5"},       {3, 26, "Z3"},        {1, 27, "AA1"},   {20, 52, "AZ20"},
        {20, 53, "BA20"},   {7, 702, "ZZ7"},      {7, 703, "AAA7"},     {1, 16384, "XFD1"}, {1, 16385, ""},
        {0, 1, ""},         {1, 0, ""},           {-3, 4, ""},          {1048576, 2, "B1048576"},
    };
    for (const auto& c : cases)
        EXPECT_EQ(CExcelFilePreviewParser::CellAddress(c.row, c.column), c.address) << c.row << "," << c.column;
}

TEST(ExcelVersion, MajorNumberOrTen)
{
    auto app = std::make_shared<fake::Application>();
    auto factory = [&] { return std::static_pointer_cast<sheet::Application>(app); };
    EXPECT_EQ(GetExcelVersion(factory), 16);
    EXPECT_EQ(app->log, (std::vector<std::string> {"Quit"}));
    app->version = "11.0.5";
    EXPECT_EQ(GetExcelVersion(factory), 11);
    app->versionFails = true;
    EXPECT_EQ(GetExcelVersion(factory), 10);
    EXPECT_EQ(app->log.back(), "Quit") << "ended even when the version cannot be read";

    EXPECT_EQ(GetExcelVersion([] { return std::shared_ptr<sheet::Application>(); }), 10);
    EXPECT_EQ(GetExcelVersion([]() -> std::shared_ptr<sheet::Application> { throw sheet::AutomationError("no"); }),
              10);
}

} // namespace
