// The .xlsx part readers on XML written inline: cell values of every type, numbers read exactly,
// positions of rows and cells without references, shared strings and styles, and the faults
// each must name.
#include "formats/xlsx/XlsxPartReaders.h"

#include <gtest/gtest.h>

#include <cmath>
#include <cstring>
#include <memory>

using namespace sheet;
using sheet::xlsx::SharedStrings;

namespace {

class RecordingSink : public ImportSink {
public:
    bool AddSheet(const std::string&) override { return true; }
    bool AddCell(int, const ImportedCell& cell) override
    {
        cells.push_back(cell);
        return true;
    }
    bool EndSheet(int) override { return true; }
    std::vector<ImportedCell> cells;
};

// Read three bytes at a time, so every token crosses reads.
XmlScanner Scanner(const std::string& xml)
{
    auto at = std::make_shared<std::size_t>(0);
    return XmlScanner(
        [xml, at](char* out, std::size_t capacity) {
            const std::size_t take = std::min({capacity, std::size_t{3}, xml.size() - *at});
            std::memcpy(out, xml.data() + *at, take);
            *at += take;
            return take;
        },
        "xl/worksheets/sheet1.xml", 5);
}

struct SheetFixture {
    SharedStrings strings;
    xlsx::CellStyles styles;
    ImportLimits limits;
    bool date1904 = false;

    SheetFixture()
    {
        strings.Add("zero");
        strings.Add("one");
        styles.dateStyles = {false, true};
    }

    std::vector<ImportedCell> Read(const std::string& sheetData)
    {
        XmlScanner xml = Scanner("<worksheet><sheetData>" + sheetData + "</sheetData></worksheet>");
        RecordingSink sink;
        xlsx::ReadSheetCells(xml, {strings, styles, date1904, limits}, 0, sink);
        return sink.cells;
    }

    ImportedCell One(const std::string& cell)
    {
        std::vector<ImportedCell> cells = Read("<row r=\"1\">" + cell + "</row>");
        return cells.size() == 1 ? cells[0] : ImportedCell();
    }

    std::string Failure(const std::string& sheetData)
    {
        try {
            Read(sheetData);
        } catch (const XmlScanner::Error& e) {
            return e.what();
        }
        return "";
    }
};

} // namespace

TEST(XlsxCells, EveryTypeGivesItsValue)
{
    struct Case {
        const char* xml;
        Variant::Type type;
        double number;
        const char* text;
    } cases[] = {
        {"<c r=\"A1\"><v>4.5</v></c>", Variant::Number, 4.5, ""},
        {"<c r=\"A1\" t=\"n\"><v> -7 </v></c>", Variant::Number, -7, ""},
        {"<c r=\"A1\" t=\"s\"><v>1</v></c>", Variant::Text, 0, "one"},
        {"<c r=\"A1\" t=\"str\"><f>A2</f><v>a&lt;b</v></c>", Variant::Text, 0, "a<b"},
        {"<c r=\"A1\" t=\"str\"><f>\"\"</f></c>", Variant::Text, 0, ""},
        {"<c r=\"A1\" t=\"inlineStr\"><is><t>in</t></is></c>", Variant::Text, 0, "in"},
        {"<c r=\"A1\" t=\"inlineStr\"><is><r><t>ri</t></r><r><rPr/><t>ch</t></r><rPh><t>x</t></rPh></is></c>",
         Variant::Text, 0, "rich"},
        {"<c r=\"A1\" t=\"b\"><v>1</v></c>", Variant::Boolean, 1, ""},
        {"<c r=\"A1\" t=\"b\"><v>0</v></c>", Variant::Boolean, 0, ""},
        {"<c r=\"A1\" t=\"e\"><v>#N/A</v></c>", Variant::Error, 0, "#N/A"},
        {"<c r=\"A1\" t=\"e\"><f>1/0</f><v>#DIV/0!</v></c>", Variant::Error, 0, "#DIV/0!"},
        {"<c r=\"A1\" t=\"d\"><v>2021-05-17</v></c>", Variant::Number, 44333, ""},
        {"<c r=\"A1\" t=\"d\"><v>2021-05-17T12:00:00Z</v></c>", Variant::Number, 44333.5, ""},
        {"<c r=\"A1\" t=\"d\"><v>1900-03-01T06:00:00.000</v></c>", Variant::Number, 61.25, ""},
        {"<c r=\"A1\" t=\"d\"><v>18:00</v></c>", Variant::Number, 0.75, ""},
        {"<c r=\"A1\"><f>A2</f><v>3</v></c>", Variant::Number, 3, ""},
        {"<c r=\"A1\" s=\"1\"/>", Variant::Empty, 0, ""},
    };
    for (const Case& c : cases) {
        SheetFixture sheet;
        const ImportedCell cell = sheet.One(c.xml);
        EXPECT_EQ(cell.type, c.type) << c.xml;
        EXPECT_EQ(cell.number, c.number) << c.xml;
        EXPECT_EQ(cell.text, c.text) << c.xml;
    }
}

