// The Excel parser on real .xlsx files written here with libxlsxwriter, read through the in-process
// spreadsheet application.
#include "XlsxFile.h"
#include "parsers/ExcelFilePreviewParser.h"
#include "platform/system/FileSystem.h"
#include "resources/StringTable.h"
#include "templates/ExcelSpecification.h"

#include <gtest/gtest.h>

#include <cstdlib>
#include <optional>
#include <unistd.h>

namespace {

using Strings = std::vector<std::string>;

// Sets an environment variable for one scope.
class ScopedEnv {
public:
    ScopedEnv(const char* name, const char* value) : m_name(name)
    {
        if (const char* old = std::getenv(name))
            m_old = old;
        ::setenv(name, value, 1);
    }
    ~ScopedEnv()
    {
        if (m_old)
            ::setenv(m_name, m_old->c_str(), 1);
        else
            ::unsetenv(m_name);
    }

private:
    const char* m_name;
    std::optional<std::string> m_old;
};

class ExcelWorkbookTest : public ::testing::Test {
protected:
    ExcelWorkbookTest()
    {
        m_spec.m_DataDesc.m_nUnitTypeOption = 0;
        m_spec.m_DataDesc.m_nUnitOption = 0;
        m_spec.m_DataDesc.m_nValueTypeOption = 0;
        m_parser.m_pSpecification = &m_spec;
    }

    int Parse(XlsxFile& file)
    {
        file.Close();
        m_parser.SetFile(file.path);
        return m_parser.Parse("");
    }

