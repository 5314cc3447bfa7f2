// Workbooks other tools write, read by the preview parser and by the engine: both must find the same
// data rows, end the data at the same row, and read sheets of any size. The sheets come from
// openpyxl (the system's Python) and libxlsxwriter.
#include "XlsxFile.h"
#include "tests/support/ScratchFolder.h"
#include "tests/tools/PythonTools.h"

#include "converter/ConversionJob.h"
#include "converter/Converter.h"
#include "parsers/ExcelFilePreviewParser.h"
#include "platform/spreadsheet/SpreadsheetApplication.h"
#include "platform/system/FileSystem.h"
#include "templates/ExcelSpecification.h"

#include <gtest/gtest.h>

#include <filesystem>
#include <fstream>
#include <sstream>

namespace {

// Each sheet has the engine's layout: types, units and value types in row 1, names in row 2, data
// from row 3: one date-time and two values a row, then what the case puts below them.
const char* kEndOfDataSheets = R"(
import sys, datetime, openpyxl
folder = sys.argv[1]
def sheet(name, rows):
    book = openpyxl.Workbook()
    s = book.active
    s.append(["", "Rain[mm]:Accumulated", "Level[m]:Instantaneous"])
    s.append(["Date", "Rain", "Level"])
    for row in rows:
        s.append(row)
    book.save(folder + name + ".xlsx")
def data(n):
    return [[datetime.datetime(2021, 5, 17, h), h * 0.5, 10 + h] for h in range(n)]
sheet("to-the-end", data(5))
sheet("empty-row-then-note", data(3) + [[], ["Source: gauge 7"]])
sheet("blank-date-with-values", data(3) + [[None, 1, 2], [datetime.datetime(2021, 5, 18), 3, 4]])
sheet("note-below-data", data(3) + [["Total", 12, 34]])
sheet("date-formula-without-result", data(2) + [["=A4+1/24", "=B4*2", 7]])
sheet("first-row-is-no-date", [["n/a", 1, 2]] + data(2))
sheet("number-beyond-the-calendar", data(3) + [[1e10, 1, 2]])
sheet("twenty-ninth-of-february-1900", data(2) + [[60, 1, 2]])
)";

struct EngineRead {
    bool converted = false;
    std::uint64_t rows = 0;
    std::vector<std::string> notes;
    std::string problem;
};

EngineRead Convert(const std::string& input, const std::string& output)
{
    sys::Status status;
    std::unique_ptr<CSpecification> spec = converter::LoadTemplate(sys::FileFormat::Excel, "", status);
    converter::FileJob job{sys::FileFormat::Excel, input, spec.get(), {}, sys::FileFormat::Ascii, output, ""};
    const converter::FileReport report = converter::ConvertFile(job);
    return {report.converted, report.rows, report.notes, report.problem.Describe()};
}

class OtherWritersTest : public ::testing::Test {
protected:

    // The data rows the preview parser shows for `path` with a new template's defaults.
    int PreviewRows(const std::string& path)
    {
        CExcelSpecification spec;
        CExcelFilePreviewParser parser([] { return sheet::StartApplication(sheet::ApplicationSettings()); });
        parser.m_pSpecification = &spec;
        parser.SetFile(path);
        if (!parser.Parse(""))
            return -1;
        return static_cast<int>(parser.m_vecRows.size()) - 3; // after the three header rows
    }

    const testsupport::ScratchFolder m_scratch{"velmora-excel-writers"};
    const std::string m_folder = m_scratch.Path() + "/";
    ui::ScriptedUserInterface m_ui;
    ui::ScopedUserInterface m_scope {m_ui};
};

} // namespace

