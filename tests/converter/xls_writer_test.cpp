// The .xls writer read back by other programs: xlrd (the system's Python) for values, texts, date
// cells, the title and the compound file of a large workbook; LibreOffice, when installed, for the
// workbook as a whole. Then the format's limits and the day numbers of the sheet's calendar.
#include "TestFiles.h"
#include "tests/tools/PythonTools.h"

#include "checksums/Crc32.h"
#include "converter/Converter.h"
#include "converter/StampText.h"
#include "converter/XlsSeriesWriter.h"
#include "formats/workbook/WorkbookReader.h"
#include "formats/xls/CompoundFile.h"
#include "templates/Specification.h"

#include <gtest/gtest.h>

#include <cmath>
#include <cstring>
#include <filesystem>
#include <limits>
#include <map>
#include <sstream>

using namespace converter;

namespace {

Stamp At(int year, int month, int day, int hour = 0, int minute = 0, int second = 0)
{
    return *StampFromFields(sys::DateTimeFields{year, month, day, hour, minute, second});
}

ItemInfo Item(std::string name, std::string type = "Rainfall", std::string unit = "mm")
{
    return ItemInfo{std::move(name), std::move(type), std::move(unit), "Accumulated"};
}

sys::Status WriteXls(const std::string& path, const SeriesHeader& header, const std::vector<Row>& rows,
                const std::string& title = "")
{
    XlsSeriesWriter writer;
    return convtest::WriteSeries(writer, path, header, rows, title);
}

// Every cell as xlrd sees it, one line each: "A1 <type> <value>" with numbers in hexadecimal
// (exact) and dates also by their number format; then "title <text>" from the summary stream.
const char* kXlrdDump = R"(
import sys, os, struct, xlrd
from xlrd import compdoc
path = sys.argv[1]
book = xlrd.open_workbook(path, formatting_info=True)
print("sheets", book.nsheets, book.sheet_by_index(0).name, book.datemode)
sheet = book.sheet_by_index(0)
kinds = {0: "empty", 1: "text", 2: "number", 3: "date", 4: "bool", 5: "error", 6: "blank"}
for r in range(sheet.nrows):
    for c in range(sheet.ncols):
        cell = sheet.cell(r, c)
        if cell.ctype in (0, 6):
            continue
        name = xlrd.formula.colname(c) + str(r + 1)
        if cell.ctype == 1:
            print(name, "text", cell.value)
        else:
            fmt = book.format_map[book.xf_list[cell.xf_index].format_key].format_str
            print(name, kinds[cell.ctype], float(cell.value).hex(), fmt)
doc = compdoc.CompDoc(open(path, "rb").read(), logfile=open(os.devnull, "w"))
stream = doc.get_named_stream("\x05SummaryInformation")
if stream:
    at = struct.unpack("<I", stream[44:48])[0]
    for i in range(struct.unpack("<I", stream[at + 4:at + 8])[0]):
        pid, offset = struct.unpack("<II", stream[at + 8 + 8 * i:at + 16 + 8 * i])
        kind = struct.unpack("<H", stream[at + offset:at + offset + 2])[0]
        if pid == 2 and kind == 0x1E:
            size = struct.unpack("<I", stream[at + offset + 4:at + offset + 8])[0]
            print("title", stream[at + offset + 8:at + offset + 7 + size].decode("cp1252"))
)";

// The lines of the dump as a map from the cell (or "title", "sheets") to the rest of the line.
std::map<std::string, std::string> Dump(const std::string& path)
{
    std::map<std::string, std::string> cells;
    const pytools::Result dump = pytools::Run(kXlrdDump, testsupport::ShellQuote(path));
    EXPECT_EQ(dump.status, 0) << dump.output;
    std::istringstream lines(dump.output);
    for (std::string line; std::getline(lines, line);) {
        const size_t gap = line.find(' ');
        if (gap != std::string::npos)
            cells[line.substr(0, gap)] = line.substr(gap + 1);
    }
    return cells;
}

// "number 0x1.8p+0 General" -> 1.5
double NumberOf(const std::string& dumped)
{
    const size_t start = dumped.find(' ') + 1;
    return std::strtod(dumped.substr(start, dumped.find(' ', start) - start).c_str(), nullptr);
}

} // namespace

