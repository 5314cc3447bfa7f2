#include "platform/system/OleDateTime.h"

#include <gtest/gtest.h>

TEST(OleDateTime, KnownSerialNumbers)
{
    EXPECT_DOUBLE_EQ(COleDateTime(1899, 12, 30, 0, 0, 0).GetOleDate(), 0.0);
    EXPECT_DOUBLE_EQ(COleDateTime(1900, 1, 1, 0, 0, 0).GetOleDate(), 2.0);
    EXPECT_DOUBLE_EQ(COleDateTime(2021, 5, 17, 0, 0, 0).GetOleDate(), 44333.0);
    EXPECT_DOUBLE_EQ(COleDateTime(2020, 1, 1, 12, 0, 0).GetOleDate(), 43831.5);
    // Before the epoch the time of day still counts forward from midnight.
    EXPECT_DOUBLE_EQ(COleDateTime(1899, 12, 29, 6, 0, 0).GetOleDate(), -1.25);
    EXPECT_EQ(COleDateTime(-1.25).Format("%Y-%m-%d %H:%M:%S"), "1899-12-29 06:00:00");
}

TEST(OleDateTime, ImpossibleDatesAreInvalid)
{
    EXPECT_FALSE(COleDateTime(2021, 2, 30, 0, 0, 0).IsValid());
    EXPECT_FALSE(COleDateTime(2021, 4, 31, 0, 0, 0).IsValid());
    EXPECT_FALSE(COleDateTime(99, 1, 1, 0, 0, 0).IsValid());
    EXPECT_TRUE(COleDateTime(2020, 2, 29, 23, 59, 59).IsValid());
    EXPECT_FALSE(COleDateTime(2019, 2, 29, 0, 0, 0).IsValid());
    EXPECT_EQ(COleDateTime(2021, 2, 30, 0, 0, 0).Format("%Y"), "Invalid DateTime");
    EXPECT_FALSE(COleDateTime(1e12).IsValid());
}

TEST(OleDateTime, AddDaysRoundsToSeconds)
{
    COleDateTime start(2020, 1, 1, 0, 0, 0);
    EXPECT_EQ(start.AddDays(1.5 / 24).Format("%Y-%m-%d %H:%M:%S"), "2020-01-01 01:30:00");
    EXPECT_EQ(start.AddDays(-0.25).Format("%Y-%m-%d %H:%M:%S"), "2019-12-31 18:00:00");
    EXPECT_EQ(COleDateTime(1899, 12, 30, 0, 0, 0).AddDays(-0.5).Format("%Y-%m-%d %H:%M:%S"), "1899-12-29 12:00:00");
    // 3600 steps of one second land exactly on the hour.
    COleDateTime t = start;
    for (int i = 0; i < 3600; ++i)
        t = t.AddDays(1.0 / 86400);
    EXPECT_EQ(t.Format("%H:%M:%S"), "01:00:00");
}

TEST(OleDateTime, UnixSecondsRoundTrip)
{
    COleDateTime t(2021, 3, 4, 5, 6, 7);
    EXPECT_EQ(t.ToUnixSeconds(), 1614834367);
    EXPECT_EQ(COleDateTime::FromUnixSeconds(1614834367).Format("%Y-%m-%d %H:%M:%S"), "2021-03-04 05:06:07");
    EXPECT_EQ(COleDateTime::FromUnixSeconds(-86400 * 365).Format("%Y-%m-%d"), "1969-01-01");
}

// A year has four digits in every date text, the years 100 to 999 too ("%Y" alone would give
// three); "%%Y" stays a literal.
TEST(OleDateTime, YearsAlwaysHaveFourDigits)
{
    struct Case {
        int year;
        const char* format;
        const char* text;
    } cases[] = {
        {100, "%Y/%m/%d %H:%M:%S", "0100/01/02 03:04:05"},
        {999, "%Y-%m-%d", "0999-01-02"},
        {1000, "%Y", "1000"},
        {9999, "%d.%m.%Y", "02.01.9999"},
        {100, "%%Y %Y%%", "%Y 0100%"},
    };
    for (const Case& c : cases)
        EXPECT_EQ(COleDateTime(c.year, 1, 2, 3, 4, 5).Format(c.format), c.text) << c.year << " " << c.format;
    EXPECT_EQ(COleDateTime(-657434.0).Format("%Y/%m/%d"), "0100/01/01");
}
