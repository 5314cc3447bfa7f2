// Stamps and numbers as text: the date/time reader's shortcut against its token-by-token reading,
// stamps against automation dates, the output form of stamps, and values read with each decimal
// separator.
#include "converter/NumberText.h"
#include "converter/StampText.h"
#include "platform/system/OleDateTime.h"

#include <gtest/gtest.h>

#include <cmath>
#include <random>
#include <charconv>
#include <cstring>

using namespace converter;

namespace {

// The date/time reader with its compact shortcut against its token-by-token reading, and the stamp
// of the fields against the automation date of the same fields.
void ExpectSameAsReference(const std::string& text, const std::string& format)
{
    sys::DateTimeFields reference;
    const bool referenceOk = sys::DateFormat(format).ReadTokens(text, reference);
    sys::DateTimeFields fields;
    const bool ok = sys::DateFormat(format).Read(text, fields);
    ASSERT_EQ(ok, referenceOk) << "[" << text << "] with [" << format << "]";
    if (!ok)
        return;
    COleDateTime automation;
    automation.SetDateTime(reference.year, reference.month, reference.day, reference.hour, reference.minute,
                           reference.second);
    const std::optional<Stamp> stamp = StampFromFields(fields);
    ASSERT_EQ(stamp.has_value(), automation.IsValid()) << "[" << text << "] with [" << format << "]";
    if (stamp) {
        EXPECT_EQ(*stamp, automation.ToUnixSeconds()) << "[" << text << "] with [" << format << "]";
    }
}

TEST(DateFormat, AgreesWithTheReferenceReaders)
{
    const std::pair<const char*, const char*> cases[] = {
        {"2021-03-04T05:06:07", "YYYY-MM-DDTHH:mm:ss"},
        {"2021/02/30", "YYYY/MM/DD"},
        {"2021/13/01", "YYYY/MM/DD"},
        {"21/02/03", "YY/MM/DD"},
        {"2021/03", "YYYY/MM/DD HH:mm"},
        {"10:20", "HH:MM"},
        {"2020/01/01 12:00:00", "YYYY/MM/DD HH:mm:ss"},
        {"08h:30", "HH:mm"},
        {"x/01/01", "YYYY/MM/DD"},
        {"2020/01/01 24:00:00", "YYYY/MM/DD HH:mm:ss"},
        {"-5/1/1", "YYYY/MM/DD"},
        {"99999999999/1/1", "YYYY/MM/DD"},
        {"01.02.2020 1:2:3", "DD.MM.YYYY H:m:s"},
        {"", "YYYY"},
        {"2020 x 5", "YYYY q DD"},
    };
    for (const auto& [text, format] : cases)
        ExpectSameAsReference(text, format);
}

TEST(DateFormat, AgreesWithTheReferenceOnRandomTexts)
{
    std::mt19937 random(7);
    const std::string alphabet = "0123456789/ :-.T|x+";
    const char* formats[] = {"YYYY/MM/DD HH:mm:ss", "DD.MM.YYYY", "HH:mm", "YYYY-MM-DDTHH:mm:ss", "y m d h M s q"};
    for (int n = 0; n < 5000; ++n) {
        std::string text;
        const size_t length = random() % 22;
        for (size_t i = 0; i < length; ++i)
            text += alphabet[random() % alphabet.size()];
        ExpectSameAsReference(text, formats[random() % std::size(formats)]);
    }
}

TEST(DateFormat, CompactStampsAgreeWithTheReference)
{
    std::mt19937 random(11);
    const std::string separators = "/ T:-.|x";
    for (int n = 0; n < 20000; ++n) {
        std::string text = "dddd/dd/dd dd:dd:dd";
        for (char& c : text)
            c = c == 'd' ? static_cast<char>('0' + random() % 10) : separators[random() % separators.size()];
        if (n % 2 == 0) // mostly plausible values, so the fast path is taken as well as refused
            text.replace(0, 4, std::to_string(1900 + random() % 200)), text[5] = '0', text[8] = static_cast<char>('0' + random() % 3);
        ExpectSameAsReference(text, "YYYY/MM/DD HH:mm:ss");
        ExpectSameAsReference(text, "YYYY-MM-DDTHH:mm:ss");
    }
}

TEST(DateFormat, ExtraSeparatorsSplitJoinedFields)
{
    sys::DateTimeFields fields;
    ASSERT_TRUE(sys::DateFormat("YYYY/MM/DD,HH:mm:ss", sys::DateFormat::Reads::DateTime, ",").Read("2020/05/06 07:08:09", fields));
    EXPECT_EQ(FormatStamp(*StampFromFields(fields)), "2020/05/06 07:08:09");
}

TEST(StampText, FormatsStampsAndKnowsTheCalendar)
{
    const Stamp stamp = *StampFromFields({1999, 12, 31, 23, 59, 58});
    EXPECT_EQ(FormatStamp(stamp), "1999/12/31 23:59:58");
    EXPECT_EQ(FormatStamp(*StampFromFields({1800, 1, 1, 0, 0, 0})), "1800/01/01 00:00:00");
    EXPECT_EQ(FormatStamp(*StampFromFields({100, 1, 1, 0, 0, 0})), "0100/01/01 00:00:00");
    EXPECT_FALSE(StampFromFields({2021, 2, 29, 0, 0, 0}).has_value());
    EXPECT_TRUE(StampFromFields({2020, 2, 29, 0, 0, 0}).has_value());
}

// The sheet's day numbers count a 29 February 1900: serial 1 is 1 January 1900, 59 is 28 February,
// 61 is 1 March; below 1 they count from 30 December 1899 as automation dates do.
TEST(StampText, SheetSerialsFollowTheSheetsOwnCalendar)
{
    struct Case {
        double serial;
        const char* stamp; // "" when the serial is no stamp
    } cases[] = {
        {1.5, "1900/01/01 12:00:00"},   {1, "1900/01/01 00:00:00"},     {32, "1900/02/01 00:00:00"},
        {59.75, "1900/02/28 18:00:00"}, {60, ""},                       {60.5, ""},
        {61, "1900/03/01 00:00:00"},    {44333.25, "2021/05/17 06:00:00"}, {0.5, "1899/12/30 12:00:00"},
        {-1.25, "1899/12/28 18:00:00"}, {-657434, "0100/01/01 00:00:00"}, {2958465, "9999/12/31 00:00:00"},
        {-657435, ""},                  {2958466, ""},                  {std::nan(""), ""},
    };
    for (const Case& c : cases) {
        const std::optional<Stamp> stamp = StampFromSheetSerial(c.serial);
        if (*c.stamp == '\0') {
            EXPECT_FALSE(stamp.has_value()) << c.serial;
            continue;
        }
        ASSERT_TRUE(stamp.has_value()) << c.serial;
        EXPECT_EQ(FormatStamp(*stamp), c.stamp) << c.serial;
        // Back to the same serial wherever the sheet shows the day as a date.
        if (c.serial >= 1) {
            EXPECT_DOUBLE_EQ(SheetSerialFromStamp(*stamp).value_or(-1), c.serial) << c.serial;
        }
    }
    EXPECT_FALSE(SheetSerialFromStamp(*StampFromFields({1899, 12, 31, 23, 59, 59})).has_value());
    EXPECT_FALSE(SheetSerialFromStamp(*StampFromFields({100, 1, 1, 0, 0, 0})).has_value());
}

TEST(NumberReader, ReadsWithTheTemplateSeparator)
{
    struct Case {
        const char* separator;
        const char* field;
        ValueText expected;
        double value;
    } cases[] = {
        {".", "3.5", ValueText::Number, 3.5},
        {".", " -2.25e3 ", ValueText::Number, -2250},
        {".", "+7", ValueText::Number, 7},
        {".", "3,5", ValueText::WrongSeparator, 0},
        {".", "", ValueText::Empty, 0},
        {".", "   ", ValueText::Empty, 0},
        {".", "abc", ValueText::NotANumber, 0},
        {".", "1.5x", ValueText::NotANumber, 0},
        {".", "1e999", ValueText::NotANumber, 0},
        {",", "3,5", ValueText::Number, 3.5},
        {",", "3.5", ValueText::WrongSeparator, 0},
        {",", "-0,125", ValueText::Number, -0.125},
        {",", "-1,25e3", ValueText::Number, -1250},
        {",", "1.234,5", ValueText::NotANumber, 0},
        {",", "1e400", ValueText::NotANumber, 0},
        {",", "0,0", ValueText::Number, 0},
        {"'", "1'5", ValueText::Number, 1.5},
        {"'", "1.5", ValueText::Number, 1.5},
        {"\xD9\xAB", "2\xD9\xAB" "5", ValueText::Number, 2.5},
        {"", "4", ValueText::Number, 4},
    };
    for (const Case& c : cases) {
        double value = 0;
        EXPECT_EQ(NumberReader(c.separator).Read(c.field, value), c.expected) << c.separator << " [" << c.field << "]";
        if (c.expected == ValueText::Number) {
            EXPECT_DOUBLE_EQ(value, c.value) << c.field;
        }
    }
}

TEST(FormatValue, ShortestTextReadsBackExactly)
{
    for (double value : {0.1, 1.0 / 3.0, -2.5e-300, 123456789.125, 1e21, -0.0}) {
        char buffer[40];
        const std::string text(buffer, FormatValue(value, buffer));
        double back = 0;
        ASSERT_EQ(NumberReader(".").Read(text, back), ValueText::Number) << text;
        EXPECT_EQ(back, value) << text;
    }
    char buffer[40];
    EXPECT_EQ(FormatValue(kMissing, buffer), buffer);
}

} // namespace