TEST_F(OtherWritersTest, PreviewAndEngineEndTheDataAtTheSameRow)
{
    if (!pytools::Has("openpyxl"))
        GTEST_SKIP() << "/usr/bin/python3 with openpyxl is not available";
    const pytools::Result made = pytools::Run(kEndOfDataSheets, testsupport::ShellQuote(m_folder));
    ASSERT_EQ(made.status, 0) << made.output;

    struct Case {
        const char* name;
        int rows;
        const char* note; // the note on where the data end, "" for none
    } cases[] = {
        {"to-the-end", 5, ""},
        {"empty-row-then-note", 3, "the data end at row 6, which is empty"},
        {"blank-date-with-values", 3, "the data end at row 6, whose date/time cell is empty"},
        {"note-below-data", 3, "the data end at row 6, whose date/time 'Total' cannot be read"},
        {"date-formula-without-result", 2, "the data end at row 5, whose date/time cell is empty"},
        {"number-beyond-the-calendar", 3, "the data end at row 6, whose date/time '10000000000' cannot be read"},
    };
    for (const Case& c : cases) {
        const std::string input = m_folder + c.name + ".xlsx";
        EXPECT_EQ(PreviewRows(input), c.rows) << c.name;
        const EngineRead engine = Convert(input, m_folder + c.name + ".txt");
        ASSERT_TRUE(engine.converted) << c.name << ": " << engine.problem;
        EXPECT_EQ(engine.rows, static_cast<std::uint64_t>(c.rows)) << c.name;
        std::string notes;
        for (const std::string& note : engine.notes)
            notes += note + "\n";
        if (*c.note == '\0')
            EXPECT_EQ(notes, "") << c.name;
        else
            EXPECT_NE(notes.find(c.note), std::string::npos) << c.name << ": " << notes;
    }

    // A data start row that holds no date/time shows no data rows; the engine refuses the file.
    const std::string misfit = m_folder + "first-row-is-no-date.xlsx";
    EXPECT_EQ(PreviewRows(misfit), 0);
    const EngineRead refused = Convert(misfit, m_folder + "misfit.txt");
    EXPECT_FALSE(refused.converted);
    EXPECT_NE(refused.problem.find(misfit + ":3: "), std::string::npos) << refused.problem;
    EXPECT_NE(refused.problem.find("'n/a'"), std::string::npos) << refused.problem;

    // Day 60 of the sheet's calendar is 29 February 1900, which no calendar has: the file fails.
    const std::string leap = m_folder + "twenty-ninth-of-february-1900.xlsx";
    const EngineRead failed = Convert(leap, m_folder + "leap.txt");
    EXPECT_FALSE(failed.converted);
    EXPECT_NE(failed.problem.find(leap + ":5: the date/time cell holds 29 February 1900"), std::string::npos)
        << failed.problem;
}

TEST_F(OtherWritersTest, FormulasWithoutResultAreEmptyValuesNamedOnceInTheLog)
{
    if (!pytools::Has("openpyxl"))
        GTEST_SKIP() << "/usr/bin/python3 with openpyxl is not available";
    const pytools::Result made = pytools::Run(R"(
import sys, datetime, openpyxl
book = openpyxl.Workbook()
s = book.active
s.append(["", "A[m]:Instantaneous", "B[m]:Instantaneous", "Sum[m]:Instantaneous"])
s.append(["Date", "A", "B", "Sum"])
for i in range(14):
    s.append([datetime.datetime(2021, 1, 1, i), i, 2, "=B%d+C%d" % (i + 3, i + 3)])
book.save(sys.argv[1])
)",
                                              testsupport::ShellQuote(m_folder + "sums.xlsx"));
    ASSERT_EQ(made.status, 0) << made.output;

    CExcelSpecification spec;
    CExcelFilePreviewParser parser([] { return sheet::StartApplication(sheet::ApplicationSettings()); });
    parser.m_pSpecification = &spec;
    parser.SetFile(m_folder + "sums.xlsx");
    ASSERT_EQ(parser.Parse(""), 1) << "the preview reads the workbook";
    ASSERT_EQ(parser.m_vecRows.size(), 3u + 14u);
    EXPECT_EQ(parser.m_vecRows[3], (ui::Row{"2021/01/01 00:00:00", "0", "2", ""}));

    const EngineRead engine = Convert(m_folder + "sums.xlsx", m_folder + "sums.txt");
    ASSERT_TRUE(engine.converted) << engine.problem;
    EXPECT_EQ(engine.rows, 14u);
    ASSERT_EQ(engine.notes.size(), 1u);
    EXPECT_EQ(engine.notes[0], "14 formula cells without a result (or with an empty one) read as empty: "
                               "D3, D4, D5, D6, D7, D8, D9, D10, D11, D12 and 4 more");
    std::ifstream text(m_folder + "sums.txt");
    std::stringstream content;
    content << text.rdbuf();
    EXPECT_NE(content.str().find("2021/01/01 13:00:00\t13\t2\t\n"), std::string::npos) << content.str();
}