// Tools that do not calculate write formulas without their result (openpyxl: <f>..</f><v></v>):
// such a cell reads as the empty text, marked; a cell without a value and formula is blank.
TEST(XlsxCells, CellsWithoutAStoredValue)
{
    struct Case {
        const char* xml;
        Variant::Type type;
        const char* text;
        bool withoutResult;
    } cases[] = {
        {"<c r=\"A1\"><f>B1+C1</f><v></v></c>", Variant::Text, "", true},
        {"<c r=\"A1\"><f>B1+C1</f></c>", Variant::Text, "", true},
        {"<c r=\"A1\" t=\"n\"><f>B1</f><v> </v></c>", Variant::Text, "", true},
        {"<c r=\"A1\" t=\"b\"><f>TRUE()</f><v/></c>", Variant::Text, "", true},
        {"<c r=\"A1\" t=\"e\"><f>1/0</f><v></v></c>", Variant::Text, "", true},
        {"<c r=\"A1\" t=\"d\"><f>TODAY()</f><v></v></c>", Variant::Text, "", true},
        {"<c r=\"A1\"><f t=\"shared\" si=\"0\"/><v></v></c>", Variant::Text, "", true},
        {"<c r=\"A1\" t=\"str\"><f>\"\"</f><v></v></c>", Variant::Text, "", true},
        {"<c r=\"A1\" t=\"str\"><f>A2</f><v>x</v></c>", Variant::Text, "x", false},
        {"<c r=\"A1\"><f>A2</f><v>3</v></c>", Variant::Number, "", false},
        {"<c r=\"A1\" s=\"1\"><v></v></c>", Variant::Empty, "", false},
        {"<c r=\"A1\" s=\"1\" t=\"b\"><v/></c>", Variant::Empty, "", false},
        {"<c r=\"A1\" s=\"1\" t=\"s\"><v></v></c>", Variant::Empty, "", false},
        {"<c r=\"A1\" s=\"1\" t=\"d\"><v> </v></c>", Variant::Empty, "", false},
    };
    for (const Case& c : cases) {
        SheetFixture sheet;
        const ImportedCell cell = sheet.One(c.xml);
        EXPECT_EQ(cell.type, c.type) << c.xml;
        EXPECT_EQ(cell.text, c.text) << c.xml;
        EXPECT_EQ(cell.formulaWithoutResult, c.withoutResult) << c.xml;
    }
}

TEST(XlsxCells, NumbersAreReadCorrectlyRounded)
{
    struct Case {
        const char* text;
        double value;
    } cases[] = {
        {"1E+15", 1e15},
        {"0.30000000000000004", 0.30000000000000004},
        {"123456789.12345678", 123456789.12345678},
        {"9007199254740993", 9007199254740992.0}, // halfway: to even
        {"1.7976931348623157E+308", 1.7976931348623157e308},
        {"2.2250738585072014E-308", 2.2250738585072014e-308},
        {"4.9406564584124654E-324", 4.9406564584124654e-324},
        {"1E-400", 0.0},
        {"+2.5", 2.5},
        {"-0", -0.0},
    };
    for (const Case& c : cases) {
        const std::optional<double> value = xlsx::ParseNumber(c.text);
        ASSERT_TRUE(value.has_value()) << c.text;
        EXPECT_EQ(*value, c.value) << c.text; // exact, not near
        EXPECT_EQ(std::signbit(*value), std::signbit(c.value)) << c.text;
    }
    for (const char* bad : {"", " ", "1E+400", "inf", "nan", "0x10", "1,5", "1.5.2", "--1", "+-1"})
        EXPECT_FALSE(xlsx::ParseNumber(bad).has_value()) << bad;
}

TEST(XlsxCells, IsoDatesOutsideTheCalendarAreRefused)
{
    for (const char* bad : {"2021-02-29", "2021-13-01", "2021-5-17", "2021-05-17T24:00:00", "2021-05-17T12:60",
                            "2021-05-17T12:00:00+02:00", "2021-05-17X", "12", "T12:00", "2021-05-17T12:00:00."})
        EXPECT_FALSE(xlsx::ParseIsoDate(bad).has_value()) << bad;
    EXPECT_EQ(xlsx::ParseIsoDate("2020-02-29"), 43890.0);
}