namespace {

TEST(NumberReader, FastDecimalsAgreeWithFromChars)
{
    std::mt19937_64 random(99);
    NumberReader reader(".");
    for (int n = 0; n < 200000; ++n) {
        const int digits = 1 + static_cast<int>(random() % 17);
        std::string text = (random() % 4 == 0) ? "-" : "";
        const int point = static_cast<int>(random() % (digits + 1));
        for (int i = 0; i < digits; ++i) {
            if (i == point && i > 0)
                text += '.';
            text += static_cast<char>('0' + random() % 10);
        }
        double fast = 0, reference = 0;
        ASSERT_EQ(reader.Read(text, fast), ValueText::Number) << text;
        std::from_chars(text.data(), text.data() + text.size(), reference);
        ASSERT_EQ(fast, reference) << text;
    }
}

TEST(ScanPlainDecimal, StopsAtTheFirstCharacterAfterTheNumberWithFromCharsValue)
{
    std::mt19937_64 random(17);
    const char followers[] = {'\t', ';', ',', ' ', 'e', '/', ':', '"', 'x'};
    for (int n = 0; n < 100000; ++n) {
        const int digits = 1 + static_cast<int>(random() % 15);
        std::string number = (random() % 4 == 0) ? "-" : "";
        const int point = static_cast<int>(random() % (digits + 1));
        for (int i = 0; i < digits; ++i) {
            if (i == point && i > 0)
                number += '.';
            number += static_cast<char>('0' + random() % 10);
        }
        const std::string line = number + followers[random() % std::size(followers)] + "12345678.25";
        double scanned = 0, reference = 0;
        const char* stop = ScanPlainDecimal(line.data(), line.data() + line.size(), scanned);
        ASSERT_EQ(stop, line.data() + number.size()) << line;
        std::from_chars(number.data(), number.data() + number.size(), reference);
        ASSERT_EQ(scanned, reference) << line;
    }
    double value = 0;
    for (const char* refused : {"", "-", ".", "-.", "1234567890123456", "x1", "\"1\""})
        EXPECT_EQ(ScanPlainDecimal(refused, refused + std::strlen(refused), value), nullptr) << refused;
}

TEST(FormatValue, RandomValuesReadBackExactly)
{
    std::mt19937_64 random(5);
    NumberReader reader(".");
    for (int n = 0; n < 200000; ++n) {
        double value;
        switch (n % 3) {
        case 0: value = static_cast<double>(static_cast<std::int64_t>(random() % 2000000000) - 1000000000) / 10000.0; break;
        case 1: value = std::ldexp(static_cast<double>(random() >> 11), static_cast<int>(random() % 200) - 100); break;
        default: value = static_cast<double>(random() % 1000) * 1e-7; break;
        }
        char buffer[40];
        const std::string text(buffer, FormatValue(value, buffer));
        double back = 0;
        ASSERT_EQ(reader.Read(text, back), ValueText::Number) << text;
        ASSERT_EQ(back, value) << text;
    }
    char buffer[40];
    EXPECT_EQ(std::string(buffer, FormatValue(255.069, buffer)), "255.069");
    EXPECT_EQ(std::string(buffer, FormatValue(-0.05, buffer)), "-0.05");
    EXPECT_EQ(std::string(buffer, FormatValue(7.0, buffer)), "7");
}

} // namespace

