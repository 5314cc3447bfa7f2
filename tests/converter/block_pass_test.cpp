// Data lines read by delimiter positions, values read in blocks and stamps read by their clock,
// each against the reading it stands in for: from_chars, the date format with StampFromFields,
// and the reader's other passes over the same files.
#include "TestFiles.h"
#include "converter/AsciiSeriesReader.h"
#include "converter/NumberText.h"
#include "converter/StampText.h"
#include "templates/AsciiSpecification.h"

#include <gtest/gtest.h>

#include <charconv>
#include <cstring>
#include <random>

using namespace converter;

namespace {

bool SameBits(double a, double b) { return std::memcmp(&a, &b, sizeof a) == 0; }

// The field followed by `after` and enough bytes for the readers to look past its end.
std::string Padded(const std::string& field, const std::string& after)
{
    return field + after + std::string(kPlainFieldReach + 16, '7');
}

// What a plain field reader must give: from_chars's value for "-digits.digits" with 1 to 15
// digits, nothing for any other text.
bool ExpectedPlain(const std::string& field, double& value)
{
    size_t digits = 0, points = 0;
    for (size_t i = 0; i < field.size(); ++i) {
        if (field[i] >= '0' && field[i] <= '9')
            ++digits;
        else if (field[i] == '.')
            ++points;
        else if (!(field[i] == '-' && i == 0))
            return false;
    }
    if (digits == 0 || digits > 15 || points > 1)
        return false;
    const auto [end, error] = std::from_chars(field.data(), field.data() + field.size(), value);
    return error == std::errc() && end == field.data() + field.size();
}

size_t LongestDigitRun(const std::string& field)
{
    size_t longest = 0, run = 0;
    for (char c : field) {
        run = (c >= '0' && c <= '9') ? run + 1 : 0;
        longest = std::max(longest, run);
    }
    return longest;
}

void ExpectEveryReaderAgrees(const std::string& field, const std::string& after)
{
    const std::string text = Padded(field, after);
    const FieldSpan span{0, static_cast<std::uint32_t>(field.size())};
    double expected = 0;
    const bool plain = ExpectedPlain(field, expected);
    const auto readers = PlainFieldsReadersOfThisProcessor();
    for (size_t r = 0; r < readers.size(); ++r) {
        double value = 0;
        const bool read = readers[r](text.data(), &span, 1, &value) == 1;
        // Word arithmetic leaves more than eight digits on a side of the point to the caller.
        if (r == 0 && plain && LongestDigitRun(field) > 8) {
            if (read) {
                EXPECT_TRUE(SameBits(value, expected)) << "[" << field << "]";
            }
            continue;
        }
        ASSERT_EQ(read, plain) << "reader " << r << " [" << field << "] before [" << after << "]";
        if (plain) {
            ASSERT_TRUE(SameBits(value, expected)) << "reader " << r << " [" << field << "] " << value << " " << expected;
        }
    }
}

TEST(PlainFieldsReaders, EdgeFieldsAgreeWithFromChars)
{
    const char* const fields[] = {
        "0", "-0", "-0.0", "0.", "-.5", ".5", "5.", "-5.", "007", "000123.4500", "-000.0001",
        "1", "12345678", "123456789", "12345678.12345678", "1234567.12345678", "12345678.1234567",
        "123456789012345", "1234567890123456", "12345678901234567", "0.000000000000001", "9999999.99999999",
        "999999999999999", "-999999999999999", ".123456789012345", "123456789012345.", "4503599627370497",
        "9007199254740993", "0.1", "0.3", "2.675", "1.005",
        // Not plain decimals: the general reading decides what they are.
        "", "-", ".", "-.", "..", "1.2.3", "1e5", "1E5", "+1", " 1", "1 ", "1,5", "--1", "0x1", "1-", "\"1\"",
        "1\r", "inf", "nan", "12345678901234567890",
    };
    for (const char* field : fields)
        for (const char* after : {"", "\t", "9", "\n", ".5"})
            ExpectEveryReaderAgrees(field, after);
}

TEST(PlainFieldsReaders, RandomDecimalsAgreeWithFromChars)
{
    std::mt19937_64 random(4242);
    for (int n = 0; n < 100000; ++n) {
        const int digits = 1 + static_cast<int>(random() % 17);
        std::string field = random() % 3 == 0 ? "-" : "";
        const int point = static_cast<int>(random() % (digits + 2)); // past the end: no point
        for (int i = 0; i <= digits; ++i) {
            if (i == point)
                field += '.';
            if (i < digits)
                field += static_cast<char>('0' + random() % 10);
        }
        ExpectEveryReaderAgrees(field, random() % 2 ? "\t" : "0123");
        if (HasFatalFailure())
            return;
    }
}

TEST(PlainFieldsReaders, StopAtTheFirstFieldThatIsNotPlainAndGoOnFromIt)
{
    const std::string line = Padded("1.5;-2;x;7.25;;8", "");
    const std::vector<FieldSpan> spans = {{0, 3}, {4, 2}, {7, 1}, {9, 4}, {14, 0}, {15, 1}};
    for (PlainFieldsReader read : PlainFieldsReadersOfThisProcessor()) {
        double values[6] = {};
        ASSERT_EQ(read(line.data(), spans.data(), spans.size(), values), 2u);
        EXPECT_EQ(values[0], 1.5);
        EXPECT_EQ(values[1], -2.0);
        ASSERT_EQ(read(line.data(), spans.data() + 3, 3, values + 3), 1u);
        EXPECT_EQ(values[3], 7.25);
        EXPECT_EQ(read(line.data(), spans.data() + 5, 1, values + 5), 1u);
        EXPECT_EQ(values[5], 8.0);
    }
    // More fields than one run of divisions holds.
    std::string wide;
    std::vector<FieldSpan> many;
    for (int i = 0; i < 100; ++i) {
        const std::string field = std::to_string(i) + "." + std::to_string(i % 7);
        many.push_back({static_cast<std::uint32_t>(wide.size()), static_cast<std::uint32_t>(field.size())});
        wide += field + "\t";
    }
    wide = Padded(wide, "");
    for (PlainFieldsReader read : PlainFieldsReadersOfThisProcessor()) {
        std::vector<double> values(many.size());
        ASSERT_EQ(read(wide.data(), many.data(), many.size(), values.data()), many.size());
        for (int i = 0; i < 100; ++i)
            EXPECT_EQ(values[static_cast<size_t>(i)], std::stod(std::to_string(i) + "." + std::to_string(i % 7)));
    }
}

// StampReader against the format and StampFromFields over runs of texts that share their date,
// change it, or break the compact shape in any of its places.
TEST(StampReader, GivesWhatTheFormatGivesOverRunsOfTexts)
{
    const char* const texts[] = {
        "2020/02/28 23:59:59", "2020/02/28 00:00:00", "2020/02/28 12:34:56", "2020/02/28 24:00:00",
        "2020/02/28 12:60:00", "2020/02/28 12:00:60", "2020/02/28 1a:00:00", "2020/02/28x12:00:00",
        "2020/02/28 12x00:00", "2020/02/28 12:00x00", "2020/02/28T12-00.00", "2020/02/28 12:00:0",
        "2020/02/28 12:00:001", "2020/02/29 00:00:01", "2021/02/29 00:00:01", "2021/02/29 00:00:02",
        "2020/2/28 1:2:3", "2020/02/28  1:02:03", "2020/02/28 01:02:03", " 2020/02/28 01:02:03",
        "2020/02/28 01:02:0 ", "0099/01/01 00:00:00", "9999/12/31 23:59:59", "2020/13/01 00:00:00",
        "2020/12/31 -1:00:00", "2020/12/31 +1:00:00", "2020/12/31 23:59:59",
    };
    for (const char* format : {"YYYY/MM/DD HH:mm:ss", "YYYY-MM-DD HH:mm:ss", "DD/MM/YYYY HH:mm:ss"}) {
        const sys::DateFormat dateFormat(format);
        sys::DateTimeFields start;
        start.year = 100;
        StampReader reader(dateFormat, start);
        std::mt19937 random(3);
        for (int n = 0; n < 3000; ++n) {
            const std::string text = texts[random() % std::size(texts)];
            sys::DateTimeFields fields = start;
            const bool formatReads = dateFormat.Read(text, fields);
            const std::optional<Stamp> expected = formatReads ? StampFromFields(fields) : std::nullopt;
            Stamp stamp = -1;
            ASSERT_EQ(reader.Read(text, stamp), expected.has_value()) << format << " [" << text << "]";
            if (expected) {
                ASSERT_EQ(stamp, *expected) << format << " [" << text << "]";
            }
        }
    }
}

// The three ways of reading data lines over the same files: by blocks, the one pass over fields,
// and the splitter. Rows must agree bit for bit, and the first fault must be the same.
struct Outcome {
    std::vector<Row> rows;
    std::string problem;
};

enum class Pass { Blocks, Fields, Splitter };

Outcome ReadWith(const CSpecification& spec, const std::string& path, Pass pass, const std::vector<size_t>* selection)
{
    AsciiSeriesReader reader(spec);
    reader.UseFusedPass(pass != Pass::Splitter);
    reader.UseBlockPass(pass == Pass::Blocks);
    Outcome out;
    sys::Status status = reader.Open(path);
    if (status && selection)
        reader.Select(*selection);
    Row row;
    while (status && reader.Next(row))
        out.rows.push_back(row);
    if (status)
        status = reader.status();
    if (!status)
        out.problem = status.problem().Describe();
    return out;
}

void ExpectSame(const Outcome& a, const Outcome& b, const std::string& content)
{
    ASSERT_EQ(a.problem, b.problem) << content;
    ASSERT_EQ(a.rows.size(), b.rows.size()) << content;
    for (size_t r = 0; r < a.rows.size(); ++r) {
        ASSERT_EQ(a.rows[r].stamp, b.rows[r].stamp) << "row " << r << "\n" << content;
        ASSERT_EQ(a.rows[r].values.size(), b.rows[r].values.size());
        for (size_t v = 0; v < a.rows[r].values.size(); ++v)
            ASSERT_TRUE(SameBits(a.rows[r].values[v], b.rows[r].values[v]))
                << "row " << r << " value " << v << ": " << a.rows[r].values[v] << " " << b.rows[r].values[v] << "\n"
                << content;
    }
}

void ExpectPassesAgree(const CSpecification& spec, const std::string& content,
                       const std::vector<size_t>* selection = nullptr)
{
    testsupport::ScratchFolder folder;
    const std::string path = folder.File("in.txt");
    testsupport::WriteFile(path, content);
    const Outcome blocks = ReadWith(spec, path, Pass::Blocks, selection);
    ExpectSame(blocks, ReadWith(spec, path, Pass::Splitter, selection), content);
    ExpectSame(blocks, ReadWith(spec, path, Pass::Fields, selection), content);
}

CAsciiSpecification Spec(const char* delimiter, const char* separator, const char* deleteValue)
{
    CAsciiSpecification spec = convtest::GlobalSpec();
    spec.m_strDelimiter = delimiter;
    spec.m_strDefDelimiter = "|";
    spec.m_strDecimalSeparator = separator;
    if (deleteValue) {
        spec.m_DataDesc.m_nDeleteValueCheck = 1;
        spec.m_DataDesc.m_nDeleteValueRadio = 0;
        spec.m_DataDesc.m_strDeleteValue = deleteValue;
    }
    return spec;
}

const char* const kValues[] = {
    "1.5", "-3.25", "0", "-0", "-.5", "5.", ".5", "007.50", "", "", "123456789012345", "1234567890123456",
    "12345678901234567", "12345678.9", "1.23456789", "0.1234567890123456", "-999", "-999.0", "1e5", "+2",
    " 1.5", "1.5 ", "3,5", "abc", "1.2.3", "\"4\"", "4\"", "-", "1\r5", "NaN",
};

std::string GenerateLines(std::mt19937& random, char delimiter, int items, int lines, bool crlf)
{
    const std::string d(1, delimiter);
    std::string file = "T";
    for (int i = 0; i < items; ++i)
        file += d + "I" + std::to_string(i);
    file += "\n";
    auto pick = [&](size_t n) { return static_cast<size_t>(random() % n); };
    int day = 1;
    for (int line = 0; line < lines; ++line) {
        if (pick(8) == 0)
            day = 1 + static_cast<int>(pick(31));
        const int hour = pick(30) == 0 ? 24 : static_cast<int>(pick(24));
        std::string text = "2021/03/" + std::string(day < 10 ? "0" : "") + std::to_string(day) +
                           (pick(40) == 0 ? "T" : " ") + (hour < 10 ? "0" : "") + std::to_string(hour) + ":0" +
                           std::to_string(pick(10)) + ":5" + std::to_string(pick(10));
        if (pick(50) == 0)
            text = "\"" + text + "\"";
        int fields = items;
        if (pick(25) == 0)
            fields += static_cast<int>(pick(3)) - 1;
        for (int i = 0; i < fields; ++i)
            text += d + (pick(4) == 0 ? kValues[pick(std::size(kValues))] : std::to_string(pick(2000)) + "." +
                                                                                 std::to_string(pick(10000)));
        if (pick(25) == 0)
            text += d;
        const bool last = line + 1 == lines;
        file += text + (last && pick(2) == 0 ? "" : crlf ? "\r\n" : "\n");
    }
    return file;
}

TEST(BlockPass, AgreesWithTheOtherPassesOverGeneratedFiles)
{
    struct Layout {
        const char* delimiterName;
        char delimiter;
        const char* separator;
        const char* deleteValue;
    } layouts[] = {
        {"Tab", '\t', "Dot", nullptr},
        {"Semi Colon", ';', "Dot", "-999"},
        {"Comma", ',', "Dot", ""},
        {"Semi Colon", ';', "Comma", nullptr},
        {"User Defined", '|', "Dot", nullptr}, // also a date separator
    };
    std::mt19937 random(2024);
    for (const Layout& layout : layouts) {
        SCOPED_TRACE(layout.delimiterName);
        const CAsciiSpecification spec = Spec(layout.delimiterName, layout.separator, layout.deleteValue);
        for (int file = 0; file < 120; ++file) {
            const int items = 1 + static_cast<int>(random() % 12);
            ExpectPassesAgree(spec, GenerateLines(random, layout.delimiter, items, 10, file % 3 == 0));
            if (HasFatalFailure())
                return;
        }
    }
}

TEST(BlockPass, SelectionsInAnyOrderSubsetsAndRepeats)
{
    const CAsciiSpecification spec = Spec("Tab", "Dot", nullptr);
    const std::vector<std::vector<size_t>> selections = {{0, 1, 2, 3}, {3, 2, 1, 0}, {1, 3}, {2}, {0, 0, 2}, {3, 1, 3}};
    std::mt19937 random(99);
    for (const auto& selection : selections)
        for (int file = 0; file < 30; ++file) {
            ExpectPassesAgree(spec, GenerateLines(random, '\t', 4, 10, false), &selection);
            if (HasFatalFailure())
                return;
        }
}

TEST(BlockPass, LongLinesWideFilesAndRefilledBuffers)
{
    const CAsciiSpecification spec = Spec("Tab", "Dot", nullptr);
    std::mt19937 random(5);
    // Lines longer than a block of the delimiter search, and more items than a run of divisions.
    for (int file = 0; file < 5; ++file)
        ExpectPassesAgree(spec, GenerateLines(random, '\t', 150, 12, file % 2 == 0));
    // Past the line buffer's first filling, ending without a line end: the bytes after the last
    // line are what an earlier filling left there.
    ExpectPassesAgree(spec, GenerateLines(random, '\t', 10, 6000, false) + "2022/01/01 00:00:00\t1\t2");
}

TEST(BlockPass, EdgeLinesAgreeWithTheOtherPasses)
{
    const CAsciiSpecification spec = Spec("Tab", "Dot", nullptr);
    const char* const contents[] = {
        "T\tA\n2020/01/01 00:00:00\t\n",             // the line ends just after the date/time
        "T\tA\n2020/01/01 00:00:00\t1\t\n",         // a trailing delimiter is one more field
        "T\tA\tB\n2020/01/01 00:00:00\t1\t\n",      // ... or the last, empty, value
        "T\tA\tB\n2020/01/01 00:00:00\t1\t\t\n",
        "T\tA\n2020/01/01 00:00:00\n",
        "T\tA\n\t1\n",
        "T\tA\n\"2020/01/01 00:00:00\"\t1\n",
        "T\tA\tB\n2020/01/01 00:00:00\t\"1\"\t2\n",
        "T\tA\tB\n2020/01/01 00:00:00\t1\t\"2\"\n",
        "T\tA\r\n2020/01/01 00:00:00\t1.5\r\n2020/01/01 00:00:01\t-.5\r\n",
        "T\tA\n2020/01/01 00:00:00\t1.5\r\r\n",
        "T\tA\n2020/01/01 00:00:00\t12345678901234567890\n2020/01/01 00:00:01\t0000000000000001.5\n",
    };
    for (const char* content : contents)
        ExpectPassesAgree(spec, content);
}

TEST(BlockPass, ReadsTheCommonLayoutAndReportsAFaultOnItsLineAndColumn)
{
    const CAsciiSpecification spec = Spec("Tab", "Dot", nullptr);
    testsupport::ScratchFolder folder;
    const std::string path = folder.File("in.txt");
    testsupport::WriteFile(path, "T\tA\tB\n"
                              "2020/01/01 23:59:59\t1.25\t-0\n"
                              "2020/01/02 00:00:00\t\t007.5\n"
                              "2020/01/02 00:00:01\t2\t1x\n");
    const Outcome out = ReadWith(spec, path, Pass::Blocks, nullptr);
    ASSERT_EQ(out.rows.size(), 2u);
    EXPECT_EQ(out.rows[0].stamp, *StampFromFields({2020, 1, 1, 23, 59, 59}));
    EXPECT_EQ(out.rows[1].stamp, *StampFromFields({2020, 1, 2, 0, 0, 0}));
    EXPECT_EQ(out.rows[0].values[0], 1.25);
    EXPECT_TRUE(std::signbit(out.rows[0].values[1]));
    EXPECT_TRUE(IsMissing(out.rows[1].values[0]));
    EXPECT_EQ(out.rows[1].values[1], 7.5);
    EXPECT_EQ(out.problem, path + ":4:3: the value '1x' of item 'B' is not a number");
}

} // namespace
