// The displayed text of values under number format codes; expected texts computed by hand.
#include "formats/workbook/NumberFormat.h"

#include <gtest/gtest.h>

using sheet::FormatGeneral;
using sheet::NumberFormat;
using sheet::Variant;

namespace {

struct Case {
    const char* code;
    double value;
    const char* text;
};

void ExpectRendered(const std::vector<Case>& cases)
{
    for (const Case& c : cases)
        EXPECT_EQ(NumberFormat(c.code).RenderNumber(c.value), c.text) << "code " << c.code << ", value " << c.value;
}

Variant Make(Variant::Type type, double number, const std::string& text = std::string())
{
    Variant v;
    v.type = type;
    v.number = number;
    v.text = text;
    return v;
}

} // namespace

TEST(GeneralFormat, ShowsAtMostElevenCharacters)
{
    struct { double value; const char* text; } cases[] = {
        {0, "0"},
        {1, "1"},
        {-42, "-42"},
        {3.5, "3.5"},
        {0.1 + 0.2, "0.3"},
        {1.0 / 3, "0.333333333"},
        {2.0 / 3, "0.666666667"},
        {-2.0 / 3, "-0.666666667"},
        {123456.789012345, "123456.789"},
        {99999999999, "99999999999"},
        {123456789012, "1.23457E+11"},
        {1e15, "1E+15"},
        {0.0001, "0.0001"},
        {0.000123456789, "0.000123457"},
        {0.00001, "1E-05"},
        {0.0000123456, "1.23456E-05"},
        {-1.5e-10, "-1.5E-10"},
        {1.23456789e100, "1.2346E+100"},
        {44333, "44333"},
        {99999999999.6, "1E+11"},
    };
    for (const auto& c : cases)
        EXPECT_EQ(FormatGeneral(c.value), c.text) << c.value;
}

TEST(NumberFormatCodes, FixedDecimalsRoundHalfUpOnDecimalDigits)
{
    ExpectRendered({
        {"0", 2.5, "3"},
        {"0", -2.5, "-3"},
        {"0", 0.4, "0"},
        {"0.00", 4.5, "4.50"},
        {"0.00", 2.675, "2.68"},
        {"0.00", 1.005, "1.01"},
        {"0.00", -0.001, "0.00"},
        {"0.000", 1234.56789, "1234.568"},
        {"0.0", 9.96, "10.0"},
        {"00000", 42, "00042"},
        {"#.##", 0.5, ".5"},
        {"#.##", 5, "5."},
        {"0.0#", 1.5, "1.5"},
        {"0.0#", 1.25, "1.25"},
        {"0.0#", 1.255, "1.26"},
        {"#", 0, ""},
        {"?.??", 1.5, "1.5 "},
    });
}

TEST(NumberFormatCodes, ThousandsSeparatorsAndScaling)
{
    ExpectRendered({
        {"#,##0", 1234567, "1,234,567"},
        {"#,##0", 999, "999"},
        {"#,##0", 1000, "1,000"},
        {"#,##0", 0, "0"},
        {"#,##0", -1234.5, "-1,235"},
        {"#,##0.00", 1234.5, "1,234.50"},
        {"#,##0.00", 0.5, "0.50"},
        {"0,000", 5, "0,005"},
        {"#,##0,", 1234567, "1,235"},
        {"0.0,,", 1234567, "1.2"},
    });
}

TEST(NumberFormatCodes, PercentAndScientific)
{
    ExpectRendered({
        {"0%", 0.25, "25%"},
        {"0%", 0.256, "26%"},
        {"0.00%", 0.12345, "12.35%"},
        {"0.00%", -0.5, "-50.00%"},
        {"0.00E+00", 12345, "1.23E+04"},
        {"0.00E+00", 0.000123, "1.23E-04"},
        {"0.00E+00", 0, "0.00E+00"},
        {"0.00E+00", 9.999, "1.00E+01"},
        {"0.00E-00", 12345, "1.23E04"},
        {"0.0E+0", 1234567890, "1.2E+9"},
        {"##0.0E+0", 12345, "12.3E+3"},
        {"##0.0E+0", 1234567, "1.2E+6"},
        {"00.0E+0", 12345, "12.3E+3"},
    });
}