namespace {

// Decimals of up to 15 significant digits come back as their own text: fewest decimals, no
// trailing zeros, no exponent.
TEST(FormatValue, ShortDecimalsComeBackAsTheirOwnText)
{
    std::mt19937_64 random(17);
    for (int n = 0; n < 200000; ++n) {
        const int significant = 1 + static_cast<int>(random() % 15);
        std::string digits;
        for (int i = 0; i < significant; ++i)
            digits += static_cast<char>('0' + random() % 10);
        const int decimals = static_cast<int>(random() % 16);
        // The canonical text: integer part without leading zeros, fraction without trailing ones.
        std::string integer = decimals >= significant ? "" : digits.substr(0, significant - decimals);
        std::string fraction = decimals >= significant ? std::string(decimals - significant, '0') + digits
                                                       : digits.substr(significant - decimals);
        integer.erase(0, integer.find_first_not_of('0'));
        if (integer.empty())
            integer = "0";
        fraction.erase(fraction.find_last_not_of('0') + 1);
        const std::string text = (n % 2 ? "-" : "") + integer + (fraction.empty() ? "" : "." + fraction);
        double value = 0;
        std::from_chars(text.data(), text.data() + text.size(), value);
        if (value == 0 || std::fabs(value) < 1e-6)
            continue; // written in the general form
        char buffer[40];
        ASSERT_EQ(std::string(buffer, FormatValue(value, buffer)), text);
    }
    char buffer[40];
    EXPECT_EQ(std::string(buffer, FormatValue(999999999999999.0, buffer)), "999999999999999");
    EXPECT_EQ(std::string(buffer, FormatValue(100000000000000.0, buffer)), "100000000000000");
    EXPECT_EQ(std::string(buffer, FormatValue(0.000001, buffer)), "0.000001");
    EXPECT_EQ(std::string(buffer, FormatValue(0.1 + 0.2, buffer)), "0.30000000000000004");
    EXPECT_EQ(std::string(buffer, FormatValue(1234.5678901234567, buffer)), "1234.5678901234567");
}

} // namespace

namespace {

// The printer keeps the date between rows: it must still agree with FormatStamp when the day
// changes forwards, backwards, before 1970 and at the clamped ends of the calendar.
TEST(StampPrinter, WritesWhatFormatStampWrites)
{
    const Stamp start = *StampFromFields({1969, 12, 31, 23, 0, 0});
    std::vector<Stamp> stamps;
    for (Stamp s = start; s < start + 3 * 86400; s += 599)
        stamps.push_back(s);
    for (Stamp s : {Stamp{0}, Stamp{-1}, Stamp{86399}, Stamp{86400}, Stamp{-86400}, Stamp{-86401}, start, Stamp{0},
                    *StampFromFields({9999, 12, 31, 23, 59, 59}), *StampFromFields({9999, 12, 31, 23, 59, 59}) + 86400,
                    *StampFromFields({1, 1, 1, 0, 0, 0}) - 86400, *StampFromFields({2000, 2, 29, 12, 0, 0})})
        stamps.push_back(s);
    StampPrinter printer;
    for (Stamp s : stamps) {
        char buffer[32];
        ASSERT_EQ(std::string(buffer, printer.Write(s, buffer)), FormatStamp(s)) << s;
    }
}

} // namespace
