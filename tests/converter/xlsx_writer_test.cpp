// The .xlsx writer read back by our own workbook reader (through the Excel series reader and the
// spreadsheet object model) and unpacked part by part: values bit for bit, stamps, header texts
// with XML specials and non-ASCII, wide sheets, the grid's limits and write failures.
#include "TestFiles.h"
#include "ZipContents.h"
#include "converter/ConversionJob.h"
#include "converter/Converter.h"
#include "converter/StampText.h"
#include "converter/XlsxSeriesWriter.h"
#include "formats/xlsx/XlsxParts.h"
#include "platform/spreadsheet/Spreadsheet.h"
#include "platform/spreadsheet/SpreadsheetApplication.h"
#include "templates/Specification.h"

#include <gtest/gtest.h>

#include <charconv>
#include <cstring>
#include <map>
#include <filesystem>
#include <limits>
#include <regex>

using namespace converter;

namespace {

struct ReadBack {
    SeriesHeader header;
    std::vector<Row> rows;
    std::string problem;
};

Stamp At(int year, int month, int day, int hour = 0, int minute = 0, int second = 0)
{
    return *StampFromFields(sys::DateTimeFields{year, month, day, hour, minute, second});
}

sys::Status WriteWorkbook(const std::string& path, const SeriesHeader& header, const std::vector<Row>& rows,
                     const std::string& title = "")
{
    XlsxSeriesWriter writer;
    return convtest::WriteSeries(writer, path, header, rows, title);
}

ReadBack ReadWorkbook(const std::string& path)
{
    ReadBack back;
    sys::Status status;
    std::unique_ptr<CSpecification> spec = LoadTemplate(sys::FileFormat::Excel, "", status);
    std::unique_ptr<SeriesReader> reader = MakeReader(sys::FileFormat::Excel, spec.get());
    status = reader->Open(path);
    if (!status) {
        back.problem = status.problem().Describe();
        return back;
    }
    back.header = reader->Header();
    Row row;
    while (reader->Next(row))
        back.rows.push_back(row);
    if (!reader->status())
        back.problem = reader->status().problem().Describe();
    return back;
}

// The displayed text of one cell, or "<blank>".
std::string CellText(sheet::Worksheet& sheet, const std::string& cell)
{
    const sheet::Variant value = sheet.Range(cell)->Value2();
    return value.IsEmpty() ? "<blank>" : sheet.Range(cell)->Text().text;
}

std::shared_ptr<sheet::Worksheet> OpenSheet(const std::string& path)
{
    static std::shared_ptr<sheet::Application> application = sheet::StartApplication(sheet::ApplicationSettings{});
    return application->Workbooks()->Open(path)->Worksheets()->Item(1);
}

bool SameBits(double a, double b) { return std::memcmp(&a, &b, sizeof a) == 0; }

ItemInfo Item(std::string name, std::string type = "Rainfall", std::string unit = "mm",
              std::string valueType = "Accumulated")
{
    return ItemInfo{std::move(name), std::move(type), std::move(unit), std::move(valueType)};
}

const double kInfinity = std::numeric_limits<double>::infinity();

// Rows whose values span the doubles: extremes, negative zero, 17 significant digits, integers
// beyond 2^53, missing and infinite values (no cell value for either).
// Made on first use: the stamps need the calendar tables of another file's static data.
std::vector<Row> EdgeRows()
{
    return {
        {At(2020, 1, 1), {0.1, -0.0, 0.30000000000000004, 123456789012345678.0}},
        {At(1900, 3, 1, 0, 0, 1), {1.7976931348623157e308, -1.7976931348623157e308, 2.2250738585072014e-308, -42}},
        {At(1970, 1, 1), {kMissing, 1e-7, -9007199254740993.0, 5e-324}},
        {At(2038, 1, 19, 3, 14, 8), {kMissing, kMissing, kMissing, kMissing}},
        {At(9999, 12, 31, 23, 59, 59), {kInfinity, -kInfinity, 1e15, 14.846129999999999}},
    };
}

SeriesHeader FourItems()
{
    SeriesHeader header;
    header.items = {Item("a"), Item("b"), Item("c"), Item("d")};
    return header;
}

} // namespace

