// Workbooks other tools write, read through our readers: xlwt's large .xls files, whose allocation
// table runs on in DIFAT sectors; openpyxl's and xlwt's formulas, which carry no result; and the
// compound-file faults a DIFAT chain can have.
#include "tests/support/TestWorkbooks.h"
#include "tests/tools/PythonTools.h"

#include "formats/workbook/LittleEndian.h"
#include "formats/workbook/WorkbookReader.h"
#include "formats/xls/CompoundFileWriter.h"
#include "platform/spreadsheet/SpreadsheetApplication.h"

#include <gtest/gtest.h>

#include <fstream>
#include <sstream>

using namespace sheet;
using sheettest::TempFile;

namespace {

// Rows of 12 cells: a date, then r * 0.25 + c; 65,536 rows make a 7.5 MB file with one DIFAT sector.
const char* kXlwtRows = R"(
import sys, datetime, xlwt
path, rows, columns = sys.argv[1], int(sys.argv[2]), int(sys.argv[3])
book = xlwt.Workbook()
sheet = book.add_sheet("Data")
date = xlwt.easyxf(num_format_str="yyyy/mm/dd hh:mm:ss")
sheet.write(0, 0, "Date")
for c in range(1, columns):
    sheet.write(0, c, "V%d" % c)
start = datetime.datetime(2020, 1, 1)
for r in range(1, rows):
    row = sheet.row(r)
    row.set_cell_date(0, start + datetime.timedelta(minutes=r), date)
    for c in range(1, columns):
        row.set_cell_number(c, r * 0.25 + c)
    if r % 1000 == 0:
        sheet.flush_row_data()
book.save(path)
)";

std::string OpenFailure(const std::string& path)
{
    WorkbookReader reader;
    if (!reader.Open(path))
        return reader.status().problem().message;
    if (!reader.ReadRows(1, [](int, const std::vector<RowCell>&) { return true; }))
        return reader.status().problem().message;
    return "";
}

} // namespace

TEST(OtherWriters, XlwtWorkbookOf65536RowsReadsWholeThroughItsDifatChain)
{
    if (!pytools::Has("xlwt"))
        GTEST_SKIP() << "/usr/bin/python3 with xlwt is not available";
    const std::string path = TempFile("xlwt-65536.xls");
    const pytools::Result made = pytools::Run(kXlwtRows, testsupport::ShellQuote(path) + " 65536 12");
    ASSERT_EQ(made.status, 0) << made.output;
    const std::string bytes = testsupport::ReadFile(path);
    ASSERT_GE(bytes.size(), 512u);
    ASSERT_GE(Load32(reinterpret_cast<const unsigned char*>(bytes.data()) + 72), 1u) << "the file needs a DIFAT sector";

    WorkbookReader reader;
    ASSERT_TRUE(reader.Open(path)) << reader.status().problem().message;
    int rows = 0;
    std::vector<RowCell> last;
    ASSERT_TRUE(reader.ReadRows(1, [&](int row, const std::vector<RowCell>& cells) {
        EXPECT_EQ(row, rows + 1);
        rows = row;
        last = cells;
        return true;
    })) << reader.status().problem().message;
    EXPECT_EQ(rows, 65536);
    ASSERT_EQ(last.size(), 12u);
    EXPECT_EQ(last[0].text, "2020/02/15 12:15:00"); // 65,535 minutes on
    EXPECT_EQ(last[11].value.number, 65535 * 0.25 + 11);

    // The preview's way: the object model holds the first rows and the used range of all.
    auto app = StartApplication(ApplicationSettings());
    auto sheet = app->Workbooks()->Open(path)->Worksheets()->Item(1);
    auto used = sheet->UsedRange();
    EXPECT_EQ(used->RowCount(), 65536);
    EXPECT_EQ(used->ColumnCount(), 12);
    EXPECT_EQ(sheet->Range("L2")->Text().text, "11.25");
}