TEST(XlsWriter, XlrdReadsValuesTextsDatesAndTheTitle)
{
    if (!pytools::Has("xlrd"))
        GTEST_SKIP() << "/usr/bin/python3 with xlrd is not available";
    testsupport::ScratchFolder folder;
    const std::string path = folder.File("out.xls");
    SeriesHeader header;
    header.timeTitle = "Zeit";
    header.items = {Item("Pegel \xD6hringen", "Water Level", "m"), Item("\xE6\xB0\xB4\xE4\xBD\x8D"), Item(""),
                    Item("Q", "", "")};
    const double inf = std::numeric_limits<double>::infinity();
    const std::vector<Row> rows = {
        {At(2021, 5, 17, 6), {0.1, -0.0, 1e300, 5e-324}},
        {At(2021, 5, 17, 6, 0, 1), {kMissing, 123456789012345678.0, inf, -42}},
    };
    ASSERT_TRUE(WriteXls(path, header, rows, "Pegel \xE2\x82\xAC Bericht"));
    std::map<std::string, std::string> cells = Dump(path);
    EXPECT_EQ(cells["sheets"], "1 Sheet1 0");
    EXPECT_EQ(cells["B1"], "text Water Level[m]:Accumulated");
    EXPECT_EQ(cells["E1"], "text Undefined[Undefined]:Accumulated");
    EXPECT_EQ(cells["A2"], "text Zeit");
    EXPECT_EQ(cells["B2"], "text Pegel \xC3\x96hringen"); // a Latin-1 byte becomes its character
    EXPECT_EQ(cells["C2"], "text \xE6\xB0\xB4\xE4\xBD\x8D");
    EXPECT_EQ(cells.count("D2"), 0u) << "an empty name stays a blank cell";
    EXPECT_EQ(cells["A3"].substr(0, 5), "date ");
    EXPECT_NE(cells["A3"].find(" yyyy/mm/dd hh:mm:ss"), std::string::npos) << cells["A3"];
    EXPECT_EQ(NumberOf(cells["A3"]), *SheetSerialFromStamp(rows[0].stamp));
    EXPECT_EQ(NumberOf(cells["A4"]), *SheetSerialFromStamp(rows[1].stamp));
    for (size_t r = 0; r < rows.size(); ++r)
        for (size_t v = 0; v < 4; ++v) {
            const std::string name = std::string(1, static_cast<char>('B' + v)) + std::to_string(r + 3);
            const double value = rows[r].values[v];
            if (!std::isfinite(value)) {
                EXPECT_EQ(cells.count(name), 0u) << name << " is blank";
                continue;
            }
            ASSERT_EQ(cells[name].substr(0, 7), "number ") << name;
            const double read = NumberOf(cells[name]);
            EXPECT_EQ(std::memcmp(&read, &value, sizeof read), 0) << name << " " << cells[name];
        }
    EXPECT_EQ(cells["title"], "Pegel \xE2\x82\xAC Bericht"); // through Windows-1252
}

// 65,534 data rows of 20 values: a 25 MB stream whose allocation table takes 379 sectors, so its
// DIFAT chain runs over three sectors. xlrd's compound-file reader and ours give back the very
// stream that was written.
TEST(XlsWriter, ALargeWorkbookIsACompoundFileOtherReadersFollow)
{
    if (!pytools::Has("xlrd"))
        GTEST_SKIP() << "/usr/bin/python3 with xlrd is not available";
    testsupport::ScratchFolder folder;
    const std::string path = folder.File("large.xls");
    SeriesHeader header;
    for (int i = 0; i < 20; ++i)
        header.items.push_back(Item("V" + std::to_string(i)));
    XlsSeriesWriter writer;
    ASSERT_TRUE(writer.Begin(path, header, "Large"));
    Row row;
    row.values.resize(20);
    for (int r = 0; r < 65534; ++r) {
        row.stamp = At(2020, 1, 1) + r * 60LL;
        for (int v = 0; v < 20; ++v)
            row.values[static_cast<size_t>(v)] = r * 0.5 + v;
        ASSERT_TRUE(writer.Write(row));
    }
    ASSERT_TRUE(writer.Finish());

    const pytools::Result streams = pytools::Run(R"(
import sys, os, struct, zlib, xlrd
from xlrd import compdoc
data = open(sys.argv[1], "rb").read()
print("difat", struct.unpack("<I", data[72:76])[0])
doc = compdoc.CompDoc(data, logfile=open(os.devnull, "w"))
book = doc.get_named_stream("Workbook")
print("workbook", len(book), zlib.crc32(book))
)",
                                                 testsupport::ShellQuote(path));
    ASSERT_EQ(streams.status, 0) << streams.output;
    sheet::CompoundFile ours(path);
    const std::vector<unsigned char> stream = ours.Read(*ours.Find("Workbook"));
    EXPECT_EQ(streams.output, "difat 3\nworkbook " + std::to_string(stream.size()) + " " +
                                  std::to_string(checksum::Crc32(0, stream.data(), stream.size())) + "\n");

    sheet::WorkbookReader reader;
    ASSERT_TRUE(reader.Open(path)) << reader.status().problem().message;
    int rows = 0;
    std::vector<sheet::RowCell> last;
    ASSERT_TRUE(reader.ReadRows(1, [&](int number, const std::vector<sheet::RowCell>& cells) {
        rows = number;
        last = cells;
        return true;
    })) << reader.status().problem().message;
    EXPECT_EQ(rows, 65536);
    ASSERT_EQ(last.size(), 21u);
    EXPECT_EQ(last[0].text, "2020/02/15 12:13:00");
    EXPECT_EQ(last[20].value.number, 65533 * 0.5 + 19);
}