TEST(XlsxWriter, CellsHoldTheShortestTextOfEachValueExactly)
{
    testsupport::ScratchFolder folder;
    const std::string path = folder.File("values.xlsx");
    const std::vector<Row> rows = EdgeRows();
    ASSERT_TRUE(WriteWorkbook(path, FourItems(), rows));
    const convtest::ZipContents zip = convtest::Unzip(testsupport::ReadFile(path));
    ASSERT_EQ(zip.error, "");
    const std::string& sheetXml = zip.parts.at("xl/worksheets/sheet1.xml");
    std::map<std::string, std::string> cells; // "B3" -> the value's text
    const std::regex cell("<c r=\"([A-Z]+[0-9]+)\"(?: s=\"1\")?><v>([^<]*)</v></c>");
    for (auto it = std::sregex_iterator(sheetXml.begin(), sheetXml.end(), cell); it != std::sregex_iterator(); ++it)
        cells[(*it)[1]] = (*it)[2];
    for (size_t r = 0; r < rows.size(); ++r) {
        const std::string row = std::to_string(r + 3);
        ASSERT_TRUE(cells.count("A" + row)) << row;
        EXPECT_TRUE(SameBits(std::strtod(cells["A" + row].c_str(), nullptr), *SheetSerialFromStamp(rows[r].stamp))) << row;
        for (size_t v = 0; v < 4; ++v) {
            const std::string name = std::string(1, static_cast<char>('B' + v)) + row;
            const double value = rows[r].values[v];
            if (!std::isfinite(value)) {
                EXPECT_EQ(cells.count(name), 0u) << name << " is blank";
                continue;
            }
            ASSERT_TRUE(cells.count(name)) << name;
            EXPECT_TRUE(SameBits(std::strtod(cells[name].c_str(), nullptr), value)) << name << " " << cells[name];
            char shortest[40];
            *std::to_chars(shortest, shortest + sizeof shortest, value).ptr = '\0';
            EXPECT_LE(cells[name].size(), std::strlen(shortest)) << name << " " << cells[name];
        }
    }
}

TEST(XlsxWriter, ValuesAndStampsReadBackThroughOurReader)
{
    testsupport::ScratchFolder folder;
    const std::string path = folder.File("values.xlsx");
    const std::vector<Row> rows = EdgeRows();
    ASSERT_TRUE(WriteWorkbook(path, FourItems(), rows));
    const ReadBack back = ReadWorkbook(path);
    ASSERT_EQ(back.problem, "");
    ASSERT_EQ(back.rows.size(), rows.size());
    for (size_t r = 0; r < rows.size(); ++r) {
        EXPECT_EQ(FormatStamp(back.rows[r].stamp), FormatStamp(rows[r].stamp)) << "row " << r;
        ASSERT_EQ(back.rows[r].values.size(), 4u);
        for (size_t v = 0; v < 4; ++v) {
            const double written = rows[r].values[v];
            const double read = back.rows[r].values[v];
            if (!std::isfinite(written)) {
                EXPECT_TRUE(IsMissing(read)) << "row " << r << " item " << v;
                continue;
            }
            // The workbook reader's own number parsing may miss the last digit of 17 and loses
            // values near the bottom of the double range; the cell text itself is exact (above).
            if (std::fabs(written) < 1e-290)
                continue;
            EXPECT_NEAR(read, written, std::fabs(written) * 4e-16) << "row " << r << " item " << v;
            EXPECT_EQ(std::signbit(read), std::signbit(written)) << "row " << r << " item " << v;
        }
    }
}