// A compound file whose allocation table needs more than the header's 109 sectors, written by our
// own writer, then damaged in its DIFAT fields. Each fault is named with the file.
TEST(OtherWriters, EveryFaultOfADifatChainIsNamed)
{
    const std::string base = TempFile("difat-base.xls");
    sheet::CompoundFileWriter writer;
    ASSERT_TRUE(writer.Open(base));
    const std::string block(1 << 20, 'x');
    for (int i = 0; i < 8; ++i) // 8 MiB: 16,384 sectors, 130 table sectors, one DIFAT sector
        ASSERT_TRUE(writer.Append(block));
    ASSERT_TRUE(writer.Close("Workbook"));
    const std::string good = testsupport::ReadFile(base);
    const auto field = [&](const std::string& bytes, size_t at) {
        return Load32(reinterpret_cast<const unsigned char*>(bytes.data()) + at);
    };
    const std::uint32_t difat = field(good, 68);
    ASSERT_EQ(field(good, 72), 1u);
    ASSERT_EQ(field(good, 44), 130u);
    const size_t difatNextAt = 512 + static_cast<size_t>(difat) * 512 + 508;

    struct Case {
        const char* name;
        std::vector<std::pair<size_t, std::uint32_t>> patches; // byte offset, new value
        std::string why;
    } cases[] = {
        {"loop.xls", {{44, 300}, {difatNextAt, difat}}, "its DIFAT chain comes back to sector " + std::to_string(difat)},
        {"short-chain.xls", {{44, 300}}, "its DIFAT chain ends after 236 of 300 allocation table sectors"},
        {"outside.xls", {{68, 0x00FFFFFF}}, "its DIFAT chain leaves the file at sector 16777215"},
        {"no-chain.xls", {{68, 0xFFFFFFFE}}, "its DIFAT chain ends after 109 of 130"},
        {"huge-table.xls", {{44, 0x7FFFFFFF}}, "its allocation table claims 2147483647 sectors of the file's"},
    };
    for (const Case& c : cases) {
        std::string bytes = good;
        for (const auto& [at, value] : c.patches)
            Store32(reinterpret_cast<unsigned char*>(bytes.data()) + at, value);
        const std::string path = TempFile(c.name);
        sheettest::WriteFile(path, bytes);
        const std::string message = OpenFailure(path);
        EXPECT_NE(message.find("Cannot open " + path + ": the compound file is damaged (" + c.why), std::string::npos)
            << c.name << ": " << message;
    }
    // The undamaged file opens (and then holds no workbook stream a reader knows).
    EXPECT_NE(OpenFailure(base).find("the workbook stream is damaged"), std::string::npos) << OpenFailure(base);
}

TEST(OtherWriters, OpenpyxlFormulasWithoutResultReadAsEmptyTexts)
{
    if (!pytools::Has("openpyxl"))
        GTEST_SKIP() << "/usr/bin/python3 with openpyxl is not available";
    const std::string path = TempFile("openpyxl-formulas.xlsx");
    const pytools::Result made = pytools::Run(R"(
import sys, datetime, openpyxl
book = openpyxl.Workbook()
sheet = book.active
sheet.append(["Date", "A", "B", "Sum"])
for i in range(3):
    sheet.append([datetime.datetime(2021, 1, 1, i), i, 2, "=B%d+C%d" % (i + 2, i + 2)])
book.save(sys.argv[1])
)",
                                              testsupport::ShellQuote(path));
    ASSERT_EQ(made.status, 0) << made.output;

    auto app = StartApplication(ApplicationSettings());
    auto sheet = app->Workbooks()->Open(path)->Worksheets()->Item(1);
    const Variant sum = sheet->Range("D2")->Value2();
    EXPECT_EQ(sum.type, Variant::Text);
    EXPECT_EQ(sum.text, "");
    EXPECT_EQ(sheet->UsedRange()->ColumnCount(), 4);

    WorkbookReader reader;
    ASSERT_TRUE(reader.Open(path)) << reader.status().problem().message;
    std::vector<std::string> marked;
    ASSERT_TRUE(reader.ReadRows(1, [&](int row, const std::vector<RowCell>& cells) {
        for (const RowCell& cell : cells)
            if (cell.formulaWithoutResult)
                marked.push_back(std::to_string(row) + ":" + std::to_string(cell.column));
        return true;
    })) << reader.status().problem().message;
    EXPECT_EQ(marked, (std::vector<std::string>{"2:4", "3:4", "4:4"}));
}

TEST(OtherWriters, XlwtFormulasCarryAnEmptyResult)
{
    if (!pytools::Has("xlwt"))
        GTEST_SKIP() << "/usr/bin/python3 with xlwt is not available";
    const std::string path = TempFile("xlwt-formulas.xls");
    const pytools::Result made = pytools::Run(R"(
import sys, xlwt
book = xlwt.Workbook()
sheet = book.add_sheet("S")
sheet.write(0, 0, 1.5)
sheet.write(0, 1, xlwt.Formula("A1*2"))
book.save(sys.argv[1])
)",
                                              testsupport::ShellQuote(path));
    ASSERT_EQ(made.status, 0) << made.output;
    WorkbookReader reader;
    ASSERT_TRUE(reader.Open(path)) << reader.status().problem().message;
    std::vector<RowCell> row;
    ASSERT_TRUE(reader.ReadRows(1, [&](int, const std::vector<RowCell>& cells) {
        row = cells;
        return true;
    })) << reader.status().problem().message;
    ASSERT_EQ(row.size(), 2u);
    EXPECT_EQ(row[1].value.type, Variant::Text);
    EXPECT_EQ(row[1].text, "");
    EXPECT_TRUE(row[1].formulaWithoutResult);
    EXPECT_FALSE(row[0].formulaWithoutResult);
}