    ui::ScriptedUserInterface m_ui;
    ui::ScopedUserInterface m_scope {m_ui};
    CExcelSpecification m_spec;
    CExcelFilePreviewParser m_parser;
};

TEST_F(ExcelWorkbookTest, DatesAndTwoDecimalValues)
{
    XlsxFile file("dates");
    file.Text(1, 1, "Gauge 12");
    file.Text(2, 1, "Date");
    file.Text(2, 2, "A");
    file.Text(2, 3, "B");
    for (int i = 0; i < 3; ++i) {
        file.Date(3 + i, 1, 2021, 5, 17 + i);
        file.Number(3 + i, 2, 1.5 + i);
        file.Number(3 + i, 3, 10.0 / 3.0);
    }
    ASSERT_TRUE(m_parser.HasApplication());
    ASSERT_EQ(Parse(file), 1) << (m_ui.boxes.empty() ? "" : m_ui.boxes[0].text);
    EXPECT_EQ(m_parser.m_vecItemNames, (Strings {"DateTime", "A", "B"}));
    ASSERT_EQ(m_parser.m_vecRows.size(), 6u);
    EXPECT_EQ(m_parser.m_vecRows[3], (Strings {"2021/05/17 00:00:00", "1.50", "3.33"}));
    EXPECT_EQ(m_parser.m_vecRows[5], (Strings {"2021/05/19 00:00:00", "3.50", "3.33"}));
    ASSERT_EQ(m_parser.m_vecRawLines.size(), 5u);
    EXPECT_EQ(m_parser.m_vecRawLines[2], (Strings {"2021/05/17", "1.50", "3.33"}));
}

TEST_F(ExcelWorkbookTest, DateAndTimeCellsJoinedByTheFormat)
{
    XlsxFile file("joined");
    file.Text(2, 1, "Date");
    file.Text(2, 2, "Time");
    file.Text(2, 3, "A");
    file.Date(3, 1, 2021, 5, 17);
    file.Time(3, 2, 10, 20, 30);
    file.Number(3, 3, 7);
    m_spec.m_TimeDesc.m_bUseDTFormat = 1;
    m_spec.m_TimeDesc.m_strDateTimeFormat = "YYYY/MM/DD|HH:mm:ss";
    ASSERT_EQ(Parse(file), 1);
    EXPECT_EQ(m_parser.m_vecItemNames, (Strings {"DateTime", "A"}));
    EXPECT_EQ(m_parser.m_vecRows.back(), (Strings {"2021/05/17 10:20:30", "7.00"}));
}

TEST_F(ExcelWorkbookTest, SecondSheetAndMissingThirdSheet)
{
    XlsxFile file("sheets");
    file.Text(1, 1, "first sheet", 1);
    file.Text(2, 1, "Date", 2);
    file.Text(2, 2, "Level", 2);
    file.Text(3, 1, "2021-05-17 06:00:00", 2);
    file.Text(3, 2, "4.25", 2);
    m_spec.m_DataDesc.m_nExcelSheet = 2;
    ASSERT_EQ(Parse(file), 1);
    EXPECT_EQ(m_parser.m_vecRows.back(), (Strings {"2021/05/17 06:00:00", "4.25"}));

    m_spec.m_DataDesc.m_nExcelSheet = 3;
    EXPECT_EQ(m_parser.Parse(""), 0);
    ASSERT_EQ(m_ui.boxes.size(), 1u);
    EXPECT_EQ(m_ui.boxes[0].text, res::LoadString(res::IDS_SHEET_INDEX_TOO_LARGE));
}

TEST_F(ExcelWorkbookTest, ColumnsBeyondZZAreRead)
{
    // 703 used columns: the date in A, items in B..AAA.
    XlsxFile file("wide");
    file.Text(2, 1, "Date");
    file.Date(3, 1, 2021, 5, 17);
    for (int column = 2; column <= 703; ++column) {
        file.Text(2, column, ("I" + std::to_string(column)).c_str());
        file.Number(3, column, column);
    }
    ASSERT_EQ(Parse(file), 1);
    ASSERT_EQ(m_parser.m_vecItemNames.size(), 703u);
    EXPECT_EQ(m_parser.m_vecItemNames[701], "I702");
    EXPECT_EQ(m_parser.m_vecItemNames[702], "I703");
    ASSERT_EQ(m_parser.m_vecRows.back().size(), 703u);
    EXPECT_EQ(m_parser.m_vecRows.back()[702], "703.00");
}

TEST_F(ExcelWorkbookTest, RawLinesOfAnUnreadableLayout)
{
    XlsxFile file("raw");
    file.Text(1, 2, "no dates here");
    file.Text(2, 3, "x");
    m_parser.m_pSpecification = nullptr;
    file.Close();
    ASSERT_EQ(m_parser.ReadRawLines(file.path), 1);
    ASSERT_EQ(m_parser.m_vecRawLines.size(), 20u);
    EXPECT_EQ(m_parser.m_vecRawLines[0], (Strings {"", "no dates here", ""}));
    EXPECT_EQ(m_parser.m_vecRawLines[1], (Strings {"", "", "x"}));
}

TEST_F(ExcelWorkbookTest, FileThatIsNoWorkbook)
{
    XlsxFile file("broken");
    file.Close();
    {
        FILE* out = std::fopen(file.path.c_str(), "wb");
        ASSERT_NE(out, nullptr);
        std::fputs("PK\x03\x04 this is not a workbook", out);
        std::fclose(out);
    }
    CString message;
    EXPECT_EQ(m_parser.OpenWorkbook(file.path, message), 0);
    EXPECT_EQ(message, "Failed to open file: " + file.path);
    m_parser.SetFile(file.path);
    EXPECT_EQ(m_parser.Parse(""), 0);
    EXPECT_EQ(m_parser.ReadRawLines(""), 0);
    EXPECT_TRUE(m_ui.boxes.empty());
}

TEST(ExcelVersionOfTheApplication, FromTheEnvironment)
{
    {
        ScopedEnv absent("VELMORA_SPREADSHEET", "absent");
        EXPECT_EQ(GetExcelVersion(), 10);
        CExcelFilePreviewParser parser;
        EXPECT_FALSE(parser.HasApplication());
    }
    ScopedEnv present("VELMORA_SPREADSHEET", "present");
    {
        ScopedEnv version("VELMORA_SPREADSHEET_VERSION", "11.0");
        EXPECT_EQ(GetExcelVersion(), 11);
    }
    EXPECT_GE(GetExcelVersion(), 12);
}

} // namespace
