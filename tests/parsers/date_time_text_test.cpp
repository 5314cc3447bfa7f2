#include "parsers/DateTimeText.h"

#include <gtest/gtest.h>

namespace {

TEST(DateTimeTokens, RunsOfSeparatorsCountOnce)
{
    EXPECT_EQ(SplitDateTimeTokens("2021-03-04T05:06:07"), (CStringList{"2021", "03", "04", "05", "06", "07"}));
    EXPECT_EQ(SplitDateTimeTokens("  2021//03 | 04.  "), (CStringList{"2021", "03", "04"}));
    EXPECT_TRUE(SplitDateTimeTokens("/ T:-.|").empty());
    EXPECT_TRUE(SplitDateTimeTokens("").empty());
}

struct DateTimeCase {
    const char* text;
    const char* format;
    bool succeeds;
    const char* formatted; // "%Y-%m-%d %H:%M:%S" of the result when it succeeds
};

TEST(ParseDateTimeText, Cases)
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
        ASSERT_EQ(ParseDateTimeText(c.text, c.format, value), c.succeeds) << c.text << " / " << c.format;
        if (c.succeeds) {
            EXPECT_EQ(value.Format("%Y-%m-%d %H:%M:%S"), c.formatted) << c.text;
        }
    }
}

TEST(ParseDateTimeText, ImpossibleDateIsInvalidValue)
{
    COleDateTime value(2020, 1, 1, 0, 0, 0);
    ASSERT_TRUE(ParseDateTimeText("2021/04/31", "YYYY/MM/DD", value));
    EXPECT_FALSE(value.IsValid());
}

TEST(ParseDateText, ReadsOnlyTheDateAndStartsAtYear100)
{
    CDateFields date;
    ASSERT_TRUE(ParseDateText("2021/03/04 99:99", "YYYY/MM/DD HH:mm", date)); // time is not read
    EXPECT_EQ(date.year, 2021);
    EXPECT_EQ(date.month, 3);
    EXPECT_EQ(date.day, 4);

    CDateFields onlyDay;
    ASSERT_TRUE(ParseDateText("17", "DD", onlyDay));
    EXPECT_EQ(onlyDay.year, 100);
    EXPECT_EQ(onlyDay.month, 1);
    EXPECT_EQ(onlyDay.day, 17);

    CDateFields bad;
    EXPECT_FALSE(ParseDateText("2021/00/04", "YYYY/MM/DD", bad));
}

TEST(ParseTimeText, ReadsOnlyTheTime)
{
    CTimeFields time;
    ASSERT_TRUE(ParseTimeText("10:20", "HH:MM", time)); // capital M is a month: skipped for a time
    EXPECT_EQ(time.hour, 10);
    EXPECT_EQ(time.minute, 0);

    CTimeFields full;
    ASSERT_TRUE(ParseTimeText("2021/99/99 05:06:07", "YYYY/MM/DD HH:mm:ss", full));
    EXPECT_EQ(full.hour, 5);
    EXPECT_EQ(full.minute, 6);
    EXPECT_EQ(full.second, 7);

    CTimeFields kept{1, 2, 3};
    ASSERT_TRUE(ParseTimeText("08", "HH:mm:ss", kept)); // missing tokens keep the caller's values
    EXPECT_EQ(kept.hour, 8);
    EXPECT_EQ(kept.minute, 2);
    EXPECT_EQ(kept.second, 3);

    CTimeFields bad;
    EXPECT_FALSE(ParseTimeText("10:x0", "HH:mm", bad));
}

} // namespace