// 100,000 rows of 11 cells, more than the object model hands out as one array: the preview reads
// the used range's size and the first rows only.
TEST_F(OtherWritersTest, PreviewOfASheetOfMoreThanAMillionCells)
{
    XlsxFile book("million_cells");
    book.Text(1, 2, "Undefined[Undefined]:Instantaneous");
    for (int column = 2; column <= 11; ++column) {
        book.Text(1, column, "Undefined[Undefined]:Instantaneous");
        book.Text(2, column, ("V" + std::to_string(column)).c_str());
    }
    book.Text(2, 1, "Date");
    for (int row = 3; row < 100003; ++row) {
        book.Number(row, 1, 44333 + row / 1440.0);
        for (int column = 2; column <= 11; ++column)
            book.Number(row, column, row + column);
    }
    book.Close();
    EXPECT_EQ(PreviewRows(book.path), 18);
    CExcelSpecification spec;
    CExcelFilePreviewParser parser([] { return sheet::StartApplication(sheet::ApplicationSettings()); });
    parser.m_pSpecification = &spec;
    parser.SetFile(book.path);
    int count = 0;
    CString message;
    ASSERT_EQ(parser.OpenWorkbook(book.path, message), 1);
    ASSERT_EQ(parser.GetItemCount(count), 1);
    EXPECT_EQ(count, 10);
    parser.CloseWorkbook();
}

// January and February 1900 as the sheet's own calendar numbers them (it has a 29 February), in
// workbooks of the 1900 and of the 1904 date system, written by openpyxl and by xlwt.
TEST_F(OtherWritersTest, StampsOfEitherDateSystemReadAsTheToolWroteThem)
{
    if (!pytools::Has("openpyxl xlwt"))
        GTEST_SKIP() << "/usr/bin/python3 with openpyxl and xlwt is not available";
    const pytools::Result made = pytools::Run(R"(
import sys, datetime, openpyxl, xlwt
from openpyxl.utils.datetime import CALENDAR_MAC_1904
folder = sys.argv[1]
stamps = [datetime.datetime(1900, 1, 1, 12), datetime.datetime(1900, 2, 28), datetime.datetime(1900, 3, 1, 6),
          datetime.datetime(1904, 1, 1, 12), datetime.datetime(2021, 5, 17, 23, 59, 59)]
for system in (1900, 1904):
    shown = [s for s in stamps if s.year >= system]
    book = openpyxl.Workbook()
    if system == 1904:
        book.epoch = CALENDAR_MAC_1904
    sheet = book.active
    sheet.append(["", "V[m]:Instantaneous"])
    sheet.append(["Date", "V"])
    for i, s in enumerate(shown):
        sheet.append([s, i])
    book.save("%sopenpyxl-%d.xlsx" % (folder, system))
    book = xlwt.Workbook()
    book.dates_1904 = system == 1904
    sheet = book.add_sheet("S")
    sheet.write(0, 1, "V[m]:Instantaneous")
    sheet.write(1, 0, "Date")
    sheet.write(1, 1, "V")
    date = xlwt.easyxf(num_format_str="yyyy-mm-dd hh:mm:ss")
    for i, s in enumerate(shown):
        sheet.write(i + 2, 0, s, date)
        sheet.write(i + 2, 1, i)
    book.save("%sxlwt-%d.xls" % (folder, system))
)",
                                              testsupport::ShellQuote(m_folder));
    ASSERT_EQ(made.status, 0) << made.output;
    const std::string all = "V[m]:Instantaneous\nDate\tV\n"
                            "1900/01/01 12:00:00\t0\n1900/02/28 00:00:00\t1\n1900/03/01 06:00:00\t2\n"
                            "1904/01/01 12:00:00\t3\n2021/05/17 23:59:59\t4\n";
    const std::string from1904 = "V[m]:Instantaneous\nDate\tV\n1904/01/01 12:00:00\t0\n2021/05/17 23:59:59\t1\n";
    for (const char* name : {"openpyxl-1900.xlsx", "xlwt-1900.xls", "openpyxl-1904.xlsx", "xlwt-1904.xls"}) {
        const EngineRead engine = Convert(m_folder + name, m_folder + "out.txt");
        ASSERT_TRUE(engine.converted) << name << ": " << engine.problem;
        std::ifstream text(m_folder + "out.txt");
        std::stringstream content;
        content << text.rdbuf();
        EXPECT_EQ(content.str(), std::string(name).find("1900") != std::string::npos ? all : from1904) << name;
    }
}

