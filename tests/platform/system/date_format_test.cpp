// The one date/time reader: formats and texts split into tokens alike, each format token reading
// its field, the starting values a text does not reach, and the ranges.
#include "platform/system/DateFormat.h"
#include "platform/system/OleDateTime.h"

#include <gtest/gtest.h>

namespace {

using sys::DateFormat;
using sys::DateTimeFields;

// The text read with every field its own format token, so the tokens show as the fields.
DateTimeFields Tokens(const char* text)
{
    DateTimeFields fields{0, 0, 0, 0, 0, 0};
    DateFormat("y M d h m s").ReadTokens(text, fields);
    return fields;
}

TEST(DateTimeTokens, RunsOfSeparatorsCountOnce)
{
    const DateTimeFields all = Tokens("2021-03-04T05:06:07");
    EXPECT_EQ(DateFormat("2021-03-04T05:06:07").TokenCount(), 6u);
    EXPECT_EQ(all.year, 2021);
    EXPECT_EQ(all.minute, 6);
    EXPECT_EQ(all.second, 7);
    EXPECT_EQ(DateFormat("  2021//03 | 04.  ").TokenCount(), 3u);
    const DateTimeFields three = Tokens("  2021//03 | 04.  ");
    EXPECT_EQ(three.year, 2021);
    EXPECT_EQ(three.month, 3);
    EXPECT_EQ(three.day, 4);
    EXPECT_EQ(three.hour, 0);
    EXPECT_EQ(DateFormat("/ T:-.|").TokenCount(), 0u);
    EXPECT_EQ(DateFormat("").TokenCount(), 0u);
}

struct DateTimeCase {
    const char* text;
    const char* format;
    bool succeeds;
    const char* formatted; // "%Y-%m-%d %H:%M:%S" of the result when it succeeds
};

// The date/time of a text as the Excel preview makes it: all six fields from 1900-01-01 00:00:00;
// a day the calendar does not have gives an invalid value.
bool ReadDateTime(const char* text, const char* format, COleDateTime& value)
{
    DateTimeFields fields;
    if (!DateFormat(format).Read(text, fields))
        return false;
    value.SetDateTime(fields.year, fields.month, fields.day, fields.hour, fields.minute, fields.second);
    return true;
}

TEST(DateFormat, Cases)
{
    const DateTimeCase cases[] = {
        {"2021-03-04T05:06:07", "YYYY-MM-DDTHH:mm:ss", true, "2021-03-04 05:06:07"},
        {"2020/01/01 12:00:00", "YYYY/MM/DD HH:mm:ss", true, "2020-01-01 12:00:00"},
        {"2021/02/30", "YYYY/MM/DD", true, "Invalid DateTime"},
        {"2021/13/01", "YYYY/MM/DD", false, ""},
        {"21/02/03", "YY/MM/DD", false, ""},
        {"2021/03", "YYYY/MM/DD HH:mm", true, "2021-03-01 00:00:00"},
        {"", "YYYY/MM/DD", true, "1900-01-01 00:00:00"},
        {"04.03.2021 08h", "DD.MM.YYYY HH", true, "2021-03-04 08:00:00"},
        {"2021/x3/04", "YYYY/MM/DD", false, ""},
        {"2021/03/04 24:00", "YYYY/MM/DD HH:mm", false, ""},
        {"2021/03/04 23:60", "YYYY/MM/DD HH:mm", false, ""},
        {"2021/03/32", "YYYY/MM/DD", false, ""},
        {"2021/03/00", "YYYY/MM/DD", false, ""},
        {"abc 2021/03/04", "xx YYYY/MM/DD", true, "2021-03-04 00:00:00"}, // other letters are passed over
        {"2021/03/04 -1:00", "YYYY/MM/DD HH:mm", true, "2021-03-04 01:00:00"}, // "-" separates
        {"99999999999/03/04", "YYYY/MM/DD", false, ""},
        {"12/31/1999 11:59:59", "MM/DD/YYYY hh:mm:ss", true, "1999-12-31 11:59:59"},
    };
    for (const DateTimeCase& c : cases) {
        COleDateTime value;
        ASSERT_EQ(ReadDateTime(c.text, c.format, value), c.succeeds) << c.text << " / " << c.format;
        if (c.succeeds) {
            EXPECT_EQ(value.Format("%Y-%m-%d %H:%M:%S"), c.formatted) << c.text;
        }
    }
}

TEST(DateFormat, ImpossibleDateIsInvalidValue)
{
    COleDateTime value(2020, 1, 1, 0, 0, 0);
    ASSERT_TRUE(ReadDateTime("2021/04/31", "YYYY/MM/DD", value));
    EXPECT_FALSE(value.IsValid());
}

TEST(DateFormat, ReadsOnlyTheDateAndStartsAtYear100)
{
    const DateFormat::Reads date = DateFormat::Reads::Date;
    DateTimeFields fields;
    fields.year = 100;
    ASSERT_TRUE(DateFormat("YYYY/MM/DD HH:mm", date).Read("2021/03/04 99:99", fields)); // time is not read
    EXPECT_EQ(fields.year, 2021);
    EXPECT_EQ(fields.month, 3);
    EXPECT_EQ(fields.day, 4);

    DateTimeFields onlyDay;
    onlyDay.year = 100;
    ASSERT_TRUE(DateFormat("DD", date).Read("17", onlyDay));
    EXPECT_EQ(onlyDay.year, 100);
    EXPECT_EQ(onlyDay.month, 1);
    EXPECT_EQ(onlyDay.day, 17);

    DateTimeFields bad;
    EXPECT_FALSE(DateFormat("YYYY/MM/DD", date).Read("2021/00/04", bad));
}

TEST(DateFormat, ReadsOnlyTheTime)
{
    const DateFormat::Reads time = DateFormat::Reads::Time;
    DateTimeFields fields;
    ASSERT_TRUE(DateFormat("HH:MM", time).Read("10:20", fields)); // capital M is a month: skipped for a time
    EXPECT_EQ(fields.hour, 10);
    EXPECT_EQ(fields.minute, 0);

    DateTimeFields full;
    ASSERT_TRUE(DateFormat("YYYY/MM/DD HH:mm:ss", time).Read("2021/99/99 05:06:07", full));
    EXPECT_EQ(full.hour, 5);
    EXPECT_EQ(full.minute, 6);
    EXPECT_EQ(full.second, 7);

    DateTimeFields kept{1900, 1, 1, 1, 2, 3};
    ASSERT_TRUE(DateFormat("HH:mm:ss", time).Read("08", kept)); // missing tokens keep the caller's values
    EXPECT_EQ(kept.hour, 8);
    EXPECT_EQ(kept.minute, 2);
    EXPECT_EQ(kept.second, 3);

    DateTimeFields bad;
    EXPECT_FALSE(DateFormat("HH:mm", time).Read("10:x0", bad));
}

} // namespace