TEST(NumberFormatCodes, SectionsLiteralsAndConditions)
{
    ExpectRendered({
        {"0.00;(0.00)", -3.5, "(3.50)"},
        {"0.00;(0.00)", 3.5, "3.50"},
        {"0.00;(0.00)", 0, "0.00"},
        {"0;-0;\"zero\"", 0, "zero"},
        {"0;-0;\"zero\"", -7, "-7"},
        {"0;;", -7, ""},
        {"#,##0 ;(#,##0)", 1234, "1,234 "},
        {"\"$\"#,##0.00", 1234.5, "$1,234.50"},
        {"[$\xE2\x82\xAC-407] #,##0.00", 2.5, "\xE2\x82\xAC 2.50"},
        {"[Red]0.0;[Blue]-0.0", -1.25, "-1.3"},
        {"0\" kg\"", 12, "12 kg"},
        {"0\\ \\m", 12, "12 m"},
        {"_(0_)", 3, " 3 "},
        {"000-0000", 5551234, "555-1234"},
        {"[>=100]\"big\";[<0]\"neg\";0", 150, "big"},
        {"[>=100]\"big\";[<0]\"neg\";0", -5, "neg"},
        {"[>=100]\"big\";[<0]\"neg\";0", 50, "50"},
        {"General", 1.5, "1.5"},
        {"General\" m\"", 1.5, "1.5 m"},
        {"@", 12.5, "12.5"},
    });
}

TEST(NumberFormatCodes, Fractions)
{
    ExpectRendered({
        {"# ?/?", 1.25, "1 1/4"},
        {"# ?/?", 0.5, " 1/2"}, // the blank before the fraction is a literal of the code
        {"# ?/?", 3, "3    "},
        {"# ?\?/?\?", 3.14159, "3 14/99"},
        {"?/8", 0.375, "3/8"},
        {"# ?/?", 1e300, "1E+300"}, // too large for a fraction: General
        {"?/99999999999", 0.5, "50000/99999"},
    });
}

TEST(NumberFormatCodes, DatesAndTimes)
{
    const double may17 = 44333;            // 2021-05-17, a Monday
    const double may17noon = 44333.5;      // 12:00:00
    const double stamp = 44333 + (13 * 3600 + 5 * 60 + 9) / 86400.0;
    ExpectRendered({
        {"yyyy/mm/dd", may17, "2021/05/17"},
        {"m/d/yyyy", may17, "5/17/2021"},
        {"d-mmm-yy", may17, "17-May-21"},
        {"dddd, mmmm d", may17, "Monday, May 17"},
        {"ddd mmmmm", may17, "Mon M"},
        {"yyyy/mm/dd hh:mm:ss", stamp, "2021/05/17 13:05:09"},
        {"h:mm AM/PM", stamp, "1:05 PM"},
        {"h:mm am/pm", may17, "12:00 am"},
        {"hh:mm A/P", may17noon, "12:00 P"},
        {"h:mm:ss", 0.999999, "0:00:00"},
        {"m", may17, "5"},
        {"h:m", stamp, "13:5"},
        {"mm:ss", stamp, "05:09"},
        {"[h]:mm:ss", 1.5, "36:00:00"},
        {"[mm]:ss", 0.5 / 24, "30:00"},
        {"hh:mm:ss.00", 0.5 + 0.25 / 86400, "12:00:00.25"},
        {"mmss.0", stamp, "0509.0"},
        {"yyyy-mm-dd", 1, "1900-01-01"},
        {"yyyy-mm-dd", 59, "1900-02-28"},
        {"yyyy-mm-dd", 60, "1900-02-29"},
        {"yyyy-mm-dd", 61, "1900-03-01"},
        {"yyyy-mm-dd", -1, "########"},
        {"\"on\" yyyy", may17, "on 2021"},
    });
}

