// What the ASCII preview makes of files other tools write (byte-order marks, UTF-16), of inputs that
// would hold it without end (endless lines, FIFOs, devices, very wide files), of delimiters longer
// than one character, and how every failure is explained.
#include "ParserTestSupport.h"
#include "parsers/AsciiFilePreviewParser.h"
#include "parsers/ParserFactory.h"
#include "platform/system/TextFileInput.h"
#include "templates/AsciiSpecification.h"
#include "tests/support/Files.h"
#include "tests/support/Utf16.h"

#include <gtest/gtest.h>

#include <functional>
#include <sys/stat.h>

namespace {

using parsertest::MessageIds;

using testsupport::Contains;
using testsupport::Utf16;

class PreviewInputTest : public parsertest::AsciiParserFixture {
protected:
    // Names on line 1, data from line 2.
    void NamesOnLineOne()
    {
        spec.m_DataDesc.m_nItemDescriptionRow = 1;
        spec.m_DataDesc.m_nStartRow = 2;
    }
};

TEST_F(PreviewInputTest, ByteOrderMarksAndUtf16AreReadAsText)
{
    const std::string text = "Time\tRain\n2020/01/01 00:00:00\t1.5\n2020/01/01 01:00:00\t2.5\n";
    const struct {
        const char* label;
        std::string bytes;
    } cases[] = {
        {"UTF-8", text},
        {"UTF-8 with a byte-order mark", "\xEF\xBB\xBF" + text},
        {"UTF-16 little endian with a mark", "\xFF\xFE" + Utf16(text, false)},
        {"UTF-16 big endian with a mark", "\xFE\xFF" + Utf16(text, true)},
        {"UTF-16 little endian without a mark", Utf16(text, false)},
    };
    NamesOnLineOne();
    for (const auto& c : cases) {
        Bind(c.bytes);
        ASSERT_EQ(ParseGuarded(parser, ""), 1) << c.label << ": " << parser.m_strFailure;
        EXPECT_EQ(parser.m_vecItemNames, (CStringList{"Time", "Rain"})) << c.label;
        EXPECT_EQ(parser.m_vecRows.at(3), (ui::Row{"2020/01/01 00:00:00", "1.5"})) << c.label;
        EXPECT_EQ(parser.m_vecRawLines.at(0), (ui::Row{"Time    Rain"})) << c.label;
    }
}

TEST_F(PreviewInputTest, DataOnTheFirstLineAfterAMark)
{
    const std::string data = "2020/01/01 00:00:00\t1.5\n2020/01/01 01:00:00\t2.5\n";
    spec.m_DataDesc.m_nItemTitleOption = 1;
    spec.m_DataDesc.m_nStartRow = 1;
    for (const std::string& bytes : {"\xEF\xBB\xBF" + data, "\xFF\xFE" + Utf16(data, false)}) {
        Bind(bytes);
        ASSERT_EQ(ParseGuarded(parser, ""), 1) << parser.m_strFailure;
        EXPECT_EQ(parser.m_vecRows.at(3), (ui::Row{"2020/01/01 00:00:00", "1.5"}));
    }
}

TEST_F(PreviewInputTest, FilesPythonWritesWithAMarkOrInUtf16)
{
    spec.m_strDelimiter = "Comma";
    NamesOnLineOne();
    for (const char* encoding : {"utf-8-sig", "utf-16", "utf-16-le"}) {
        const std::string path = folder.File(std::string("python-") + encoding + ".csv");
        const std::string script = "import csv; w = csv.writer(open('" + path + "', 'w', newline='', encoding='" +
                                   encoding + "')); w.writerow(['Time', 'Pegel \\u00d6hringen']);"
                                   " w.writerows([['2020/01/01 00:00:00', 1.5], ['2020/01/01 01:00:00', 2.5]])";
        if (std::system(("/usr/bin/python3 -c \"" + script + "\"").c_str()) != 0)
            GTEST_SKIP() << "/usr/bin/python3 cannot write the files";
        parser.SetFile(path);
        ASSERT_EQ(ParseGuarded(parser, ""), 1) << encoding << ": " << parser.m_strFailure;
        EXPECT_EQ(parser.m_vecItemNames, (CStringList{"Time", "Pegel \xC3\x96hringen"})) << encoding;
        EXPECT_EQ(parser.m_vecRows.at(4), (ui::Row{"2020/01/01 01:00:00", "2.5"})) << encoding;
    }
}

TEST_F(PreviewInputTest, BrokenUtf16IsRefusedSayingSo)
{
    NamesOnLineOne();
    const std::string good = "\xFF\xFE" + Utf16("Time\tRain\n2020/01/01 00:00:00\t1.5\n", false);
    for (const std::string& bytes : {good + "x", good + std::string("\x00\xDC", 2), std::string("\xFF\xFE\0\0T\0\0\0", 8)}) {
        const std::string path = Bind(bytes);
        EXPECT_EQ(ParseGuarded(parser, ""), 0);
        EXPECT_TRUE(Contains(parser.m_strFailure, path)) << parser.m_strFailure;
        EXPECT_TRUE(Contains(parser.m_strFailure, "UTF-16") || Contains(parser.m_strFailure, "UTF-32"))
            << parser.m_strFailure;
    }
}

TEST_F(PreviewInputTest, LinesWithoutALineBreakWithinTheLimitAreRefused)
{
    const std::string endless(sys::kLongestTextLine + 1, '7');
    const struct {
        const char* label;
        std::string content;
        const char* lineNumber;
    } cases[] = {
        {"no line break at all", endless, ":1: "},
        {"a header line", "h\n" + endless + "\nTime\tA\n2020/01/01 00:00:00\t1\n", ":2: "},
        {"a data line", "h\nTime\tA\n2020/01/01 00:00:00\t1" + endless + "\n", ":3: "},
    };
    for (const auto& c : cases) {
        const std::string path = Bind(c.content);
        EXPECT_EQ(ParseGuarded(parser, ""), 0) << c.label;
        EXPECT_EQ(parser.m_strFailure.rfind(path + c.lineNumber, 0), 0u) << c.label << ": " << parser.m_strFailure;
        EXPECT_TRUE(Contains(parser.m_strFailure, "no line break within 4194304 bytes")) << parser.m_strFailure;
    }
}

TEST_F(PreviewInputTest, LongLinesAreShownCutButParsedWhole)
{
    const std::string longName(200000, 'N');
    const std::string content = "h\nTime\tA\n2020/01/01 00:00:00\t" + longName + "\n";
    Bind(content);
    ASSERT_EQ(ParseGuarded(parser, ""), 1) << parser.m_strFailure;
    EXPECT_EQ(parser.m_vecRows.at(3).at(1), longName);
    const size_t stamp = std::string("2020/01/01 00:00:00\t").size();
    EXPECT_EQ(parser.m_vecRawLines.at(2).at(0),
              "2020/01/01 00:00:00    " + std::string(CAsciiFilePreviewParser::kShownLineBytes - stamp, 'N'));

    // A cut never splits a character.
    Bind(std::string(CAsciiFilePreviewParser::kShownLineBytes - 1, 'x') + "\xC3\x96\n");
    ASSERT_EQ(parser.ReadRawLines(""), 1);
    EXPECT_EQ(parser.m_vecRawLines.at(0).at(0), std::string(CAsciiFilePreviewParser::kShownLineBytes - 1, 'x'));
}

TEST_F(PreviewInputTest, FifosDevicesAndFoldersAreRefused)
{
    const std::string fifo = folder.File("fifo");
    ASSERT_EQ(::mkfifo(fifo.c_str(), 0600), 0);
    const std::pair<std::string, const char*> cases[] = {
        {fifo, "FIFO"}, {"/dev/zero", "device"}, {folder.File(""), "folder"}};
    for (const auto& [path, kind] : cases) {
        parser.SetFile(path);
        EXPECT_EQ(ParseGuarded(parser, ""), 0) << path;
        EXPECT_TRUE(Contains(parser.m_strFailure, path) && Contains(parser.m_strFailure, kind)) << parser.m_strFailure;
        EXPECT_THROW(parser.ReadRawLines(""), std::exception) << path;
    }
}

TEST_F(PreviewInputTest, VeryWideFilesShowFewerLines)
{
    const int items = 100000;
    std::string content = "h\nTime";
    for (int i = 0; i < items; ++i)
        content += "\tI";
    for (int line = 0; line < 20; ++line) {
        content += "\n2020/01/01 00:00:" + std::to_string(10 + line);
        for (int i = 0; i < items; ++i)
            content += "\t1";
    }
    Bind(content + "\n");
    ASSERT_EQ(ParseGuarded(parser, ""), 1) << parser.m_strFailure;
    const size_t dataRows = parser.m_vecRows.size() - 3;
    EXPECT_EQ(dataRows, CAsciiFilePreviewParser::kPreviewCells / (items + 1) + 1);
    EXPECT_EQ(parser.m_vecRows.back().size(), static_cast<size_t>(items + 1));
}

// With a delimiter of several characters the date/time cell holds exactly the date/time fields.
TEST_F(PreviewInputTest, DelimitersOfSeveralCharactersLeaveTheDateTimeWhole)
{
    spec.m_strDelimiter = "User Defined";
    const struct {
        const char* delimiter;
        int option;
        const char* format;
        int column;
        std::string names;
        std::string line;
        ui::Row row;
    } cases[] = {
        {"::", 0, "YYYY/MM/DD HH:mm:ss", 1, "Time::A", "2020/01/01 00:00:00::1", {"2020/01/01 00:00:00", "1"}},
        {"<->", 0, "YYYY/MM/DD HH:mm:ss", 1, "Time<->A", "2020/01/01 00:00:00<->1", {"2020/01/01 00:00:00", "1"}},
        {"::", 0, "YYYY/MM/DD HH:mm:ss", 2, "A::Time::B", "7::2020/01/01 00:00:00::1", {"2020/01/01 00:00:00", "7", "1"}},
        {"::", 0, "YYYY/MM/DD HH:mm:ss", 2, "A::Time", "7::2020/01/01 00:00:00", {"2020/01/01 00:00:00", "7"}},
        {"::", 0, "YYYY/MM/DD::HH:mm:ss", 1, "Date::Time::A", "2020/01/01::00:00:00::1", {"2020/01/01::00:00:00", "1"}},
        {";;", 1, "HH:mm:ss", 1, "Time;;A", "06:00:00;;1", {"2020-05-01  06:00:00", "1"}},
        {";;", 2, "YYYY/MM/DD", 1, "Date;;A", "2020/05/01;;1", {"2020/05/01  12:00:00", "1"}},
    };
    for (const auto& c : cases) {
        spec.m_strDefDelimiter = c.delimiter;
        CTimeDescription& time = spec.m_TimeDesc;
        time.m_nDateTimeOption = c.option;
        time.m_strDateTimeFormat = time.m_strTimeFormat = time.m_strDateFormat = c.format;
        time.m_nDateTimeCol = time.m_nTimeCol = time.m_nDateCol = c.column;
        time.m_strGlobalDate = "2020-05-01";
        time.m_strGlobalTime = "12:00:00";
        Bind("h\n" + c.names + "\n" + c.line + "\n");
        ASSERT_EQ(ParseGuarded(parser, ""), 1) << c.line << ": " << parser.m_strFailure;
        EXPECT_EQ(parser.m_vecRows.at(3), c.row) << c.delimiter << " " << c.line;
    }
}

TEST_F(PreviewInputTest, EveryFailureNamesTheFileTheLineAndTheReason)
{
    const std::string decimal = res::LoadString(res::IDS_DECIMAL_SEPARATOR_MISMATCH);
    const std::string count = res::LoadString(res::IDS_ITEM_COUNT_WRONG);
    const struct {
        const char* label;
        std::string content;
        std::function<void(CAsciiSpecification&)> setUp;
        std::string failure; // after "<file>"
    } cases[] = {
        {"a value with the other decimal separator", "h\nTime\tA\n2020/01/01 00:00:00\t1\n2020/01/01 01:00:00\t3,5\n",
         [](CAsciiSpecification&) {}, ":4: " + decimal},
        {"a data line with a field too many", "h\nTime\tA\n2020/01/01 00:00:00\t1\n2020/01/01 01:00:00\t1\t2\n",
         [](CAsciiSpecification&) {}, ":4: " + count},
        {"an empty name line", "h\n\n2020/01/01 00:00:00\t1\n", [](CAsciiSpecification&) {},
         ":2: " + res::LoadString(res::IDS_ITEM_NAME_LINE_EMPTY)},
        {"a value type row with an unknown name", "Rain:Sometimes\nTime\tA\n2020/01/01 00:00:00\t1\n",
         [](CAsciiSpecification& s) { s.m_DataDesc.m_nValueTypeOption = 1; },
         ":1: " + res::LoadString(res::IDS_VALUE_TYPE_INVALID)},
        {"an item type row of unknown types", "Nonsense\tGibberish\nTime\tA\n2020/01/01 00:00:00\t1\n",
         [](CAsciiSpecification& s) { s.m_DataDesc.m_nUnitTypeOption = 1; },
         ":1: the line gives no item type the unit catalogue knows"},
        {"units from item definitions that are not there", "h\nTime\tA\n2020/01/01 00:00:00\t1\n",
         [](CAsciiSpecification& s) { s.m_DataDesc.m_nUnitOption = 2; },
         ": the template gives no unit (it defines no items)"},
        {"an item type option outside 0 to 2", "h\nTime\tA\n2020/01/01 00:00:00\t1\n",
         [](CAsciiSpecification& s) { s.m_DataDesc.m_nUnitTypeOption = 7; },
         ": the template's item type option is 7, not 0, 1 or 2"},
        {"a data start row before the file", "h\nTime\tA\n2020/01/01 00:00:00\t1\n",
         [](CAsciiSpecification& s) { s.m_DataDesc.m_nStartRow = 0; },
         ": the template's data start row is below 1"},
    };
    for (const auto& c : cases) {
        CAsciiSpecification fresh;
        fresh.m_DataDesc.m_nUnitTypeOption = fresh.m_DataDesc.m_nUnitOption = fresh.m_DataDesc.m_nValueTypeOption = 0;
        spec = fresh;
        c.setUp(spec);
        const std::string path = Bind(c.content);
        EXPECT_EQ(ParseGuarded(parser, ""), 0) << c.label;
        EXPECT_EQ(parser.m_strFailure, path + c.failure) << c.label;
    }

    parser.SetFile(folder.File("absent.txt"));
    EXPECT_EQ(ParseGuarded(parser, ""), 0);
    EXPECT_EQ(parser.m_strFailure, folder.File("absent.txt") + ": the file does not exist");
    EXPECT_EQ(parser.ReadRawLines(""), 0);
    EXPECT_EQ(parser.m_strFailure, folder.File("absent.txt") + ": the file does not exist");
    parser.m_pSpecification = nullptr;
    EXPECT_EQ(ParseGuarded(parser, ""), 0);
    EXPECT_EQ(parser.m_strFailure, folder.File("absent.txt") + ": there is no template to read it with");

    // A success leaves no reason behind.
    parser.m_pSpecification = &spec;
    spec = CAsciiSpecification();
    spec.m_DataDesc.m_nUnitTypeOption = spec.m_DataDesc.m_nUnitOption = spec.m_DataDesc.m_nValueTypeOption = 0;
    Bind("h\nTime\tA\n2020/01/01 00:00:00\t1\n");
    ASSERT_EQ(ParseGuarded(parser, ""), 1) << parser.m_strFailure;
    EXPECT_EQ(parser.m_strFailure, "");
}

} // namespace