// The year of a stamp always has four digits in the preview, for the years 100 to 999 too.
TEST_F(OtherWritersTest, PreviewStampsHaveFourDigitYears)
{
    XlsxFile book("early_years");
    book.Text(1, 2, "V[m]:Instantaneous");
    book.Text(2, 1, "Date");
    book.Text(2, 2, "V");
    book.Number(3, 1, -657434); // 1 January 100, in automation days
    book.Number(3, 2, 1);
    book.Text(4, 1, "0999/12/31 23:00:00");
    book.Number(4, 2, 2);
    book.Close();
    CExcelSpecification spec;
    CExcelFilePreviewParser parser([] { return sheet::StartApplication(sheet::ApplicationSettings()); });
    parser.m_pSpecification = &spec;
    parser.SetFile(book.path);
    ASSERT_EQ(parser.Parse(""), 1);
    ASSERT_EQ(parser.m_vecRows.size(), 5u);
    EXPECT_EQ(parser.m_vecRows[3].front(), "0100/01/01 00:00:00");
    EXPECT_EQ(parser.m_vecRows[4].front(), "0999/12/31 23:00:00");
}

// 16,000 item columns: the engine and the preview read every name; the time this takes is measured
// in bench/excel_parser_bench.cpp (docs/performance.md).
TEST_F(OtherWritersTest, SixteenThousandColumnsAreReadWhole)
{
    XlsxFile book("wide_16000");
    book.Text(2, 1, "Date");
    for (int column = 2; column <= 16001; ++column) {
        book.Text(1, column, "Undefined[Undefined]:Instantaneous");
        book.Text(2, column, ("N" + std::to_string(column - 1)).c_str());
        book.Number(3, column, column);
    }
    book.Number(3, 1, 44333);
    book.Close();

    sys::Status status;
    std::unique_ptr<CSpecification> spec = converter::LoadTemplate(sys::FileFormat::Excel, "", status);
    std::unique_ptr<converter::SeriesReader> reader = converter::MakeReader(sys::FileFormat::Excel, spec.get());
    ASSERT_TRUE(reader->Open(book.path)) << reader->status().problem().Describe();
    ASSERT_EQ(reader->Header().items.size(), 16000u);
    EXPECT_EQ(reader->Header().items[0].name, "N1");
    EXPECT_EQ(reader->Header().items[15999].name, "N16000");
    converter::Row row;
    ASSERT_TRUE(reader->Next(row));
    EXPECT_EQ(row.values[15999], 16001);

    CExcelSpecification preview;
    CExcelFilePreviewParser parser([] { return sheet::StartApplication(sheet::ApplicationSettings()); });
    parser.m_pSpecification = &preview;
    parser.SetFile(book.path);
    ASSERT_EQ(parser.Parse(""), 1);
    ASSERT_EQ(parser.m_vecItemNames.size(), 16001u);
    EXPECT_EQ(parser.m_vecItemNames.back(), "N16000");
}