TEST(NumberFormatCodes, BuiltinIdsCarryTheirCodes)
{
    struct { int id; double value; const char* text; } cases[] = {
        {0, 1.5, "1.5"},       {1, 2.5, "3"},          {2, 2.5, "2.50"},         {3, 1234.5, "1,235"},
        {4, 1234.5, "1,234.50"}, {9, 0.5, "50%"},     {10, 0.5, "50.00%"},      {11, 1234, "1.23E+03"},
        {12, 0.5, " 1/2"},      {14, 44333, "5/17/2021"}, {15, 44333, "17-May-21"}, {16, 44333, "17-May"},
        {17, 44333, "May-21"}, {18, 0.75, "6:00 PM"},  {19, 0.75, "6:00:00 PM"}, {20, 0.75, "18:00"},
        {21, 0.75, "18:00:00"}, {22, 44333.75, "5/17/2021 18:00"}, {37, -1234, "(1,234)"},
        {39, -1234, "(1,234.00)"}, {45, 0.75, "00:00"}, {46, 1.25, "30:00:00"}, {47, 0, "0000.0"},
        {48, 1234, "1.2E+3"},  {49, 12, "12"},         {100, 1.5, "1.5"},
    };
    for (const auto& c : cases)
        EXPECT_EQ(NumberFormat(NumberFormat::BuiltinCode(c.id)).RenderNumber(c.value), c.text) << "id " << c.id;
}

TEST(NumberFormatCodes, TextBooleansAndErrors)
{
    EXPECT_EQ(NumberFormat("0.00").Render(Make(Variant::Text, 0, "abc")), "abc");
    EXPECT_EQ(NumberFormat("@").Render(Make(Variant::Text, 0, "abc")), "abc");
    EXPECT_EQ(NumberFormat("\"<\"@\">\"").Render(Make(Variant::Text, 0, "abc")), "<abc>");
    EXPECT_EQ(NumberFormat("0;-0;0;\"text: \"@").Render(Make(Variant::Text, 0, "x")), "text: x");
    EXPECT_EQ(NumberFormat("0;-0;0;\"text: \"@").RenderNumber(-3), "-3");
    EXPECT_EQ(NumberFormat("0.00").Render(Make(Variant::Boolean, 1)), "TRUE");
    EXPECT_EQ(NumberFormat().Render(Make(Variant::Boolean, 0)), "FALSE");
    EXPECT_EQ(NumberFormat("0.00").Render(Make(Variant::Error, 0, "#N/A")), "#N/A");
    EXPECT_EQ(NumberFormat("0.00").Render(Variant()), "");
}

TEST(NumberFormatCodes, TellsDateFormatsFromNumberFormats)
{
    for (const char* code : {"yyyy/mm/dd", "h:mm", "[h]:mm:ss", "mmm-yy", "m/d/yyyy h:mm"})
        EXPECT_TRUE(NumberFormat(code).IsDateTime()) << code;
    for (const char* code : {"General", "0.00", "#,##0", "\"yyyy\"0", "@", "0.00E+00"})
        EXPECT_FALSE(NumberFormat(code).IsDateTime()) << code;
}

TEST(NumberFormatCodes, MalformedCodesNeverFail)
{
    // Unterminated quotes and brackets, stray escapes: whatever shows, nothing breaks.
    for (const char* code : {"\"abc", "[Red", "0\\", "_", "*", ";;;;;;", "E+", "0.0E+", ".", "[h", "yyyy\"", "?/", "/0"})
        EXPECT_NO_THROW(NumberFormat(code).RenderNumber(-12.5)) << code;
    EXPECT_EQ(NumberFormat("").RenderNumber(2.5), "2.5");
}
