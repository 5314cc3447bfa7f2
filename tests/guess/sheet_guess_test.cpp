// The guess of a template for workbooks: sheets written by another library (libxlsxwriter) in the
// layouts an Excel template can describe, and the workbooks our own engine writes; each guess value
// by value and the series the engine's reader then makes of the sheet.
#include "guess/GuessReport.h"
#include "tests/guess/GuessTestSupport.h"
#include "tests/support/ScratchFolder.h"
#include "tests/support/XlsxWorkbook.h"

#include <functional>

namespace {

using namespace guesstest;

using testsupport::XlsxWorkbook;

// The path of a workbook `write` fills, in `folder`; rows and columns from 1.
std::string WrittenBook(const testsupport::ScratchFolder& folder, const std::string& name,
                        const std::function<void(XlsxWorkbook&)>& write)
{
    const std::string path = folder.File(name + ".xlsx");
    XlsxWorkbook book(path);
    write(book);
    EXPECT_TRUE(book.Close()) << path;
    return path;
}

struct SheetLayout {
    const char* name;
    std::function<void(XlsxWorkbook&)> write;
    std::map<std::string, std::string> values;
    std::vector<std::string> names;
    std::string firstItem;
    size_t rows;
    const char* first;
    std::vector<double> firstValues;
    const char* last;
    size_t missing = 0;
};

void PrintTo(const SheetLayout& layout, std::ostream* out) { *out << layout.name; }

const std::string kUndefined = "Undefined|Undefined|Instantaneous";

const std::vector<SheetLayout> kSheets = {
    {"date_cells",
     [](XlsxWorkbook& book) {
         const std::string stamp = "yyyy/mm/dd hh:mm:ss";
         book.Text(1, 1, "Time"), book.Text(1, 2, "Rain"), book.Text(1, 3, "Level");
         for (int h = 0; h < 6; ++h) {
             book.DateTime(2 + h, 1, {2020, 1, 31, h, 30, 0}, stamp);
             book.Number(2 + h, 2, h * 0.5), book.Number(2 + h, 3, 1 + h);
         }
     },
     {{"DateTimeOption", "0"}, {"DateTimeCol", "1"}, {"UseDTFormat", "0"}, {"StartRow", "2"}, {"ItemDescriptionRow", "1"},
      {"ItemTitleOption", "0"}, {"ExcelSheet", "1"}},
     {"Rain", "Level"}, kUndefined, 6, "2020/01/31 00:30:00", {0, 1}, "2020/01/31 05:30:00"},
    {"date_and_time_columns",
     [](XlsxWorkbook& book) {
         const std::string date = "yyyy/mm/dd";
         const std::string time = "hh:mm:ss";
         book.Text(1, 1, "Date"), book.Text(1, 2, "Time"), book.Text(1, 3, "Q");
         for (int h = 0; h < 5; ++h) {
             book.DateTime(2 + h, 1, {2021, 7, 14, 0, 0, 0}, date);
             book.DateTime(2 + h, 2, {0, 0, 0, h, 15, 0}, time);
             book.Number(2 + h, 3, 10 + h);
         }
     },
     {{"DateTimeCol", "1"}, {"UseDTFormat", "1"}, {"DateTimeFormat", "YYYY/MM/DD|HH:mm:ss"}, {"StartRow", "2"}},
     {"Q"}, kUndefined, 5, "2021/07/14 00:15:00", {10}, "2021/07/14 04:15:00"},
    {"text_dates_day_first",
     [](XlsxWorkbook& book) {
         book.Text(1, 1, "Zeit"), book.Text(1, 2, "Pegel");
         for (int d = 0; d < 5; ++d) {
             book.Text(2 + d, 1, std::to_string(20 + d) + ".01.2020 13:45");
             book.Number(2 + d, 2, d);
         }
     },
     {{"UseDTFormat", "1"}, {"DateTimeFormat", "DD.MM.YYYY HH:mm"}}, {"Pegel"}, kUndefined, 5, "2020/01/20 13:45:00", {0},
     "2020/01/24 13:45:00"},
    {"times_with_the_day_in_a_title",
     [](XlsxWorkbook& book) {
         const std::string time = "hh:mm";
         book.Text(1, 1, "Readings of 2020-05-01");
         book.Text(2, 1, "Time"), book.Text(2, 2, "Q");
         for (int h = 0; h < 5; ++h) {
             book.DateTime(3 + h, 1, {0, 0, 0, 6 + h, 0, 0}, time);
             book.Number(3 + h, 2, h + 0.5);
         }
     },
     {{"DateTimeOption", "1"}, {"TimeCol", "1"}, {"UseTFormat", "0"}, {"GlobalDate", "2020-05-01"}, {"StartRow", "3"},
      {"ItemDescriptionRow", "2"}},
     {"Q"}, kUndefined, 5, "2020/05/01 06:00:00", {0.5}, "2020/05/01 10:00:00"},
    {"data_on_the_second_sheet",
     [](XlsxWorkbook& book) {
         const std::string stamp = "yyyy-mm-dd hh:mm";
         book.Text(1, 1, "When", 2), book.Text(1, 2, "A", 2);
         for (int h = 0; h < 4; ++h) {
             book.DateTime(2 + h, 1, {2020, 2, 2, h, 0, 0}, stamp, 2);
             book.Number(2 + h, 2, h, "", 2);
         }
     },
     {{"ExcelSheet", "2"}, {"UseDTFormat", "0"}}, {"A"}, kUndefined, 4, "2020/02/02 00:00:00", {0}, "2020/02/02 03:00:00"},
    {"delete_values_and_a_text_column",
     [](XlsxWorkbook& book) {
         const std::string stamp = "yyyy/mm/dd hh:mm:ss";
         book.Text(1, 1, "Station"), book.Text(1, 2, "Time"), book.Text(1, 3, "Q"), book.Text(1, 4, "H");
         for (int h = 0; h < 6; ++h) {
             book.Text(2 + h, 1, "Oldbridge");
             book.DateTime(2 + h, 2, {2020, 3, 3, h, 0, 0}, stamp);
             book.Number(2 + h, 3, h % 3 == 1 ? -999 : h), book.Number(2 + h, 4, 2 * h);
         }
     },
     {{"DateTimeCol", "2"}, {"DeleteValueCheck", "1"}, {"DeleteValueRadio", "0"}, {"DeleteValue", "-999"},
      {"SelItems", "1,2"}},
     {"Q", "H"}, kUndefined, 6, "2020/03/03 00:00:00", {0, 0}, "2020/03/03 05:00:00", 2},
    {"type_unit_and_value_type_rows",
     [](XlsxWorkbook& book) {
         const std::string stamp = "yyyy/mm/dd hh:mm:ss";
         book.Text(1, 2, "Discharge"), book.Text(1, 3, "Water Level");
         book.Text(2, 2, "[m^3/s]"), book.Text(2, 3, "[m]");
         book.Text(3, 2, "Mean_Step_Accumulated"), book.Text(3, 3, "Instantaneous");
         book.Text(4, 1, "Time"), book.Text(4, 2, "Flow"), book.Text(4, 3, "Stage");
         for (int h = 0; h < 4; ++h) {
             book.DateTime(5 + h, 1, {2020, 4, 4, h, 0, 0}, stamp);
             book.Number(5 + h, 2, h), book.Number(5 + h, 3, h);
         }
     },
     {{"UnitTypeOption", "1"}, {"UnitTypeRow", "1"}, {"UnitOption", "1"}, {"UnitRow", "2"},
      {"ValueTypeOption", "1"}, {"ValueTypeRow", "3"}, {"ItemDescriptionRow", "4"}, {"StartRow", "5"}},
     {"Flow", "Stage"}, "Discharge|m^3/s|Mean_Step_Accumulated", 4, "2020/04/04 00:00:00", {0, 0}, "2020/04/04 03:00:00"},
};

class SheetLayouts : public ::testing::TestWithParam<SheetLayout> {};

TEST_P(SheetLayouts, GuessedValueByValueAndReadToTheExpectedSeries)
{
    const SheetLayout& layout = GetParam();
    const testsupport::ScratchFolder folder("velmora-guess");
    const std::string path = WrittenBook(folder, layout.name, layout.write);
    const guess::TemplateGuess guessed = guess::GuessTemplate(path, guess::InputKind::Excel);
    ASSERT_TRUE(guessed.spec) << guess::DescribeRefusal(guessed) << "\n" << guess::ExplainGuess(guessed);
    ExpectValues(layout.values, ValuesOf(*guessed.spec, true));
    ExpectSeries(ReadWith(path, *guessed.spec, true), layout);
}

INSTANTIATE_TEST_SUITE_P(Sheets, SheetLayouts, ::testing::ValuesIn(kSheets),
                         [](const auto& param) { return std::string(param.param.name); });

// The workbooks the engine writes (.xlsx and .xls) are guessed back to the layout it writes.
TEST(EngineWorkbooks, AreGuessedBackToTheEngineLayout)
{
    const testsupport::ScratchFolder folder("velmora-guess");
    for (const char* extension : {".xlsx", ".xls"}) {
        SCOPED_TRACE(extension);
        const std::string output = folder.File(std::string("engine") + extension);
        sys::Status loaded;
        std::unique_ptr<CSpecification> spec = converter::LoadTemplate(sys::FileFormat::Ascii, "", loaded);
        converter::FileJob job{sys::FileFormat::Ascii, kData + "tab_engine_layout.txt", spec.get(), {},
                               sys::FileFormat::Excel, output, "Gauge"};
        ASSERT_TRUE(converter::ConvertFile(job).converted);
        const guess::TemplateGuess guessed = guess::GuessTemplate(output, guess::InputKind::Excel);
        ASSERT_TRUE(guessed.spec) << guess::DescribeRefusal(guessed);
        ExpectValues({{"UseDTFormat", "0"}, {"DateTimeCol", "1"}, {"StartRow", "3"}, {"ItemDescriptionRow", "2"},
                      {"UnitTypeOption", "1"}, {"UnitTypeRow", "1"}, {"UnitOption", "1"}, {"UnitRow", "1"},
                      {"ValueTypeOption", "1"}, {"ValueTypeRow", "1"}},
                     ValuesOf(*guessed.spec, true));
        const ReadSeries series = ReadWith(output, *guessed.spec, true);
        EXPECT_EQ(series.problem, "");
        EXPECT_EQ(series.names, (std::vector<std::string>{"Rain", "Level"}));
        EXPECT_EQ(series.meta.front(), "Rainfall|mm|Accumulated");
        EXPECT_EQ(series.stamps.size(), 6u);
    }
}

TEST(SheetRefusals, SayWhy)
{
    const testsupport::ScratchFolder folder("velmora-guess");
    const std::string empty = WrittenBook(folder, "empty", [](XlsxWorkbook&) {});
    const guess::TemplateGuess none = guess::GuessTemplate(empty, guess::InputKind::Excel);
    ASSERT_TRUE(none.refusal);
    EXPECT_EQ(none.refusal->reason, "the workbook's sheets hold no cells");

    const std::string numbers = WrittenBook(folder, "numbers", [](XlsxWorkbook& book) {
        for (int r = 1; r <= 5; ++r)
            book.Number(r, 1, r), book.Number(r, 2, r * 2);
    });
    const guess::TemplateGuess undated = guess::GuessTemplate(numbers, guess::InputKind::Excel);
    ASSERT_TRUE(undated.refusal);
    EXPECT_NE(undated.refusal->reason.find("no column of the sheet holds dates or times"), std::string::npos)
        << undated.refusal->reason;

    const guess::TemplateGuess text = guess::GuessTemplate(kData + "comma_iso.csv", guess::InputKind::Excel);
    ASSERT_TRUE(text.refusal);
    EXPECT_NE(text.refusal->reason.find("not a workbook"), std::string::npos) << text.refusal->reason;
}

} // namespace