// A folder of workbooks as other tools write them, awkward ones among them: the engine converts
// every file it can and refuses the others, each by name and reason.
TEST_F(OtherWritersTest, AFolderOfOtherToolsWorkbooksConvertsWhatItCan)
{
    if (!pytools::Has("openpyxl xlwt"))
        GTEST_SKIP() << "/usr/bin/python3 with openpyxl and xlwt is not available";
    const std::string in = m_folder + "in/", out = m_folder + "out/";
    std::filesystem::create_directories(in);
    std::filesystem::create_directories(out);
    const pytools::Result made = pytools::Run(R"(
import sys, datetime, openpyxl, xlwt
from openpyxl.utils.datetime import CALENDAR_MAC_1904
folder = sys.argv[1]
def layout(sheet_append):
    sheet_append(["", "A[m]:Instantaneous", "B[m]:Instantaneous"])
    sheet_append(["Date", "A", "B"])
def openpyxl_book(name, rows, epoch=None):
    book = openpyxl.Workbook()
    if epoch:
        book.epoch = epoch
    layout(book.active.append)
    for row in rows:
        book.active.append(row)
    book.save(folder + name)
day = datetime.datetime(2021, 5, 17)
openpyxl_book("formulas.xlsx", [[day, 1, "=B3*2"], [day + datetime.timedelta(hours=1), 2, "=B4*2"]])
openpyxl_book("note-below.xlsx", [[day, 1, 2], [], ["Source: gauge 7"]])
openpyxl_book("dates-1904.xlsx", [[day, 1, 2]], CALENDAR_MAC_1904)
openpyxl_book("misfit.xlsx", [["n/a", 1, 2], [day, 1, 2]])
book = xlwt.Workbook()
sheet = book.add_sheet("Data")
sheet.write(1, 0, "Date")
for c in range(1, 12):
    sheet.write(0, c, "V[m]:Instantaneous")
    sheet.write(1, c, "V%d" % c)
date = xlwt.easyxf(num_format_str="yyyy/mm/dd hh:mm:ss")
for r in range(2, 65536):
    row = sheet.row(r)
    row.set_cell_date(0, day + datetime.timedelta(minutes=r), date)
    for c in range(1, 12):
        row.set_cell_number(c, r + c * 0.5)
    if r % 1000 == 0:
        sheet.flush_row_data()
book.save(folder + "large.xls")
)",
                                              testsupport::ShellQuote(in));
    ASSERT_EQ(made.status, 0) << made.output;
    // A copy of the large workbook whose DIFAT chain points out of the file.
    std::ifstream large(in + "large.xls", std::ios::binary);
    std::string bytes((std::istreambuf_iterator<char>(large)), std::istreambuf_iterator<char>());
    ASSERT_GT(bytes.size(), 512u);
    bytes[68] = bytes[69] = bytes[70] = '\x7F';
    std::ofstream(in + "damaged.xls", std::ios::binary) << bytes;

    converter::JobSetup setup;
    setup.inputType = 2;
    setup.inputFormat = 3;
    setup.inputFolder = in;
    setup.outputFormat = 2;
    setup.outputFolder = out;
    converter::ConversionLog log(m_folder + "run.log", nullptr);
    EXPECT_EQ(converter::RunJob(setup, log, {2, nullptr}), converter::kExitSomeFailed);
    std::ifstream logFile(m_folder + "run.log");
    std::stringstream text;
    text << logFile.rdbuf();
    for (const char* name : {"formulas", "note-below", "dates-1904", "large"})
        EXPECT_TRUE(std::filesystem::exists(out + name + ".txt")) << name << "\n" << text.str();
    for (const char* name : {"misfit", "damaged"})
        EXPECT_FALSE(std::filesystem::exists(out + name + ".txt")) << name;
    EXPECT_NE(text.str().find(in + "misfit.xlsx:3: "), std::string::npos) << text.str();
    EXPECT_NE(text.str().find(in + "damaged.xls: the compound file is damaged (its DIFAT chain leaves the file"),
              std::string::npos)
        << text.str();
    EXPECT_NE(text.str().find("converted " + in + "large.xls -> " + out + "large.txt: 65534 time steps"), std::string::npos)
        << text.str();
    EXPECT_NE(text.str().find("note: 2 formula cells without a result"), std::string::npos) << text.str();
    EXPECT_NE(text.str().find("4 converted, 2 skipped or failed"), std::string::npos) << text.str();
}
