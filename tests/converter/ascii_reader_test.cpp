// The ASCII reader over whole files: header rows, stamps by format, values, and every way a file
// can fail to fit its template, each with its line.
#include "TestFiles.h"
#include "converter/AsciiSeriesReader.h"
#include "converter/StampText.h"
#include "templates/AsciiSpecification.h"

#include <gtest/gtest.h>

using namespace converter;

namespace {

struct Read {
    sys::Status status;
    SeriesHeader header;
    std::vector<Row> rows;
};

Read ReadAll(const CSpecification& spec, const std::string& content)
{
    testsupport::ScratchFolder folder;
    const std::string path = folder.File("input.txt");
    testsupport::WriteFile(path, content);
    AsciiSeriesReader reader(spec);
    Read result;
    result.status = reader.Open(path);
    if (!result.status)
        return result;
    result.header = reader.Header();
    Row row;
    while (reader.Next(row))
        result.rows.push_back(row);
    result.status = reader.status();
    return result;
}

using convtest::GlobalSpec;

TEST(AsciiSeriesReader, ReadsTheDefaultLayout)
{
    CAsciiSpecification spec;
    const Read r = ReadAll(spec, "Rainfall[mm]:Accumulated\tUndefined[Undefined]:Instantaneous\n"
                                 "Time\tRain\tLevel\n"
                                 "2020/01/01 00:00:00\t1.5\t\n"
                                 "\n"
                                 "2020/01/01 01:00:00\t2\t-3.25\n");
    ASSERT_TRUE(r.status) << r.status.problem().Describe();
    EXPECT_EQ(r.header.timeTitle, "Time");
    ASSERT_EQ(r.header.items.size(), 2u);
    EXPECT_EQ(r.header.items[0].name, "Rain");
    EXPECT_EQ(r.header.items[0].type, "Rainfall");
    EXPECT_EQ(r.header.items[0].unit, "mm");
    EXPECT_EQ(r.header.items[0].valueType, "Accumulated");
    EXPECT_EQ(r.header.items[1].unit, "Undefined");
    ASSERT_EQ(r.rows.size(), 2u);
    EXPECT_EQ(FormatStamp(r.rows[1].stamp), "2020/01/01 01:00:00");
    EXPECT_EQ(r.rows[0].values[0], 1.5);
    EXPECT_TRUE(IsMissing(r.rows[0].values[1]));
    EXPECT_EQ(r.rows[1].values[1], -3.25);
}

TEST(AsciiSeriesReader, StampSpanningTwoSpaceDelimitedFields)
{
    CAsciiSpecification spec = GlobalSpec();
    spec.m_strDelimiter = "Space";
    const Read r = ReadAll(spec, "Date Time A B\n2020/01/01 12:00:00 1.5 2.5\n");
    ASSERT_TRUE(r.status) << r.status.problem().Describe();
    EXPECT_EQ(r.header.timeTitle, "Date");
    ASSERT_EQ(r.header.items.size(), 2u);
    EXPECT_EQ(r.header.items[0].name, "A");
    EXPECT_EQ(r.header.items[1].name, "B");
    ASSERT_EQ(r.rows.size(), 1u);
    EXPECT_EQ(FormatStamp(r.rows[0].stamp), "2020/01/01 12:00:00");
    EXPECT_EQ(r.rows[0].values[1], 2.5);
}

TEST(AsciiSeriesReader, GlobalDateAndGlobalTimeCombineWithTheRow)
{
    CAsciiSpecification spec = GlobalSpec();
    spec.m_TimeDesc.m_nDateTimeOption = 1;
    spec.m_TimeDesc.m_strGlobalDate = "2020-05-01";
    spec.m_TimeDesc.m_strTimeFormat = "HH:mm";
    Read r = ReadAll(spec, "T\tA\n06:30\t1\n");
    ASSERT_TRUE(r.status) << r.status.problem().Describe();
    EXPECT_EQ(FormatStamp(r.rows.at(0).stamp), "2020/05/01 06:30:00");

    spec.m_TimeDesc.m_nDateTimeOption = 2;
    spec.m_TimeDesc.m_strGlobalTime = "12:15:00";
    spec.m_TimeDesc.m_strDateFormat = "DD.MM.YYYY";
    r = ReadAll(spec, "T\tA\n02.03.2021\t1\n");
    ASSERT_TRUE(r.status) << r.status.problem().Describe();
    EXPECT_EQ(FormatStamp(r.rows.at(0).stamp), "2021/03/02 12:15:00");
}

TEST(AsciiSeriesReader, DeleteValueAndDecimalComma)
{
    CAsciiSpecification spec = GlobalSpec();
    spec.m_strDelimiter = "Semi Colon";
    spec.m_strDecimalSeparator = "Comma";
    spec.m_DataDesc.m_nDeleteValueCheck = 1;
    spec.m_DataDesc.m_nDeleteValueRadio = 0;
    spec.m_DataDesc.m_strDeleteValue = "-999";
    const Read r = ReadAll(spec, "T;A;B\n2020/01/01 00:00:00;3,5;-999\n2020/01/01 00:00:01;-999,0;1\n");
    ASSERT_TRUE(r.status) << r.status.problem().Describe();
    EXPECT_EQ(r.rows[0].values[0], 3.5);
    EXPECT_TRUE(IsMissing(r.rows[0].values[1]));
    EXPECT_EQ(r.rows[1].values[0], -999.0); // only the exact text is the delete value
}

TEST(AsciiSeriesReader, SelectionReadsOnlyTheChosenItemsInOrder)
{
    CAsciiSpecification spec = GlobalSpec();
    testsupport::ScratchFolder folder;
    testsupport::WriteFile(folder.File("f.txt"), "T\tA\tB\tC\n2020/01/01 00:00:00\t1\tnot a number\t3\n");
    AsciiSeriesReader reader(spec);
    ASSERT_TRUE(reader.Open(folder.File("f.txt")));
    reader.Select({2, 0});
    Row row;
    ASSERT_TRUE(reader.Next(row)) << reader.status().problem().Describe();
    EXPECT_EQ(row.values, (std::vector<double>{3, 1}));
}

struct Broken {
    const char* name;
    std::string content;
    long line;
    const char* fragment; // part of the message
};

TEST(AsciiSeriesReader, EveryMisfitNamesItsLine)
{
    const Broken cases[] = {
        {"too many fields", "T\tA\n2020/01/01 00:00:00\t1\n2020/01/01 00:00:01\t1\t2\n", 3, "number of variables"},
        {"no delimiter", "T\tA\n2020/01/01 00:00:00\t1\n2020/01/01 00:00:01\n", 3, "no delimiters"},
        {"not a number", "T\tA\n2020/01/01 00:00:00\t1\n2020/01/01 00:00:01\tx1\n", 3, "is not a number"},
        {"bad stamp", "T\tA\n2020/01/01 00:00:00\t1\n2020/13/01 00:00:01\t1\n", 3, "Unable to parse date"},
        {"no such day", "T\tA\n2021/02/29 00:00:00\t1\n", 2, "does not exist in the calendar"},
        {"wrong separator", "T\tA\n2020/01/01 00:00:00\t1,5\n", 2, "decimal separator"},
        {"start line without delimiter", "T\tA\n2020/01/01\n", 2, "has not delimiters"},
        {"name line without delimiter", "T\n2020/01/01 00:00:00\t1\n", 1, "no delimiter"},
        {"short name line", "T\tA\n2020/01/01 00:00:00\t1\t2\n", 1, "item name row"},
        {"empty name line", "\n2020/01/01 00:00:00\t1\n", 1, "must not be empty"},
        {"no data", "T\tA\n", 2, "past its end"},
        {"bad quote", "T\tA\n2020/01/01 00:00:00\t1\n2020/01/01 00:00:01\t\"1\"2\n", 3, "quote"},
    };
    for (const Broken& c : cases) {
        const Read r = ReadAll(GlobalSpec(), c.content);
        ASSERT_FALSE(r.status) << c.name;
        EXPECT_EQ(r.status.problem().line, c.line) << c.name;
        EXPECT_NE(r.status.problem().message.find(c.fragment), std::string::npos)
            << c.name << ": " << r.status.problem().message;
    }
}

TEST(AsciiSeriesReader, UnknownItemTypeInTheTypeRowDoesNotFit)
{
    CAsciiSpecification spec;
    const Read r = ReadAll(spec, "Nonsense[mm]:Instantaneous\nT\tA\n2020/01/01 00:00:00\t1\n");
    ASSERT_FALSE(r.status);
    EXPECT_EQ(r.status.problem().line, 1);
    EXPECT_NE(r.status.problem().message.find("not in the unit catalogue"), std::string::npos);
}

TEST(AsciiSeriesReader, OverlongLineFailsInsteadOfGrowing)
{
    CAsciiSpecification spec = GlobalSpec();
    std::string content = "T\tA\n2020/01/01 00:00:00\t1\n";
    content += std::string(sys::kLongestTextLine + 10, '1') + "\n";
    const Read r = ReadAll(spec, content);
    ASSERT_FALSE(r.status);
    EXPECT_EQ(r.status.problem().line, 3);
}

} // namespace