TEST(XlsxWriter, HeaderTextsAreSharedStringsThatReadBack)
{
    testsupport::ScratchFolder folder;
    SeriesHeader header;
    header.timeTitle = "Zeit & Datum";
    struct Case {
        ItemInfo item;
        const char* nameCell;     // as the sheet shows it
        const char* metadataCell;
    } cases[] = {
        {Item("<Rain & \"snow\">'"), "<Rain & \"snow\">'", "Rainfall[mm]:Accumulated"},
        {Item("Température °C", "Water Level", "m", "Instantaneous"), "Température °C", "Water Level[m]:Instantaneous"},
        {Item("雨量"), "雨量", "Rainfall[mm]:Accumulated"},
        {Item(" padded "), " padded ", "Rainfall[mm]:Accumulated"},
        {Item("bell\x07tab\tend"), "bell tab\tend", "Rainfall[mm]:Accumulated"},
        {Item("Temp\xE9rature \x80"), "Température €", "Rainfall[mm]:Accumulated"}, // Windows-1252
        {Item("", "", "", ""), "<blank>", "Undefined[Undefined]:Instantaneous"},
        {Item("odd", "Type[x]", "m:s", ""), "odd", "Type x [m s]:Instantaneous"},
    };
    for (const Case& c : cases)
        header.items.push_back(c.item);
    const std::string path = folder.File("header.xlsx");
    ASSERT_TRUE(WriteWorkbook(path, header, {{At(2021, 6, 30, 12, 30, 5), std::vector<double>(header.items.size(), 1.0)}}));

    std::shared_ptr<sheet::Worksheet> sheet = OpenSheet(path);
    EXPECT_EQ(CellText(*sheet, "A1"), "<blank>");
    EXPECT_EQ(CellText(*sheet, "A2"), "Zeit & Datum");
    EXPECT_EQ(CellText(*sheet, "A3"), "2021/06/30 12:30:05") << "the date cell's number format";
    for (size_t i = 0; i < std::size(cases); ++i) {
        const std::string column(1, static_cast<char>('B' + i));
        EXPECT_EQ(CellText(*sheet, column + "1"), cases[i].metadataCell) << column;
        EXPECT_EQ(CellText(*sheet, column + "2"), cases[i].nameCell) << column;
    }
    const ReadBack back = ReadWorkbook(path);
    ASSERT_EQ(back.problem, "");
    ASSERT_EQ(back.header.items.size(), std::size(cases));
    EXPECT_EQ(back.header.timeTitle, "Zeit & Datum");
    EXPECT_EQ(back.header.items[1].type, "Water Level");
    EXPECT_EQ(back.header.items[1].unit, "m");
    EXPECT_EQ(back.header.items[1].valueType, "Instantaneous");
}

TEST(XlsxWriter, ThreeHundredItemsReachPastColumnAZ)
{
    testsupport::ScratchFolder folder;
    SeriesHeader header;
    for (int column = 2; column <= 301; ++column)
        header.items.push_back(Item("item" + std::to_string(column)));
    std::vector<Row> rows;
    for (int r = 0; r < 3; ++r) {
        Row row{At(2022, 2, 28, 23, 0, r), {}};
        for (size_t i = 0; i < header.items.size(); ++i)
            row.values.push_back((i + 1) * 1000.0 + r);
        rows.push_back(row);
    }
    const std::string path = folder.File("wide.xlsx");
    ASSERT_TRUE(WriteWorkbook(path, header, rows));
    std::shared_ptr<sheet::Worksheet> sheet = OpenSheet(path);
    for (auto [cell, name] : {std::pair{"Z2", "item26"}, {"AA2", "item27"}, {"AZ2", "item52"}, {"BA2", "item53"},
                              {"KO2", "item301"}})
        EXPECT_EQ(CellText(*sheet, cell), name) << cell;
    EXPECT_EQ(CellText(*sheet, "KO5"), "300002");
    EXPECT_EQ(CellText(*sheet, "KP2"), "<blank>");
    const ReadBack back = ReadWorkbook(path);
    ASSERT_EQ(back.problem, "");
    ASSERT_EQ(back.header.items.size(), 300u);
    EXPECT_EQ(back.header.items[299].name, "item301");
    ASSERT_EQ(back.rows.size(), 3u);
    EXPECT_EQ(back.rows[2].values[299], 300002.0);
    EXPECT_EQ(back.rows[1].values[0], 1001.0);
}