TEST(XlsxCells, RowsAndCellsWithoutReferencesFollowThePreviousOne)
{
    SheetFixture sheet;
    std::vector<ImportedCell> cells = sheet.Read("<row><c><v>1</v></c><c><v>2</v></c></row>"
                                                 "<row r=\"5\"><c r=\"C5\"><v>3</v></c><c><v>4</v></c></row>"
                                                 "<row><c><v>5</v></c><c r=\"E6\"><v>6</v></c><c><v>7</v></c></row>");
    const std::vector<std::pair<int, int>> expected = {{1, 1}, {1, 2}, {5, 3}, {5, 4}, {6, 1}, {6, 5}, {6, 6}};
    ASSERT_EQ(cells.size(), expected.size());
    for (std::size_t i = 0; i < cells.size(); ++i) {
        EXPECT_EQ(cells[i].row, expected[i].first) << i;
        EXPECT_EQ(cells[i].column, expected[i].second) << i;
        EXPECT_EQ(cells[i].number, static_cast<double>(i + 1));
    }
}

TEST(XlsxCells, PrefixedElementsAndCellsOutsideSheetDataIgnored)
{
    SheetFixture sheet;
    XmlScanner xml = Scanner("<x:worksheet xmlns:x=\"urn:m\"><x:sheetPr><x:c r=\"A1\"><x:v>9</x:v></x:c></x:sheetPr>"
                             "<x:sheetData><x:row r=\"2\"><x:c r=\"B2\" t=\"s\"><x:v>0</x:v></x:c></x:row></x:sheetData>"
                             "<x:extLst><x:c r=\"A1\"><x:v>9</x:v></x:c></x:extLst></x:worksheet>");
    RecordingSink sink;
    xlsx::ReadSheetCells(xml, {sheet.strings, sheet.styles, false, sheet.limits}, 0, sink);
    ASSERT_EQ(sink.cells.size(), 1u);
    EXPECT_EQ(sink.cells[0].row, 2);
    EXPECT_EQ(sink.cells[0].column, 2);
    EXPECT_EQ(sink.cells[0].text, "zero");
}

TEST(XlsxCells, The1904SystemMovesDateStyledNumbersOnly)
{
    SheetFixture sheet;
    sheet.date1904 = true;
    std::vector<ImportedCell> cells = sheet.Read("<row r=\"1\"><c r=\"A1\" s=\"1\"><v>0.5</v></c><c r=\"B1\"><v>0.5</v></c>"
                                                 "<c r=\"C1\" s=\"1\" t=\"d\"><v>1904-01-01</v></c>"
                                                 "<c r=\"D1\" s=\"7\"><v>0.5</v></c></row>");
    ASSERT_EQ(cells.size(), 4u);
    EXPECT_EQ(cells[0].number, 1462.5);
    EXPECT_EQ(cells[1].number, 0.5);
    EXPECT_EQ(cells[2].number, 1462); // an ISO date names its day whatever the system
    EXPECT_EQ(cells[3].number, 0.5);  // a style the workbook does not have
}

TEST(XlsxCells, FaultsNameThePartTheOffsetAndTheCell)
{
    struct Case {
        const char* xml;
        const char* message;
    } cases[] = {
        {"<row r=\"1\"><c r=\"A1\"><v>abc</v></c></row>",
         "xl/worksheets/sheet1.xml, byte 33: the cell A1 holds 'abc', which is not a number"},
        {"<row r=\"1\"><c><v>1E+400</v></c></row>", "the cell A1 holds '1E+400', which is not a number"},
        {"<row r=\"2\"><c r=\"B2\" t=\"s\"><v>2</v></c></row>", "the cell B2 refers to shared string '2' of 2"},
        {"<row r=\"2\"><c r=\"B2\" t=\"s\"><v>-1</v></c></row>", "refers to shared string '-1' of 2"},
        {"<row r=\"1\"><c r=\"A1\" t=\"b\"><v>2</v></c></row>", "holds '2', which is not a boolean"},
        {"<row r=\"1\"><c r=\"A1\" t=\"d\"><v>2021-02-30</v></c></row>", "which is not an ISO 8601 date"},
        {"<row r=\"1\"><c r=\"A1\" t=\"z\"><v>1</v></c></row>", "the cell A1 has the unknown type 'z'"},
        {"<row r=\"1\"><c r=\"XFE1\"><v>1</v></c></row>",
         "the cell reference 'XFE1' is malformed or lies outside the sheet's grid (1048576 rows, 16384 columns)"},
        {"<row r=\"1\"><c r=\"1A\"><v>1</v></c></row>", "the cell reference '1A' is malformed"},
        {"<row r=\"0\"/>", "byte 22: the row number '0' is malformed or lies outside the sheet's grid"},
        {"<row r=\"1048577\"/>", "the row number '1048577' is malformed"},
        {"<row r=\"x\"/>", "the row number 'x' is malformed"},
        {"<row r=\"1\"><c r=\"A1\"><v>1</v></row>", "the end tag </row> where <c> is open"},
    };
    for (const Case& c : cases) {
        SheetFixture sheet;
        const std::string message = sheet.Failure(c.xml);
        EXPECT_NE(message.find(c.message), std::string::npos) << c.xml << " -> " << message;
        EXPECT_EQ(message.rfind("xl/worksheets/sheet1.xml, byte ", 0), 0u) << message;
    }
}

