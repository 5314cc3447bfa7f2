// The field splitter (plain lines by PlainFields, the rest by the field rule) against the template's
// NextField, call for call.
#include "delimited/FieldSplitter.h"
#include "templates/AsciiSpecification.h"
#include "platform/ui/UserInterface.h"

#include <gtest/gtest.h>

#include <random>

namespace {

struct Expected {
    std::vector<std::string> texts;
    std::vector<int> ends;
    bool quoteError = false;
};

Expected ThroughNextField(const CSpecification& spec, const std::string& line)
{
    ui::ScriptedUserInterface recorder;
    ui::ScopedUserInterface scope(recorder);
    Expected expected;
    CString copy = line;
    int pos = 0;
    do {
        expected.texts.push_back(spec.NextField(copy, pos));
        expected.ends.push_back(pos);
    } while (pos != -1);
    expected.quoteError = !recorder.boxes.empty();
    return expected;
}

void ExpectSameSplit(const CSpecification& spec, const std::string& line)
{
    const Expected expected = ThroughNextField(spec, line);
    delimited::FieldSplitter splitter(spec.GetDialect());
    splitter.Split(line);
    const auto& calls = splitter.Calls();
    ASSERT_EQ(calls.size(), expected.texts.size()) << "line [" << line << "]";
    for (size_t i = 0; i < calls.size(); ++i) {
        EXPECT_EQ(std::string(calls[i].text), expected.texts[i]) << "line [" << line << "] call " << i;
        EXPECT_EQ(calls[i].end, expected.ends[i]) << "line [" << line << "] call " << i;
    }
    EXPECT_EQ(splitter.QuoteError(), expected.quoteError) << "line [" << line << "]";
}

CAsciiSpecification Spec(const std::string& delimiter, int consecutive, int leading)
{
    CAsciiSpecification spec;
    spec.m_strDelimiter = delimiter;
    spec.m_strDefDelimiter = "::";
    spec.m_bIgnoreConsecutiveDelimiters = consecutive;
    spec.m_bIgnoreBegginingOfLineDelimiters = leading;
    return spec;
}

const char* const kLines[] = {
    "", "a", "a,b", "a,b,", "a,,b", ",,a", ",a", "\"x\",y", "\"x\"y,z", "\"x", "\"\"\"", "a,\"b c\",d",
    "\"x\"", ",", ",,", "a,,", "2020/01/01 12:00:00,1.5,2.5", "a::b::c",
};

TEST(FieldSplitter, AgreesWithNextFieldOnEdgeLines)
{
    for (const char* delimiter : {"Comma", "Tab", "Space", "User Defined"})
        for (int consecutive : {0, 1})
            for (int leading : {0, 1}) {
                CAsciiSpecification spec = Spec(delimiter, consecutive, leading);
                for (std::string line : kLines) {
                    if (std::string(delimiter) == "Tab")
                        std::replace(line.begin(), line.end(), ',', '\t');
                    if (std::string(delimiter) == "Space")
                        std::replace(line.begin(), line.end(), ',', ' ');
                    SCOPED_TRACE(std::string(delimiter) + " consecutive " + std::to_string(consecutive) + " leading " +
                                 std::to_string(leading));
                    ExpectSameSplit(spec, line);
                }
            }
}

TEST(FieldSplitter, AgreesWithNextFieldOnRandomLines)
{
    std::mt19937 random(20261123);
    const std::string alphabet = ",,,\"ab ";
    for (int consecutive : {0, 1})
        for (int leading : {0, 1}) {
            CAsciiSpecification spec = Spec("Comma", consecutive, leading);
            for (int n = 0; n < 3000; ++n) {
                std::string line;
                const size_t length = random() % 12;
                for (size_t i = 0; i < length; ++i)
                    line += alphabet[random() % alphabet.size()];
                ExpectSameSplit(spec, line);
            }
        }
}

// Long fields and lines, so that delimiters fall on every position of a sixteen-byte block.
TEST(FieldSplitter, AgreesWithNextFieldOnLongLines)
{
    std::mt19937 random(7);
    const std::string alphabet = "abcdefgh. -0123456789";
    CAsciiSpecification spec = Spec("Tab", 0, 0);
    for (int n = 0; n < 3000; ++n) {
        std::string line;
        const size_t length = random() % 80;
        const unsigned spread = 1 + random() % 40; // one delimiter in `spread` characters
        for (size_t i = 0; i < length; ++i)
            line += random() % spread == 0 ? '\t' : alphabet[random() % alphabet.size()];
        if (random() % 8 == 0)
            line += '"';
        ExpectSameSplit(spec, line);
    }
}

TEST(FieldSplitter, LeadingDelimitersCutShiftTheLine)
{
    CAsciiSpecification spec = Spec("Comma", 0, 1);
    delimited::FieldSplitter splitter(spec.GetDialect());
    splitter.Split(",,a,b");
    EXPECT_EQ(splitter.Line(), "a,b");
    EXPECT_EQ(splitter.Offset(), 2);
    ASSERT_GE(splitter.Calls().size(), 2u);
    EXPECT_EQ(splitter.Calls()[0].text, "a");
}

} // namespace