TEST(XlsxWriter, PackageHoldsTheWorkbookPartsWithTitleAndUsedRange)
{
    testsupport::ScratchFolder folder;
    SeriesHeader header;
    header.items = {Item("x"), Item("y"), Item("x")};
    const std::vector<Row> rows(3, Row{At(2020, 5, 5), {1, kMissing, 3}});
    struct Case {
        std::string title;
        std::string expected; // dc:title element, empty for none
    } cases[] = {{"Rain & <snow>", "<dc:title>Rain &amp; &lt;snow&gt;</dc:title>"}, {"", ""}};
    for (const Case& c : cases) {
        const std::string path = folder.File("parts.xlsx");
        ASSERT_TRUE(WriteWorkbook(path, header, rows, c.title));
        const convtest::ZipContents zip = convtest::Unzip(testsupport::ReadFile(path));
        ASSERT_EQ(zip.error, "");
        std::vector<std::string> names;
        for (const auto& part : zip.parts)
            names.push_back(part.first);
        EXPECT_EQ(names, (std::vector<std::string>{"[Content_Types].xml", "_rels/.rels", "docProps/app.xml",
                                                   "docProps/core.xml", "xl/_rels/workbook.xml.rels",
                                                   "xl/sharedStrings.xml", "xl/styles.xml", "xl/workbook.xml",
                                                   "xl/worksheets/sheet1.xml"}));
        const std::string& core = zip.parts.at("docProps/core.xml");
        if (c.expected.empty())
            EXPECT_EQ(core.find("<dc:title>"), std::string::npos);
        else
            EXPECT_NE(core.find(c.expected), std::string::npos) << core;
        const std::string& sheetXml = zip.parts.at("xl/worksheets/sheet1.xml");
        EXPECT_TRUE(std::regex_search(sheetXml, std::regex("<dimension ref=\"A1:D5\" */>"))) << sheetXml.substr(0, 400);
        EXPECT_NE(sheetXml.find("<col min=\"1\" max=\"1\" width=\"20.7109375\" customWidth=\"1\"/>"), std::string::npos);
        EXPECT_EQ(sheetXml.find("<f>"), std::string::npos) << "no formulas";
        EXPECT_EQ(sheetXml.find("<c r=\"C3\""), std::string::npos) << "a missing value is no cell";
        // Every cell is placed by its reference.
        const std::regex cell("<c "), placedCell("<c r=\"[A-Z]+[0-9]+\"");
        const auto cells = std::distance(std::sregex_iterator(sheetXml.begin(), sheetXml.end(), cell), std::sregex_iterator());
        const auto placed =
            std::distance(std::sregex_iterator(sheetXml.begin(), sheetXml.end(), placedCell), std::sregex_iterator());
        EXPECT_EQ(cells, 3 + 4 + 3 * 3);
        EXPECT_EQ(placed, cells);
        // "x" twice and the same metadata three times are stored once each.
        EXPECT_NE(zip.parts.at("xl/sharedStrings.xml").find("count=\"7\" uniqueCount=\"4\""), std::string::npos);
    }
}

TEST(XlsxWriter, GridLimitsFailClearly)
{
    testsupport::ScratchFolder folder;
    SeriesHeader wide;
    wide.items.resize(XlsxSeriesWriter::kMaxColumns - 1, Item("v"));
    EXPECT_TRUE(WriteWorkbook(folder.File("widest.xlsx"), wide, {{0, std::vector<double>(wide.items.size(), 2.5)}}));
    wide.items.push_back(Item("one too many"));
    XlsxSeriesWriter tooWide;
    const sys::Status refused = tooWide.Begin(folder.File("too-wide.xlsx"), wide, "");
    ASSERT_FALSE(refused);
    EXPECT_EQ(refused.problem().message, "16384 items do not fit the 16383 value columns of a worksheet");

    SeriesHeader narrow;
    XlsxSeriesWriter tall;
    const std::string path = folder.File("tall.xlsx");
    ASSERT_TRUE(tall.Begin(path, narrow, ""));
    for (unsigned row = 2; row < XlsxSeriesWriter::kMaxRows; ++row)
        ASSERT_TRUE(tall.Write(Row{Stamp(row) * 60, {}})) << row;
    const sys::Status full = tall.Write(Row{0, {}});
    ASSERT_FALSE(full);
    EXPECT_EQ(full.problem().message, "more rows than a worksheet holds (1048576)");
    ASSERT_TRUE(tall.Finish());
    const convtest::ZipContents zip = convtest::Unzip(testsupport::ReadFile(path));
    ASSERT_EQ(zip.error, "");
    const std::string& sheetXml = zip.parts.at("xl/worksheets/sheet1.xml");
    EXPECT_TRUE(std::regex_search(sheetXml, std::regex("<dimension ref=\"A1:A1048576\" */>")));
    EXPECT_NE(sheetXml.find("<row r=\"1048576\"><c r=\"A1048576\" s=\"1\">"), std::string::npos);
}