TEST(XlsWriter, LibreOfficeReadsTheWorkbook)
{
    if (std::system("command -v soffice >/dev/null 2>&1") != 0)
        GTEST_SKIP() << "LibreOffice (soffice) is not installed";
    testsupport::ScratchFolder folder;
    const std::string path = folder.File("office.xls");
    SeriesHeader header;
    header.timeTitle = "Date/time";
    header.items = {Item("Rain"), Item("Level", "Water Level", "m")};
    const std::vector<Row> rows = {
        {At(2021, 5, 17, 6), {0.1, 2.5}},
        {At(2021, 5, 17, 7, 30, 15), {kMissing, -1e-7}},
        {At(1900, 3, 1), {123456.75, 0}},
    };
    ASSERT_TRUE(WriteXls(path, header, rows, "Title"));
    // LibreOffice reads the .xls and writes it again as .xlsx, which our reader reads back.
    const std::string command = "cd " + testsupport::ShellQuote(folder.Path()) +
                                " && timeout 120 soffice --headless --norestore -env:UserInstallation=file://" +
                                folder.Path() + "/profile --convert-to xlsx office.xls >convert.log 2>&1";
    ASSERT_EQ(std::system(command.c_str()), 0) << testsupport::ReadFile(folder.File("convert.log"));
    ASSERT_TRUE(std::filesystem::exists(folder.File("office.xlsx"))) << testsupport::ReadFile(folder.File("convert.log"));

    sys::Status status;
    std::unique_ptr<CSpecification> spec = LoadTemplate(sys::FileFormat::Excel, "", status);
    std::unique_ptr<SeriesReader> reader = MakeReader(sys::FileFormat::Excel, spec.get());
    ASSERT_TRUE(reader->Open(folder.File("office.xlsx"))) << reader->status().problem().Describe();
    EXPECT_EQ(reader->Header().timeTitle, "Date/time");
    ASSERT_EQ(reader->Header().items.size(), 2u);
    EXPECT_EQ(reader->Header().items[1].name, "Level");
    EXPECT_EQ(reader->Header().items[1].type, "Water Level");
    Row row;
    for (const Row& expected : rows) {
        ASSERT_TRUE(reader->Next(row)) << reader->status().problem().Describe();
        EXPECT_EQ(FormatStamp(row.stamp), FormatStamp(expected.stamp));
        for (size_t v = 0; v < 2; ++v) {
            if (IsMissing(expected.values[v]))
                EXPECT_TRUE(IsMissing(row.values[v]));
            else
                EXPECT_EQ(row.values[v], expected.values[v]);
        }
    }
    EXPECT_FALSE(reader->Next(row));
}

// 65,536 rows and 256 columns a sheet: more items fail before the file exists, more rows at the
// row that does not fit, and a conversion then leaves no output.
TEST(XlsWriter, TheFormatsLimitsGiveClearErrors)
{
    testsupport::ScratchFolder folder;
    SeriesHeader wide;
    wide.items.assign(256, Item("x"));
    XlsSeriesWriter tooWide;
    const sys::Status refused = tooWide.Begin(folder.File("wide.xls"), wide, "");
    EXPECT_FALSE(refused);
    EXPECT_EQ(refused.problem().message, "256 items do not fit the 255 value columns of an .xls sheet (.xlsx holds 16,383)");
    EXPECT_FALSE(std::filesystem::exists(folder.File("wide.xls")));
    wide.items.resize(255);
    EXPECT_TRUE(WriteXls(folder.File("widest.xls"), wide, {{At(2020, 1, 1), std::vector<double>(255, 1.0)}}));

    // The text holds 65,535 data rows, one more than the sheet has room for below its two header rows.
    std::string text = "Undefined[Undefined]:Instantaneous\nDate/time\tV\n";
    for (int r = 0; r < 65535; ++r)
        text += FormatStamp(At(2020, 1, 1) + r * 60LL) + "\t" + std::to_string(r) + "\n";
    testsupport::WriteFile(folder.File("long.txt"), text);
    sys::Status status;
    std::unique_ptr<CSpecification> spec = LoadTemplate(sys::FileFormat::Ascii, "", status);
    FileJob job{sys::FileFormat::Ascii, folder.File("long.txt"), spec.get(), {}, sys::FileFormat::Excel, folder.File("long.xls"), ""};
    const FileReport report = ConvertFile(job);
    EXPECT_FALSE(report.converted);
    EXPECT_NE(report.problem.message.find("more rows than an .xls sheet holds (65536 with the two header rows)"),
              std::string::npos)
        << report.problem.Describe();
    EXPECT_FALSE(std::filesystem::exists(folder.File("long.xls")));
    for (const auto& entry : std::filesystem::directory_iterator(folder.Path()))
        EXPECT_EQ(entry.path().filename().string().find(".part-"), std::string::npos) << entry.path();

    // One row fewer fits, and reads back whole.
    text.resize(text.rfind('\n', text.size() - 2) + 1);
    testsupport::WriteFile(folder.File("long.txt"), text);
    const FileReport fits = ConvertFile(job);
    ASSERT_TRUE(fits.converted) << fits.problem.Describe();
    std::unique_ptr<CSpecification> excel = LoadTemplate(sys::FileFormat::Excel, "", status);
    FileJob back{sys::FileFormat::Excel, folder.File("long.xls"), excel.get(), {}, sys::FileFormat::Ascii, folder.File("back.txt"), ""};
    ASSERT_TRUE(ConvertFile(back).converted);
    EXPECT_EQ(testsupport::ReadFile(folder.File("back.txt")), text);
}

