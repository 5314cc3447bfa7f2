// The one-pass reading of data lines against the reading through the splitter: over generated
// lines of every shape both must give the same rows, and the same fault on the same line.
#include "TestFiles.h"
#include "converter/AsciiSeriesReader.h"
#include "templates/AsciiSpecification.h"

#include <gtest/gtest.h>

#include <cstring>
#include <random>

using namespace converter;

namespace {

struct Outcome {
    std::vector<Row> rows;
    bool ok = false;
    std::string problem;
};

Outcome ReadWith(const CSpecification& spec, const std::string& path, bool fused)
{
    AsciiSeriesReader reader(spec);
    reader.UseFusedPass(fused);
    Outcome out;
    sys::Status status = reader.Open(path);
    Row row;
    while (status && reader.Next(row))
        out.rows.push_back(row);
    if (status)
        status = reader.status();
    out.ok = static_cast<bool>(status);
    if (!out.ok)
        out.problem = status.problem().Describe();
    return out;
}

bool SameBits(double a, double b) { return std::memcmp(&a, &b, sizeof a) == 0; }

void ExpectSameOutcome(const CSpecification& spec, const std::string& content)
{
    testsupport::ScratchFolder folder;
    const std::string path = folder.File("in.txt");
    testsupport::WriteFile(path, content);
    const Outcome fused = ReadWith(spec, path, true);
    const Outcome general = ReadWith(spec, path, false);
    ASSERT_EQ(fused.ok, general.ok) << content;
    EXPECT_EQ(fused.problem, general.problem) << content;
    ASSERT_EQ(fused.rows.size(), general.rows.size()) << content;
    for (size_t r = 0; r < fused.rows.size(); ++r) {
        EXPECT_EQ(fused.rows[r].stamp, general.rows[r].stamp) << content;
        ASSERT_EQ(fused.rows[r].values.size(), general.rows[r].values.size());
        for (size_t v = 0; v < fused.rows[r].values.size(); ++v)
            EXPECT_TRUE(SameBits(fused.rows[r].values[v], general.rows[r].values[v]))
                << "row " << r << " value " << v << "\n" << content;
    }
}

struct Layout {
    const char* name;
    const char* delimiterName;
    char delimiter;
    const char* separatorName;
    bool twoStampFields; // date and clock in two fields
    bool deleteValue;
};

CAsciiSpecification MakeSpec(const Layout& layout)
{
    CAsciiSpecification spec = convtest::GlobalSpec();
    spec.m_strDelimiter = layout.delimiterName;
    spec.m_strDecimalSeparator = layout.separatorName;
    if (layout.deleteValue) {
        spec.m_DataDesc.m_nDeleteValueCheck = 1;
        spec.m_DataDesc.m_nDeleteValueRadio = 0;
        spec.m_DataDesc.m_strDeleteValue = "-999";
    }
    return spec;
}

// Values that read, values that are missing, and values that fail, in both separators.
const char* const kCommonValues[] = {"1.5", "-3.25", "0", "-0", "+2", "7", "", "", "1e5", "-1.5E-3", "2.",
                                     ".5", "3,5", "-999", "-999.0", "123456789012345678.5", "0.1234567890123456"};
const char* const kRareValues[] = {"abc", "1.2.3", "--1", "1e", "1e999", "\"4\"", "1\"2", " 1.5 ", "nan", "inf",
                                   "-", "+", "1,5,6", "0x10"};
const char* const kRareStamps[] = {"2020/02/30 00:00:00", "garbage", "\"2020/01/01 00:00:00\"", ""};

std::string GenerateFile(const Layout& layout, std::mt19937& random, int items, int lines)
{
    const std::string d(1, layout.delimiter);
    std::string file = "T" + std::string(layout.twoStampFields ? d + "C" : "");
    for (int i = 0; i < items; ++i)
        file += d + "I" + std::to_string(i);
    file += "\n";
    auto pick = [&](int n) { return static_cast<int>(random() % static_cast<unsigned>(n)); };
    for (int line = 0; line < lines; ++line) {
        if (pick(40) == 0) {
            file += "\n";
            continue;
        }
        if (pick(60) == 0) {
            file += "no delimiter here\n";
            continue;
        }
        if (pick(60) == 0)
            file += kRareStamps[pick(std::size(kRareStamps))];
        else
            file += "2020/01/0" + std::to_string(1 + pick(9)) + (layout.twoStampFields ? d : " ") + "12:3" +
                    std::to_string(pick(10)) + ":00";
        int fields = items;
        if (pick(30) == 0)
            fields += pick(3) - 1;
        for (int i = 0; i < fields; ++i) {
            file += d;
            if (pick(80) == 0)
                file += kRareValues[pick(std::size(kRareValues))];
            else
                file += kCommonValues[pick(std::size(kCommonValues))];
        }
        if (pick(20) == 0)
            file += d;
        file += "\n";
    }
    return file;
}

const Layout kLayouts[] = {
    {"TabPoint", "Tab", '\t', "Dot", false, false},
    {"SemicolonComma", "Semi Colon", ';', "Comma", false, true},
    {"SpaceTwoStampFields", "Space", ' ', "Dot", true, false},
    {"CommaPointDelete", "Comma", ',', "Dot", false, true},
};

TEST(FusedPass, SameRowsAndFaultsAsTheSplitterOverGeneratedFiles)
{
    for (const Layout& layout : kLayouts) {
        SCOPED_TRACE(layout.name);
        const CAsciiSpecification spec = MakeSpec(layout);
        std::mt19937 random(12345);
        for (int file = 0; file < 150; ++file) {
            const int items = 1 + static_cast<int>(random() % 6);
            ExpectSameOutcome(spec, GenerateFile(layout, random, items, 8));
            if (HasFailure())
                return;
        }
    }
}

TEST(FusedPass, LongLinesAndWideFiles)
{
    for (const Layout& layout : kLayouts) {
        SCOPED_TRACE(layout.name);
        const CAsciiSpecification spec = MakeSpec(layout);
        std::mt19937 random(777);
        for (int file = 0; file < 10; ++file)
            ExpectSameOutcome(spec, GenerateFile(layout, random, 300, 20));
    }
}

TEST(FusedPass, ReportsABrokenValueOnItsLine)
{
    const CAsciiSpecification spec = MakeSpec(kLayouts[0]);
    const std::string content = "T\tA\tB\n"
                                "2020/01/01 00:00:00\t1\t2\n"
                                "2020/01/01 00:00:01\t1\t\n"
                                "2020/01/01 00:00:02\t1.5\t1x\n";
    ExpectSameOutcome(spec, content);
    testsupport::ScratchFolder folder;
    testsupport::WriteFile(folder.File("in.txt"), content);
    const Outcome fused = ReadWith(spec, folder.File("in.txt"), true);
    ASSERT_FALSE(fused.ok);
    EXPECT_EQ(fused.rows.size(), 2u);
    EXPECT_NE(fused.problem.find("4"), std::string::npos) << fused.problem;
    EXPECT_NE(fused.problem.find("'1x'"), std::string::npos) << fused.problem;
}

TEST(FusedPass, QuoteFaultBeforeALaterBadValueIsStillTheQuoteFault)
{
    // The splitter finds a malformed quote before any value is read; the one pass must not report
    // the earlier bad value instead.
    const CAsciiSpecification spec = MakeSpec(kLayouts[0]);
    ExpectSameOutcome(spec, "T\tA\tB\n2020/01/01 00:00:00\tbad\t\"5\"x\n");
    ExpectSameOutcome(spec, "T\tA\tB\n2020/01/01 00:00:00\t\"5\"\t6\n");
}

} // namespace