TEST(XlsxWriter, WriteFailuresNameTheCauseAndLeaveNoOutput)
{
    SeriesHeader header;
    header.items = {Item("a"), Item("b")};
    std::vector<Row> rows(20000, Row{At(2020, 1, 1), {1.25, 2.5}});
    const sys::Status full = WriteWorkbook("/dev/full", header, rows);
    ASSERT_FALSE(full);
    EXPECT_EQ(full.problem().file, "/dev/full");
    EXPECT_NE(full.problem().message.find("No space left on device"), std::string::npos) << full.problem().message;

    testsupport::ScratchFolder folder;
    testsupport::WriteFile(folder.File("in.txt"), "Rainfall[mm]:Accumulated\nDate/time\tRain\n2020/01/01 00:00:00\t1\n");
    sys::Status status;
    std::unique_ptr<CSpecification> spec = LoadTemplate(sys::FileFormat::Ascii, "", status);
    const std::string output = folder.File("missing/out.xlsx");
    const FileReport report = ConvertFile(FileJob{sys::FileFormat::Ascii, folder.File("in.txt"), spec.get(), {}, sys::FileFormat::Excel, output, ""});
    EXPECT_FALSE(report.converted);
    EXPECT_NE(report.problem.message.find("No such file or directory"), std::string::npos) << report.problem.message;
    EXPECT_FALSE(std::filesystem::exists(folder.File("missing")));
}

TEST(XlsxWriter, TextsBecomeWellFormedXmlCharacters)
{
    const std::pair<std::string, std::string> cases[] = {
        {"a<b>&\"c'", "a&lt;b&gt;&amp;&quot;c&apos;"},
        {"tab\tline\nbell\x07nul" + std::string(1, '\0') + "cr\r", "tab\tline\nbell nul cr "},
        {"caf\xC3\xA9 \xE2\x82\xAC \xF0\x9F\x8C\xA7", "caf\xC3\xA9 \xE2\x82\xAC \xF0\x9F\x8C\xA7"}, // UTF-8 kept
        // Text that is not UTF-8 is Windows-1252 as a whole.
        {"caf\xE9 \x80", "caf\xC3\xA9 \xE2\x82\xAC"},
        {"\xC0\xAF", "\xC3\x80\xC2\xAF"},              // an overlong form is not UTF-8
        {"\xED\xA0\x80", "\xC3\xAD\xC2\xA0\xE2\x82\xAC"},  // nor is a surrogate
        {"\xF4\x90\x80\x80", "\xC3\xB4\xC2\x90\xE2\x82\xAC\xE2\x82\xAC"}, // nor a code point past U+10FFFF
        {"\xE2\x82", "\xC3\xA2\xE2\x80\x9A"},              // a sequence cut short
        {"\xC3\xA9\xE9", "\xC3\x83\xC2\xA9\xC3\xA9"},   // one stray byte makes all of it Windows-1252
        {"\xEF\xBF\xBE\xEF\xBF\xBF\xEF\xBF\xBD", "  \xEF\xBF\xBD"}, // U+FFFE, U+FFFF are no characters
    };
    for (const auto& [text, xml] : cases)
        EXPECT_EQ(sheet::package::XmlText(text), xml) << text;
}

TEST(XlsxWriter, ColumnNamesRunFromAToXFD)
{
    const std::pair<unsigned, const char*> cases[] = {{1, "A"},    {26, "Z"},    {27, "AA"},  {52, "AZ"},
                                                      {53, "BA"},  {702, "ZZ"},  {703, "AAA"}, {16384, "XFD"}};
    for (const auto& [column, name] : cases)
        EXPECT_EQ(sheet::package::ColumnName(column), name) << column;
}