TEST(XlsxCells, SmallerLimitsBoundTheGrid)
{
    SheetFixture sheet;
    sheet.limits.maxRows = 10;
    sheet.limits.maxColumns = 3;
    EXPECT_EQ(sheet.Failure("<row r=\"10\"><c r=\"C10\"><v>1</v></c></row>"), "");
    EXPECT_NE(sheet.Failure("<row r=\"1\"><c r=\"D1\"><v>1</v></c></row>")
                  .find("cell row 1, column 4 lies outside the sheet's grid of 10 rows and 3 columns"),
              std::string::npos);
    EXPECT_NE(sheet.Failure("<row r=\"10\"/><row/>").find("cell row 11, column 1 lies outside"), std::string::npos);
    EXPECT_NE(sheet.Failure("<row r=\"1\"><c r=\"C1\"/><c s=\"1\"/></row>").find("column 4 lies outside"), std::string::npos);
}

TEST(XlsxSharedStrings, RichRunsJoinAndPhoneticReadingsAreLeftOut)
{
    XmlScanner xml = Scanner("<sst count=\"4\"><si><t xml:space=\"preserve\"> a &amp; b </t></si>"
                             "<si><r><rPr><b/></rPr><t>Sta</t></r><r><t>tion</t></r><rPh sb=\"0\"><t>reading</t></rPh>"
                             "<phoneticPr fontId=\"1\"/></si><si><t/></si><si/></sst>");
    SharedStrings strings;
    xlsx::ReadSharedStrings(xml, strings);
    ASSERT_EQ(strings.Count(), 4u);
    EXPECT_EQ(strings.At(0), " a & b ");
    EXPECT_EQ(strings.At(1), "Station");
    EXPECT_EQ(strings.At(2), "");
    EXPECT_EQ(strings.At(3), "");
}

TEST(XlsxStyles, CellFormatsTakeTheirNumberFormatsByIndex)
{
    XmlScanner xml = Scanner("<styleSheet><numFmts><numFmt numFmtId=\"164\" formatCode=\"0.000\"/>"
                             "<numFmt numFmtId=\"165\" formatCode=\"yyyy/mm/dd\"/></numFmts>"
                             "<cellStyleXfs><xf numFmtId=\"165\"/></cellStyleXfs>"
                             "<cellXfs><xf numFmtId=\"0\"/><xf numFmtId=\"164\"/><xf numFmtId=\"165\"/><xf numFmtId=\"14\"/>"
                             "<xf/></cellXfs>"
                             "<dxfs><dxf><numFmt numFmtId=\"0\" formatCode=\"@\"/></dxf></dxfs></styleSheet>");
    StyleTable table;
    const xlsx::CellStyles styles = xlsx::ReadStyles(xml, table);
    ASSERT_EQ(table.Size(), 5u);
    EXPECT_EQ(table.Format(0).Code(), "General");
    EXPECT_EQ(table.Format(1).Code(), "0.000");
    EXPECT_EQ(table.Format(2).Code(), "yyyy/mm/dd");
    EXPECT_EQ(table.Format(3).Code(), NumberFormat::BuiltinCode(14));
    EXPECT_EQ(table.Format(4).Code(), "General");
    EXPECT_EQ(styles.dateStyles, (std::vector<bool>{false, false, true, true, false}));
}

TEST(XlsxStyles, TooManyCellFormatsAreRefused)
{
    std::string xfs;
    for (std::size_t i = 0; i <= xlsx::kMaxCellFormats; ++i)
        xfs += "<xf/>";
    XmlScanner xml = Scanner("<styleSheet><cellXfs>" + xfs + "</cellXfs></styleSheet>");
    StyleTable table;
    EXPECT_THROW(xlsx::ReadStyles(xml, table), XmlScanner::Error);
}