// The sheet's calendar has a 29 February 1900: 1 January 1900 is day 1, 1 March day 61. Stamps
// before 1900, which a sheet cannot show as dates, are texts both readers take back.
TEST(ExcelOutput, StampsGetTheSheetsOwnDayNumbers)
{
    if (!pytools::Has("xlrd openpyxl"))
        GTEST_SKIP() << "/usr/bin/python3 with xlrd and openpyxl is not available";
    testsupport::ScratchFolder folder;
    std::string text = "Undefined[Undefined]:Instantaneous\nDate/time\tV\n";
    const char* stamps[] = {"0100/01/01 00:00:00", "1899/12/31 23:00:00", "1900/01/01 12:00:00", "1900/02/28 00:00:00",
                            "1900/03/01 06:00:00", "2021/05/17 00:00:00"};
    for (const char* stamp : stamps)
        text += std::string(stamp) + "\t1\n";
    testsupport::WriteFile(folder.File("in.txt"), text);
    sys::Status status;
    std::unique_ptr<CSpecification> ascii = LoadTemplate(sys::FileFormat::Ascii, "", status);
    std::unique_ptr<CSpecification> excel = LoadTemplate(sys::FileFormat::Excel, "", status);
    for (const char* extension : {".xls", ".xlsx"}) {
        SCOPED_TRACE(extension);
        const std::string out = folder.File(std::string("out") + extension);
        FileJob job{sys::FileFormat::Ascii, folder.File("in.txt"), ascii.get(), {}, sys::FileFormat::Excel, out, ""};
        ASSERT_TRUE(ConvertFile(job).converted);
        // The other tools' view: xlrd's raw day numbers, openpyxl's dates (it knows the calendar).
        const pytools::Result read = pytools::Run(std::string(extension) == ".xls" ? R"(
import sys, xlrd
sheet = xlrd.open_workbook(sys.argv[1]).sheet_by_index(0)
for r in range(2, sheet.nrows):
    print(repr(sheet.cell_value(r, 0)))
)"
                                                                                   : R"(
import sys, openpyxl
sheet = openpyxl.load_workbook(sys.argv[1]).active
for r in range(3, sheet.max_row + 1):
    v = sheet.cell(r, 1).value
    print(v if isinstance(v, str) else v.strftime("%Y/%m/%d %H:%M:%S"))
)",
                                                  testsupport::ShellQuote(out));
        ASSERT_EQ(read.status, 0) << read.output;
        EXPECT_EQ(read.output, std::string(extension) == ".xls"
                                   ? "'0100/01/01 00:00:00'\n'1899/12/31 23:00:00'\n1.5\n59.0\n61.25\n44333.0\n"
                                   : "0100/01/01 00:00:00\n1899/12/31 23:00:00\n1900/01/01 12:00:00\n"
                                     "1900/02/28 00:00:00\n1900/03/01 06:00:00\n2021/05/17 00:00:00\n");
        FileJob back{sys::FileFormat::Excel, out, excel.get(), {}, sys::FileFormat::Ascii, folder.File("back.txt"), ""};
        const FileReport report = ConvertFile(back);
        ASSERT_TRUE(report.converted) << report.problem.Describe();
        EXPECT_EQ(testsupport::ReadFile(folder.File("back.txt")), text);
    }
}
