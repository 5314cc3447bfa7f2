// Rows read from rbx0 files: values of every data type with their delete values, item selections
// on files of 64-bit items (copied as stored) and of mixed types (converted), stamps rounded from
// axis times, and rows across block boundaries up to a damaged step.
#include "converter/RbxSeriesReader.h"
#include "converter/StampText.h"
#include "tests/support/RbxFiles.h"

#include <gtest/gtest.h>

#include <cmath>

using namespace converter;
using testsupport::Item;

namespace {

std::vector<Row> ReadAll(RbxSeriesReader& reader)
{
    std::vector<Row> rows;
    Row row;
    while (reader.Next(row))
        rows.push_back(row);
    return rows;
}

// Missing values compare equal to each other, numbers by value.
void ExpectValues(const std::vector<double>& actual, const std::vector<double>& expected, const std::string& what)
{
    ASSERT_EQ(actual.size(), expected.size()) << what;
    for (size_t i = 0; i < expected.size(); ++i) {
        if (std::isnan(expected[i])) {
            EXPECT_TRUE(IsMissing(actual[i])) << what << " value " << i << " is " << actual[i];
        } else {
            EXPECT_EQ(actual[i], expected[i]) << what << " value " << i;
        }
    }
}

TEST(RbxSeriesReader, EveryDataTypeReadsWithItsOwnDeleteValue)
{
    testsupport::ScratchFolder folder;
    const std::string path = folder.File("types.rbx0");
    // -999.9 is not a float: the 32-bit item stores it rounded and must still know it.
    testsupport::WriteRbxFile(path,
                       testsupport::Definition({Item("F32", rbx::kFloat32, -999.9), Item("F64", rbx::kFloat64, -1e300),
                                            Item("Char", rbx::kChar, 255), Item("I32", rbx::kInt32, -2147483648.0),
                                            Item("U32", rbx::kUInt32, 0), Item("I16", rbx::kInt16, -1),
                                            Item("I64", rbx::kInteger, 123456789012.0)}),
                       {0, 60, 120}, {{0.1, 0.1, 7, -5, 4000000000.0, -32768, -9007199254740993.0},
                                      {NAN, NAN, NAN, NAN, NAN, NAN, NAN},
                                      {-999.9, 2.5, 254, 2147483647, 1, 32767, 123456789013.0}});
    RbxSeriesReader reader;
    ASSERT_TRUE(reader.Open(path)) << reader.status().problem().Describe();
    const std::vector<Row> rows = ReadAll(reader);
    ASSERT_TRUE(reader.status()) << reader.status().problem().Describe();
    ASSERT_EQ(rows.size(), 3u);
    ExpectValues(rows[0].values,
                 {static_cast<double>(0.1f), 0.1, 7, -5, 4000000000.0, -32768, -9007199254740992.0}, "first step");
    ExpectValues(rows[1].values, {NAN, NAN, NAN, NAN, NAN, NAN, NAN}, "written missing");
    ExpectValues(rows[2].values, {NAN, 2.5, 254, 2147483647, 1, 32767, 123456789013.0}, "delete value given as a number");
    EXPECT_EQ(FormatStamp(rows[2].stamp), "2020/01/01 00:02:00");
    EXPECT_EQ(reader.StepsRead(), 3u);
}

TEST(RbxSeriesReader, SelectionsReorderRepeatAndMissItems)
{
    testsupport::ScratchFolder folder;
    struct Case {
        const char* what;
        std::vector<rbx::ItemInfo> items;
    } cases[] = {
        {"64-bit items", {Item("A", rbx::kFloat64), Item("B", rbx::kFloat64), Item("C", rbx::kFloat64)}},
        {"mixed items", {Item("A", rbx::kFloat64), Item("B", rbx::kInt32), Item("C", rbx::kFloat32)}},
    };
    for (const Case& c : cases) {
        const std::string path = folder.File(std::string(c.what) + ".rbx0");
        testsupport::WriteRbxFile(path, testsupport::Definition(c.items), {0, 1}, {{1, 2, 3}, {4, NAN, 6}});
        const std::pair<std::vector<size_t>, std::vector<std::vector<double>>> selections[] = {
            {{0, 1, 2}, {{1, 2, 3}, {4, NAN, 6}}},
            {{2, 0}, {{3, 1}, {6, 4}}},
            {{1, 1}, {{2, 2}, {NAN, NAN}}},
            {{2, 7, 0}, {{3, NAN, 1}, {6, NAN, 4}}}, // 7 is not in the file
        };
        for (const auto& [selection, expected] : selections) {
            RbxSeriesReader reader;
            ASSERT_TRUE(reader.Open(path)) << reader.status().problem().Describe();
            reader.Select(selection);
            const std::vector<Row> rows = ReadAll(reader);
            ASSERT_EQ(rows.size(), expected.size()) << c.what;
            for (size_t r = 0; r < rows.size(); ++r)
                ExpectValues(rows[r].values, expected[r], std::string(c.what) + " step " + std::to_string(r));
        }
    }
}

// Axis times become whole seconds rounded half away from zero, as std::llround does, in any axis
// unit and on either side of the axis start.
TEST(RbxSeriesReader, StampsRoundAxisTimesHalfAwayFromZero)
{
    testsupport::ScratchFolder folder;
    const std::pair<int, std::vector<double>> axes[] = {
        {1400, {-1e6 - 0.5, -2.5, -1.5, -0.5, -0.49999999999999994, 0.49999999999999994, 0.5, 1.5, 2.4999999999999996,
                2.5, 4503599627370495.5}},
        {1401, {-0.125, -0.025, -1.0 / 120, 1.0 / 120, 0.025, 2.5 / 60, 0.125}}, // minutes
    };
    for (const auto& [unit, times] : axes) {
        rbx::FileDefinition definition = testsupport::Definition({Item("A", rbx::kFloat64)});
        definition.timeUnitKey = unit;
        const std::string path = folder.File("times" + std::to_string(unit) + ".rbx0");
        testsupport::WriteRbxFile(path, definition, times, std::vector<std::vector<double>>(times.size(), {1.0}));
        RbxSeriesReader reader;
        ASSERT_TRUE(reader.Open(path)) << reader.status().problem().Describe();
        const std::vector<Row> rows = ReadAll(reader);
        ASSERT_EQ(rows.size(), times.size());
        const Stamp start = *StampFromFields({2020, 1, 1, 0, 0, 0});
        const double seconds = unit == 1400 ? 1 : 60;
        for (size_t i = 0; i < rows.size(); ++i)
            EXPECT_EQ(rows[i].stamp - start, std::llround(times[i] * seconds)) << "unit " << unit << " time " << times[i];
    }
}

// Times no calendar holds (found by fuzzing: they overflowed the stamp) fail the file, at Open for
// the axis start and at the step otherwise.
TEST(RbxSeriesReader, TimesTooFarFromTheAxisStartFail)
{
    testsupport::ScratchFolder folder;
    const std::string farStep = folder.File("far_step.rbx0");
    testsupport::WriteRbxFile(farStep, testsupport::Definition({Item("A", rbx::kFloat64)}), {0, 1e17, 2e17}, {{1}, {2}, {3}});
    RbxSeriesReader reader;
    ASSERT_TRUE(reader.Open(farStep)) << reader.status().problem().Describe();
    EXPECT_EQ(ReadAll(reader).size(), 2u);
    ASSERT_FALSE(reader.status());
    EXPECT_EQ(reader.status().problem().message,
              "the time of step 3 lies too far from the start of the time axis for a time stamp");

    rbx::FileDefinition definition = testsupport::Definition({Item("A", rbx::kFloat64)});
    definition.startOffset = -1e18;
    const std::string farStart = folder.File("far_start.rbx0");
    testsupport::WriteRbxFile(farStart, definition, {0}, {{1}});
    RbxSeriesReader atOpen;
    EXPECT_FALSE(atOpen.Open(farStart));
    EXPECT_EQ(atOpen.status().problem().message,
              "the time axis start offset lies too far from its start date for a time stamp");
}

// Large enough that the checksum is checked at the end, so a damaged step is found while rows come.
TEST(RbxSeriesReader, RowsCrossBlocksInOrderUntilADamagedStep)
{
    testsupport::ScratchFolder folder;
    const std::string path = folder.File("long.rbx0");
    const size_t steps = 1100000; // 17.6 MB of records
    {
        rbx::CRbxWriter writer;
        ASSERT_TRUE(writer.Open(path, testsupport::Definition({Item("A", rbx::kFloat64)}))) << writer.status().problem().Describe();
        for (size_t s = 0; s < steps; ++s) {
            const double value = static_cast<double>(s) * 0.25;
            ASSERT_TRUE(writer.WriteStep(static_cast<double>(s), &value));
        }
        ASSERT_TRUE(writer.Close()) << writer.status().problem().Describe();
    }
    {
        RbxSeriesReader reader;
        ASSERT_TRUE(reader.Open(path)) << reader.status().problem().Describe();
        Row row;
        size_t count = 0;
        while (reader.Next(row)) {
            ASSERT_EQ(row.values[0], static_cast<double>(count) * 0.25) << count;
            ASSERT_EQ(row.stamp, *StampFromFields({2020, 1, 1, 0, 0, 0}) + static_cast<Stamp>(count)) << count;
            ++count;
        }
        EXPECT_TRUE(reader.status()) << reader.status().problem().Describe();
        EXPECT_EQ(count, steps);
        EXPECT_EQ(reader.BytesConsumed(), steps * 16);
    }
    // The time of step 70001 (in the second block of 65,536 steps) becomes NaN.
    std::vector<unsigned char> bytes = testsupport::ReadBytes(path);
    const size_t header = bytes.size() - steps * 16;
    const double nan = std::nan("");
    std::memcpy(bytes.data() + header + 70000 * 16, &nan, sizeof nan);
    testsupport::WriteBytes(path, bytes);
    RbxSeriesReader reader;
    ASSERT_TRUE(reader.Open(path)) << reader.status().problem().Describe();
    const std::vector<Row> rows = ReadAll(reader);
    EXPECT_EQ(rows.size(), 65536u);
    ASSERT_FALSE(reader.status());
    const std::string message = reader.status().problem().Describe();
    EXPECT_NE(message.find("the time of step 70001"), std::string::npos) << message;
    EXPECT_NE(message.find("(after 65536 time steps)"), std::string::npos) << message;
}

} // namespace
