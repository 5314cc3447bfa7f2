// The guess of a template for each text layout a template can describe (tests/data/guess), value by
// value, and what the engine's reader then makes of the file with it; the refusals of files that
// are no time series.
#include "guess/GuessReport.h"
#include "tests/guess/GuessTestSupport.h"

#include <limits>

namespace {

using namespace guesstest;
constexpr double kNone = std::numeric_limits<double>::quiet_NaN();

struct Layout {
    const char* file;
    std::map<std::string, std::string> values; // template keys; "Item1" ... for the definitions
    std::vector<std::string> names;            // the items read (those selected)
    std::string firstItem;                     // "type|unit|value type" of the first item read
    size_t rows;
    const char* first;
    std::vector<double> firstValues;
    const char* last;
    size_t missing = 0;
};

// Values every plain layout has: a date/time in the first field, names in the row above the data,
// one item type, unit and value type for all.
std::map<std::string, std::string> Plain(std::map<std::string, std::string> values)
{
    const std::map<std::string, std::string> common = {
        {"DateTimeOption", "0"}, {"DateTimeCol", "1"}, {"ItemTitleOption", "0"}, {"ItemDescriptionRow", "1"},
        {"StartRow", "2"}, {"UnitTypeOption", "0"}, {"UnitOption", "0"}, {"ValueTypeOption", "0"},
        {"DeleteValueCheck", "0"}, {"IgnoreConsecutiveDelimiters", "0"}, {"IgnoreBegginingOfLineDelimiters", "0"},
        {"DecimalSeparator", "Dot"}, {"SelItems", ""}};
    for (const auto& [key, value] : common)
        values.emplace(key, value);
    return values;
}

const std::string kUndefined = "Undefined|Undefined|Instantaneous";

const std::vector<Layout> kLayouts = {
    {"tab_engine_layout.txt",
     Plain({{"Delimiter", "Tab"}, {"DateTimeFormat", "YYYY/MM/DD HH:mm:ss"}, {"StartRow", "3"}, {"ItemDescriptionRow", "2"},
            {"UnitTypeOption", "1"}, {"UnitTypeRow", "1"}, {"UnitOption", "1"}, {"UnitRow", "1"},
            {"ValueTypeOption", "1"}, {"ValueTypeRow", "1"}}),
     {"Rain", "Level"}, "Rainfall|mm|Accumulated", 6, "2020/01/01 00:00:00", {0, 1.25}, "2020/01/01 05:00:00"},
    {"comma_iso.csv", Plain({{"Delimiter", "Comma"}, {"DateTimeFormat", "YYYY-MM-DD HH:mm"}}), {"Rain", "Level"},
     kUndefined, 7, "2020/01/01 00:00:00", {0.1, 1.1}, "2020/01/07 00:00:00"},
    {"semicolon_decimal_comma.csv",
     Plain({{"Delimiter", "Semi Colon"}, {"DecimalSeparator", "Comma"}, {"DateTimeFormat", "DD.MM.YYYY HH:mm"}}),
     {"Niederschlag", "Pegel"}, kUndefined, 6, "2020/02/10 06:00:00", {10.5, 1.1}, "2020/02/15 06:00:00"},
    {"space_split.txt", Plain({{"Delimiter", "Space"}, {"DateTimeFormat", "YYYY/MM/DD HH:mm:ss"}}), {"north", "south"},
     kUndefined, 5, "2020/01/31 00:00:00", {0.5, 0.25}, "2020/01/31 04:00:00"},
    {"space_aligned.txt",
     Plain({{"Delimiter", "Space"}, {"IgnoreConsecutiveDelimiters", "1"}, {"IgnoreBegginingOfLineDelimiters", "1"},
            {"DateTimeFormat", "YYYY-MM-DD HH:mm"}}),
     {"flow", "stage"}, kUndefined, 6, "2020/03/01 12:00:00", {1.5, 10}, "2020/03/06 12:00:00"},
    {"pipe.txt", Plain({{"Delimiter", "User Defined"}, {"DefDelimiter", "|"}, {"DateTimeFormat", "YYYY-MM-DDTHH:mm:ss"}}),
     {"flow", "level"}, kUndefined, 6, "2020/01/01 00:30:00", {0.5, 2}, "2020/01/01 05:30:00"},
    {"double_colon.txt", Plain({{"Delimiter", "User Defined"}, {"DefDelimiter", "::"}, {"DateTimeFormat", "YYYY/MM/DD HH:mm"}}),
     {"A", "B"}, kUndefined, 5, "2020/01/01 00:00:00", {0, 0}, "2020/01/01 04:00:00"},
    {"tab_date_time_split.txt", Plain({{"Delimiter", "Tab"}, {"DateTimeFormat", "YYYY-MM-DD\\tHH:mm"}}), {"Q"}, kUndefined,
     6, "2020/01/01 00:00:00", {0.5}, "2020/01/01 05:00:00"},
    {"comma_date_time_split.csv", Plain({{"Delimiter", "Comma"}, {"DateTimeFormat", "DD/MM/YYYY,HH:mm"}}), {"Q"},
     kUndefined, 6, "2020/01/20 13:45:00", {20.5}, "2020/01/25 13:45:00"},
    {"month_first.csv", Plain({{"Delimiter", "Comma"}, {"DateTimeFormat", "MM/DD/YYYY HH:mm"}}), {"Value"}, kUndefined, 6,
     "2020/01/20 13:00:00", {20}, "2020/01/25 13:00:00"},
    {"month_first_by_steps.csv", Plain({{"Delimiter", "Comma"}, {"DateTimeFormat", "MM/DD/YYYY"}}), {"Value"}, kUndefined,
     12, "2020/01/01 00:00:00", {1}, "2020/01/12 00:00:00"},
    {"day_first_by_steps.csv", Plain({{"Delimiter", "Comma"}, {"DateTimeFormat", "DD/MM/YYYY"}}), {"Value"}, kUndefined, 12,
     "2020/01/01 00:00:00", {1}, "2020/01/12 00:00:00"},
    {"time_only_header_date.txt",
     Plain({{"Delimiter", "Tab"}, {"DateTimeOption", "1"}, {"TimeCol", "1"}, {"TimeFormat", "HH:mm"},
            {"GlobalDate", "2020-05-01"}, {"StartRow", "3"}, {"ItemDescriptionRow", "2"}}),
     {"Q"}, kUndefined, 6, "2020/05/01 06:00:00", {6.5}, "2020/05/01 11:00:00"},
    {"gauge_2021-03-04.txt",
     Plain({{"Delimiter", "Semi Colon"}, {"DateTimeOption", "1"}, {"TimeFormat", "HH:mm:ss"}, {"GlobalDate", "2021-03-04"}}),
     {"Q"}, kUndefined, 8, "2021/03/04 00:15:00", {0}, "2021/03/04 07:15:00"},
    {"date_only.csv", Plain({{"Delimiter", "Comma"}, {"DateTimeFormat", "YYYY-MM-DD"}}), {"Q"}, kUndefined, 7,
     "2020/01/01 00:00:00", {5}, "2020/01/07 00:00:00"},
    {"date_only_header_time.txt",
     Plain({{"Delimiter", "Semi Colon"}, {"DateTimeOption", "2"}, {"DateCol", "1"}, {"DateFormat", "YYYY-MM-DD"},
            {"GlobalTime", "08:00:00"}, {"StartRow", "3"}, {"ItemDescriptionRow", "2"}}),
     {"Q"}, kUndefined, 6, "2020/01/01 08:00:00", {1}, "2020/01/06 08:00:00"},
    {"stamp_second.csv", Plain({{"Delimiter", "Comma"}, {"DateTimeCol", "2"}, {"SelItems", "1"}}), {"Q"}, kUndefined, 6,
     "2020/01/01 00:00:00", {0.5}, "2020/01/01 05:00:00"},
    {"units_under_names.csv",
     Plain({{"Delimiter", "Comma"}, {"StartRow", "3"}, {"UnitOption", "2"}, {"Item1", "Rain|Undefined|mm|Instantaneous"},
            {"Item2", "Level|Undefined|m|Instantaneous"}}),
     {"Rain", "Level"}, "Undefined|mm|Instantaneous", 6, "2020/01/01 00:00:00", {0, 0}, "2020/01/01 05:00:00"},
    {"units_items_only.txt",
     Plain({{"Delimiter", "Tab"}, {"StartRow", "3"}, {"ItemDescriptionRow", "2"}, {"UnitOption", "1"}, {"UnitRow", "1"}}),
     {"Rain", "Level"}, "Undefined|mm|Instantaneous", 5, "2020/06/01 00:00:00", {0, 1}, "2020/06/01 04:00:00"},
    {"header_order_vt_units_types.txt",
     Plain({{"Delimiter", "Tab"}, {"StartRow", "5"}, {"ItemDescriptionRow", "4"}, {"UnitTypeOption", "1"},
            {"UnitTypeRow", "3"}, {"UnitOption", "1"}, {"UnitRow", "2"}, {"ValueTypeOption", "1"}, {"ValueTypeRow", "1"}}),
     {"Rain", "Level"}, "Rainfall|mm|Accumulated", 5, "2020/06/01 00:00:00", {0, 1}, "2020/06/01 04:00:00"},
    {"header_order_names_first.txt",
     Plain({{"Delimiter", "Tab"}, {"StartRow", "5"}, {"ItemDescriptionRow", "1"}, {"UnitTypeOption", "1"},
            {"UnitTypeRow", "2"}, {"UnitOption", "1"}, {"UnitRow", "3"}, {"ValueTypeOption", "1"}, {"ValueTypeRow", "4"}}),
     {"Rain", "Level"}, "Rainfall|mm|Step_Accumulated", 5, "2020/06/01 00:00:00", {0, 1}, "2020/06/01 04:00:00"},
    {"no_header.csv",
     Plain({{"Delimiter", "Comma"}, {"StartRow", "1"}, {"ItemTitleOption", "1"}, {"ItemDescriptionRow", "2"},
            {"Item1", "Item1|" + kUndefined}}),
     {"Item1", "Item2"}, kUndefined, 6, "2020/01/01 00:00:00", {0, 0}, "2020/01/01 05:00:00"},
    {"names_items_only.csv",
     Plain({{"Delimiter", "Comma"}, {"ItemTitleOption", "1"}, {"ItemDescriptionRow", "2"}, {"Item1", "Rain|" + kUndefined},
            {"Item2", "Level|" + kUndefined}}),
     {"Rain", "Level"}, kUndefined, 6, "2020/01/01 00:00:00", {0, 0}, "2020/01/01 05:00:00"},
    {"delete_999.txt",
     Plain({{"Delimiter", "Tab"}, {"DeleteValueCheck", "1"}, {"DeleteValueRadio", "0"}, {"DeleteValue", "-999"}}),
     {"A", "B"}, kUndefined, 6, "2020/01/01 00:00:00", {0, 0}, "2020/01/01 05:00:00", 3},
    {"delete_tiny.csv",
     Plain({{"Delimiter", "Comma"}, {"DeleteValueCheck", "1"}, {"DeleteValueRadio", "0"}, {"DeleteValue", "-1e-35"}}),
     {"A"}, kUndefined, 6, "2020/01/01 00:00:00", {0}, "2020/01/01 05:00:00", 3},
    {"delete_na.csv", Plain({{"Delimiter", "Comma"}, {"DeleteValueCheck", "1"}, {"DeleteValue", "NA"}}), {"A", "B"},
     kUndefined, 6, "2020/01/01 00:00:00", {kNone, 0}, "2020/01/01 05:00:00", 2},
    {"bom_utf8.csv", Plain({{"Delimiter", "Semi Colon"}}), {"Wasserstand"}, kUndefined, 5, "2020/01/01 00:00:00", {0},
     "2020/01/01 04:00:00"},
    {"utf16.txt", Plain({{"Delimiter", "Tab"}, {"DateTimeFormat", "YYYY/MM/DD HH:mm:ss"}}), {"Level"}, kUndefined, 5,
     "2020/01/01 00:00:00", {0.5}, "2020/01/01 04:00:00"},
    {"crlf.csv", Plain({{"Delimiter", "Comma"}}), {"Q"}, kUndefined, 5, "2020/01/01 00:00:00", {0}, "2020/01/01 04:00:00"},
    {"titles_and_comments.txt", Plain({{"Delimiter", "Semi Colon"}, {"StartRow", "5"}, {"ItemDescriptionRow", "4"}}),
     {"A"}, kUndefined, 5, "2020/02/01 00:00:00", {0}, "2020/02/01 04:00:00"},
    {"quoted.csv", Plain({{"Delimiter", "Comma"}}), {"Rain"}, kUndefined, 5, "2020/01/01 00:00:00", {0.5},
     "2020/01/01 04:00:00"},
    {"iso_fraction.txt", Plain({{"Delimiter", "Tab"}, {"DateTimeFormat", "YYYY-MM-DDTHH:mm:ss"}}), {"Q"}, kUndefined, 5,
     "2020/01/01 00:00:00", {0}, "2020/01/01 04:00:00"},
    {"tab_decimal_comma.txt", Plain({{"Delimiter", "Tab"}, {"DecimalSeparator", "Comma"}}), {"Q"}, kUndefined, 5,
     "2020/01/01 00:00:00", {0.25}, "2020/01/01 04:00:00"},
    {"names_with_units.csv",
     Plain({{"Delimiter", "Comma"}, {"UnitOption", "2"}, {"Item1", "Rain [mm]|Undefined|mm|Instantaneous"}}),
     {"Rain [mm]", "Level [m]"}, "Undefined|mm|Instantaneous", 5, "2020/01/01 00:00:00", {0, 0}, "2020/01/01 04:00:00"},
    {"combined_row.csv",
     Plain({{"Delimiter", "Semi Colon"}, {"StartRow", "3"}, {"ItemDescriptionRow", "2"}, {"UnitTypeOption", "1"},
            {"UnitOption", "1"}, {"ValueTypeOption", "1"}, {"UnitTypeRow", "1"}, {"UnitRow", "1"}, {"ValueTypeRow", "1"}}),
     {"Rain", "Flow"}, "Rainfall|mm|Accumulated", 5, "2020/01/01 00:00:00", {0, 0.5}, "2020/01/01 04:00:00"},
};

void PrintTo(const Layout& layout, std::ostream* out) { *out << layout.file; }

class TextLayouts : public ::testing::TestWithParam<Layout> {};

TEST_P(TextLayouts, GuessedValueByValueAndReadToTheExpectedSeries)
{
    const Layout& layout = GetParam();
    const std::string path = kData + layout.file;
    const guess::TemplateGuess guessed = guess::GuessTemplate(path, guess::InputKind::Ascii);
    ASSERT_TRUE(guessed.spec) << guess::DescribeRefusal(guessed);
    ExpectValues(layout.values, ValuesOf(*guessed.spec, false));

    ExpectSeries(ReadWith(path, *guessed.spec, false), layout);
}

INSTANTIATE_TEST_SUITE_P(Files, TextLayouts, ::testing::ValuesIn(kLayouts), [](const auto& param) {
    std::string name = param.param.file;
    for (char& c : name)
        if (!std::isalnum(static_cast<unsigned char>(c)))
            c = '_';
    return name;
});

TEST(TextLayouts, CoverAtLeastThirtyFiles) { EXPECT_GE(kLayouts.size(), 30u); }

struct Refused {
    const char* file;
    long line;
    const char* reason; // a part of the reason
};

const std::vector<Refused> kRefused = {
    {"refuse_prose.txt", 2, "no delimiter splits the line into two fields or more"},
    {"refuse_numbers_only.csv", 2, "no field of the data lines holds dates or times that a template reads: '0,0,0'"},
    {"refuse_two_digit_year.csv", 2, "the date '01/01/20' has a two-digit year"},
    {"refuse_am_pm.csv", 2, "the date/time '1/2/2020 1:30 PM' counts hours with AM/PM"},
    {"refuse_compact.csv", 2, "the date/time '20200101' has no separators between its numbers"},
    {"refuse_empty.txt", 0, "the file is empty"},
    {"refuse_binary.txt", 2, "the line holds a zero byte: this is no text file"},
    {"refuse_text_values.csv", 2, "no value column of the data rows holds numbers"},
    {"no_such_file.csv", 0, "no_such_file.csv"},
};

TEST(TextRefusals, SayWhyAndWhichLine)
{
    for (const Refused& refused : kRefused) {
        SCOPED_TRACE(refused.file);
        const guess::TemplateGuess guessed = guess::GuessTemplate(kData + refused.file, guess::InputKind::Ascii);
        EXPECT_FALSE(guessed.spec);
        ASSERT_TRUE(guessed.refusal);
        EXPECT_EQ(guessed.refusal->line, refused.line);
        EXPECT_NE(guessed.refusal->reason.find(refused.reason), std::string::npos) << guessed.refusal->reason;
        EXPECT_NE(guess::DescribeRefusal(guessed).find("cannot be read as a time series"), std::string::npos);
    }
}

TEST(TextGuessExplanation, NamesTheEvidenceAndTheAmbiguities)
{
    const guess::TemplateGuess byDay = guess::GuessTemplate(kData + "day_first_by_steps.csv", guess::InputKind::Ascii);
    const std::string told = guess::ExplainGuess(byDay);
    EXPECT_NE(told.find("Read the first 13 lines"), std::string::npos) << told;
    EXPECT_NE(told.find("DateTimeFormat = DD/MM/YYYY\n"), std::string::npos) << told;
    EXPECT_NE(told.find("ambiguous: day-first or month-first: no day above 12 tells; day-first gives the stamps that rise "
                        "in even steps"),
              std::string::npos)
        << told;

    const guess::TemplateGuess decided = guess::GuessTemplate(kData + "month_first.csv", guess::InputKind::Ascii);
    EXPECT_NE(guess::ExplainGuess(decided).find("month-first, since a second number is above 12"), std::string::npos);

    const guess::TemplateGuess comma = guess::GuessTemplate(kData + "semicolon_decimal_comma.csv", guess::InputKind::Ascii);
    const std::string commaTold = guess::ExplainGuess(comma);
    EXPECT_NE(commaTold.find("DecimalSeparator = Comma\n  because: 12 values such as '10,5' have a comma between their "
                             "digits\n  ambiguous: a comma could also separate fields"),
              std::string::npos)
        << commaTold;
}

TEST(TextGuessJson, HoldsTheTemplateTheFindingsAndTheRefusal)
{
    const std::string ok = guess::GuessJson(guess::GuessTemplate(kData + "comma_iso.csv", guess::InputKind::Ascii));
    EXPECT_EQ(ok.rfind("{\"ok\":true,", 0), 0u) << ok;
    EXPECT_NE(ok.find("\"template\":{\"kind\":\"ascii\",\"values\":{"), std::string::npos) << ok;
    EXPECT_NE(ok.find("{\"key\":\"Delimiter\",\"value\":\"Comma\",\"evidence\":"), std::string::npos) << ok;

    const std::string refused =
        guess::GuessJson(guess::GuessTemplate(kData + "refuse_prose.txt", guess::InputKind::Ascii));
    EXPECT_EQ(refused.rfind("{\"ok\":false,", 0), 0u) << refused;
    EXPECT_NE(refused.find("\"refusal\":{\"line\":2,\"reason\":\"no delimiter"), std::string::npos) << refused;
    EXPECT_EQ(refused.find("\"template\""), std::string::npos);
}

// The examples shipped with the project were described by hand; the guess reads them to the same
// series.
TEST(TextGuessOfTheExamples, ReadsAsTheirOwnTemplatesDo)
{
    for (const char* name : {"river_gauge", "rain_gauge"}) {
        SCOPED_TRACE(name);
        const std::string data = std::string(VELMORA_SOURCE_DIR) + "/examples/data/" + name + ".txt";
        const guess::TemplateGuess guessed = guess::GuessTemplate(data, guess::InputKind::Ascii);
        ASSERT_TRUE(guessed.spec) << guess::DescribeRefusal(guessed);
        sys::Status loaded;
        std::unique_ptr<CSpecification> own = converter::LoadTemplate(
            sys::FileFormat::Ascii, std::string(VELMORA_SOURCE_DIR) + "/examples/templates/" + name + ".xml", loaded);
        ASSERT_TRUE(own);
        own->m_arrSelItems.clear(); // the example's own selection reorders the items
        const ReadSeries fromGuess = ReadWith(data, *guessed.spec, false), fromOwn = ReadWith(data, *own, false);
        EXPECT_EQ(fromGuess.problem, "");
        EXPECT_EQ(fromGuess.stamps, fromOwn.stamps);
        ASSERT_EQ(fromGuess.values.size(), fromOwn.values.size());
        for (size_t i = 0; i < fromOwn.values.size(); ++i)
            ExpectRow(fromGuess.values[i], fromOwn.values[i]);
    }
}

} // namespace
