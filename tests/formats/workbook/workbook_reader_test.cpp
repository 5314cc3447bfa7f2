// Streaming whole sheets row by row, as the conversion engine reads workbooks.
#include "tests/support/TestWorkbooks.h"

#include "formats/workbook/WorkbookReader.h"

#include <gtest/gtest.h>

using namespace sheet;
using sheettest::DataFile;

namespace {

struct Row {
    int number;
    std::vector<RowCell> cells;
};

std::vector<Row> ReadAll(WorkbookReader& reader, int sheet)
{
    std::vector<Row> rows;
    EXPECT_TRUE(reader.ReadRows(sheet, [&](int row, const std::vector<RowCell>& cells) {
        rows.push_back({row, cells});
        return true;
    })) << reader.status().problem().message;
    return rows;
}

std::string MakeTwoSheetWorkbook()
{
    sheettest::XlsxBuilder builder(sheettest::TempFile("reader.xlsx"));
    lxw_worksheet* first = builder.AddSheet("First");
    lxw_worksheet* second = builder.AddSheet("Second");
    builder.Text(first, 1, 1, "Date");
    builder.Text(first, 1, 2, "Flow");
    builder.Number(first, 2, 1, 44333.5, "yyyy/mm/dd hh:mm");
    builder.Number(first, 2, 2, 1.25, "0.0");
    builder.Number(first, 4, 2, 3); // row 3 has no cells
    builder.Boolean(first, 5, 3, false);
    builder.Number(second, 1, 1, 99);
    return builder.Close();
}

} // namespace

TEST(WorkbookReader, ListsSheetsAndStreamsRowsWithValuesAndTexts)
{
    WorkbookReader reader;
    ASSERT_TRUE(reader.Open(MakeTwoSheetWorkbook())) << reader.status().problem().message;
    ASSERT_EQ(reader.SheetCount(), 2);
    EXPECT_EQ(reader.SheetNames()[1], "Second");

    std::vector<Row> rows = ReadAll(reader, 1);
    ASSERT_EQ(rows.size(), 4u);
    EXPECT_EQ(rows[0].number, 1);
    EXPECT_EQ(rows[0].cells[1].text, "Flow");
    EXPECT_EQ(rows[1].cells[0].text, "2021/05/17 12:00");
    EXPECT_DOUBLE_EQ(rows[1].cells[0].value.number, 44333.5);
    EXPECT_EQ(rows[1].cells[1].text, "1.3");
    EXPECT_EQ(rows[2].number, 4);
    EXPECT_EQ(rows[2].cells[0].column, 2);
    EXPECT_EQ(rows[3].cells[0].value.type, Variant::Boolean);
    EXPECT_EQ(rows[3].cells[0].text, "FALSE");

    std::vector<Row> second = ReadAll(reader, 2);
    ASSERT_EQ(second.size(), 1u);
    EXPECT_EQ(second[0].cells[0].text, "99");
}

TEST(WorkbookReader, StopsWhenTheCallbackSaysSo)
{
    WorkbookReader reader;
    ASSERT_TRUE(reader.Open(MakeTwoSheetWorkbook()));
    int seen = 0;
    EXPECT_TRUE(reader.ReadRows(1, [&](int, const std::vector<RowCell>&) { return ++seen < 2; }));
    EXPECT_EQ(seen, 2);
}

TEST(WorkbookReader, ReadsXlsAlike)
{
    WorkbookReader reader;
    ASSERT_TRUE(reader.Open(DataFile("stamps.xls"))) << reader.status().problem().message;
    EXPECT_EQ(reader.SheetNames(), std::vector<std::string>{"Stamps"});
    std::vector<Row> rows = ReadAll(reader, 1);
    ASSERT_EQ(rows.size(), 4u);
    EXPECT_EQ(rows[1].cells[0].text, "2021/05/17 01:02:03");
    EXPECT_EQ(rows[3].cells[1].text, "14:00:00");
}

TEST(WorkbookReader, FailuresNameTheFileAndTheSheet)
{
    WorkbookReader reader;
    EXPECT_FALSE(reader.Open(DataFile("bomb.xlsx")));
    EXPECT_NE(reader.status().problem().message.find("bomb.xlsx"), std::string::npos);
    EXPECT_EQ(reader.SheetCount(), 0);

    ASSERT_TRUE(reader.Open(DataFile("series.xls")));
    EXPECT_FALSE(reader.ReadRows(3, [](int, const std::vector<RowCell>&) { return true; }));
    EXPECT_NE(reader.status().problem().message.find("no sheet 3"), std::string::npos) << reader.status().problem().message;
}

TEST(WorkbookReader, SheetNamesOfAnXlsxPackageAreDecoded)
{
    WorkbookReader reader;
    ASSERT_TRUE(reader.Open(DataFile("features.xlsx"))) << reader.status().problem().message;
    EXPECT_EQ(reader.SheetNames(), (std::vector<std::string>{"Data & more", "Second"}));
    std::vector<Row> rows = ReadAll(reader, 2);
    ASSERT_EQ(rows.size(), 1u);
    EXPECT_EQ(rows[0].number, 2);
    EXPECT_EQ(rows[0].cells[0].text, "-2.5");
}

TEST(WorkbookReader, NumbersGetTheirTextsOnlyInTheTextColumns)
{
    WorkbookReader reader;
    ASSERT_TRUE(reader.Open(MakeTwoSheetWorkbook())) << reader.status().problem().message;
    const std::vector<bool> onlyFirst = {false, true};
    std::vector<Row> rows;
    ASSERT_TRUE(reader.ReadRows(1, [&](int row, const std::vector<RowCell>& cells) {
        rows.push_back({row, cells});
        return true;
    }, &onlyFirst)) << reader.status().problem().message;
    ASSERT_EQ(rows.size(), 4u);
    EXPECT_EQ(rows[0].cells[1].text, "Flow"); // texts always come with their text
    EXPECT_EQ(rows[1].cells[0].text, "2021/05/17 12:00");
    EXPECT_EQ(rows[1].cells[1].text, "");
    EXPECT_EQ(rows[1].cells[1].value.number, 1.25);
    EXPECT_EQ(reader.DisplayedText(rows[1].cells[1]), "1.3"); // "0.0", half up
    EXPECT_EQ(reader.DisplayedText(rows[3].cells[0]), "FALSE");
}
