// Write-then-read round trips: every data type under every time axis kind, through the C++ reader
// and the C-style calls.
#include "tests/support/RbxFiles.h"

#include "platform/rbx/Rbx.h"
#include "platform/rbx/RbxReader.h"

#include <cmath>
#include <cstdint>
#include <cstring>
#include <filesystem>

using namespace testsupport;

namespace {

struct TypeCase {
    int dataType;
    std::vector<double> values; // one per step, exactly representable in the type
};

const std::vector<TypeCase> kTypeCases = {
    {rbx::kFloat32, {2.5, -0.125, 1099511627776.0}},
    {rbx::kFloat64, {0.1, -1.0e300, 3.0}},
    {rbx::kChar, {65.0, 0.0, 255.0}},
    {rbx::kInt32, {-2147483648.0, 7.0, 2147483647.0}},
    {rbx::kUInt32, {0.0, 3000000000.0, 4294967295.0}},
    {rbx::kInt16, {-3.0, -32768.0, 32767.0}},
    {rbx::kInteger, {-9007199254740992.0, 0.0, 9007199254740992.0}},
};

struct AxisCase {
    bool calendar;
    std::vector<double> times;
    int expectedAxisType;
    double expectedStep;
};

const std::vector<AxisCase> kAxisCases = {
    {true, {0.0, 3600.0, 7200.0}, rbx::kEquidistantCalendar, 3600.0},
    {true, {0.0, 5400.0, 14400.0}, rbx::kNonEquidistantCalendar, 14400.0},
    {false, {10.0, 12.5, 15.0}, rbx::kEquidistantRelative, 2.5},
    {false, {0.0, 1.0, 4.0}, rbx::kNonEquidistantRelative, 4.0},
};

class RoundTrip : public ::testing::TestWithParam<std::tuple<TypeCase, AxisCase>> {};

TEST_P(RoundTrip, ReaderGivesBackHeaderTimesAndValues)
{
    const auto& [type, axis] = GetParam();
    ScratchFolder folder;
    const std::string path = folder.File("roundtrip.rbx0");
    std::vector<std::vector<double>> rows;
    for (std::size_t s = 0; s < type.values.size(); ++s)
        rows.push_back({type.values[s], type.values[(s + 1) % type.values.size()]});
    auto definition = Definition({Item("Level", type.dataType, 1.0), Item("Second", type.dataType, 1.0)}, axis.calendar);
    WriteRbxFile(path, definition, axis.times, rows);

    rbx::CRbxReader reader;
    ASSERT_TRUE(reader.Open(path)) << reader.status().problem().Describe();
    const rbx::FileHeader& h = reader.Header();
    EXPECT_EQ(h.fileType, rbx::kSharedDeleteValue);
    EXPECT_EQ(h.dataType, type.dataType);
    EXPECT_EQ(h.title, "Test file");
    EXPECT_EQ(h.axis.type, axis.expectedAxisType);
    EXPECT_DOUBLE_EQ(h.axis.step, axis.expectedStep);
    EXPECT_EQ(h.axis.steps, 3u);
    EXPECT_EQ(h.axis.unitKey, 1400);
    EXPECT_EQ(h.axis.unitText, "second");
    EXPECT_EQ(h.axis.startDate, axis.calendar ? "2020-01-01" : "");
    EXPECT_EQ(h.axis.startTime, axis.calendar ? "00:00:00" : "");
    ASSERT_EQ(h.items.size(), 2u);
    EXPECT_EQ(h.items[1].name, "Second");
    EXPECT_EQ(h.items[0].itemTypeText, "Water Level");
    EXPECT_EQ(h.items[0].unitKey, 1000);

    std::vector<double> times(4), values(8);
    std::size_t got = 0;
    ASSERT_TRUE(reader.ReadSteps(4, times.data(), values.data(), got)) << reader.status().problem().Describe();
    ASSERT_EQ(got, 3u);
    for (std::size_t s = 0; s < 3; ++s) {
        EXPECT_EQ(times[s], axis.times[s]);
        EXPECT_EQ(values[2 * s], rows[s][0]);
        EXPECT_EQ(values[2 * s + 1], rows[s][1]);
    }
    ASSERT_TRUE(reader.ReadSteps(4, times.data(), values.data(), got));
    EXPECT_EQ(got, 0u);
    EXPECT_TRUE(reader.AtEnd());
}

INSTANTIATE_TEST_SUITE_P(AllTypesAllAxes, RoundTrip, ::testing::Combine(::testing::ValuesIn(kTypeCases), ::testing::ValuesIn(kAxisCases)));

// The C-style calls read the same files value by value in the item's own type.
TEST(RbxCalls, ReadValuesOneByOneInTheirOwnTypes)
{
    ScratchFolder folder;
    const std::string path = folder.File("mixed.rbx0");
    auto definition = Definition({Item("F", rbx::kFloat32, 0), Item("U", rbx::kUInt32, 0), Item("S", rbx::kInt16, 0),
                                  Item("C", rbx::kChar, 0), Item("I", rbx::kInteger, 0)});
    WriteRbxFile(path, definition, {0.0, 60.0}, {{2.5, 3000000000.0, -3.0, 'x', -5.0}, {7.0, 1.0, 2.0, 'y', 1e15}});

    ASSERT_EQ(rbxInitSystem(), 0);
    rbxHeader* header = nullptr;
    rbxFile* file = nullptr;
    ASSERT_EQ(rbxFileRead(path.c_str(), &header, &file), 0) << rbxLastError();
    EXPECT_EQ(rbxGetFileType(header), 1);
    EXPECT_EQ(rbxGetDataType(header), 0); // items differ
    EXPECT_EQ(rbxGetTimeAxisType(header), 3);
    EXPECT_EQ(rbxGetNoOfItems(header), 5);
    EXPECT_EQ(rbxItemD(header, 0), nullptr);
    EXPECT_EQ(rbxItemD(header, 6), nullptr);

    CString date, time, unitText;
    int unitKey = 0, steps = 0, index = -1;
    double start = -1, step = 0;
    ASSERT_EQ(rbxGetEqCalendarAxis(header, &date, &time, &unitKey, &unitText, &start, &step, &steps, &index), 0);
    EXPECT_EQ(date, "2020-01-01");
    EXPECT_EQ(time, "00:00:00");
    EXPECT_EQ(unitKey, 1400);
    EXPECT_EQ(start, 0.0);
    EXPECT_EQ(step, 60.0);
    EXPECT_EQ(steps, 2);
    EXPECT_EQ(index, 0);
    EXPECT_NE(rbxGetNeqCalendarAxis(header, &date, &time, &unitKey, &unitText, &start, &step, &steps, &index), 0);
    EXPECT_NE(rbxGetEqTimeAxis(header, &unitKey, &unitText, &start, &step, &steps, &index), 0);

    CString name;
    int dataType = 0;
    ASSERT_EQ(rbxGetItemInfo(rbxItemD(header, 2), nullptr, nullptr, &name, nullptr, nullptr, &dataType), 0);
    EXPECT_EQ(name, "U");
    EXPECT_EQ(dataType, 5);
    EXPECT_EQ(rbxGetItemAxisType(rbxItemD(header, 2)), 1);

    double t = -1;
    float f = 0;
    std::uint32_t u = 0;
    std::int16_t s16 = 0;
    char c = 0;
    std::int64_t i64 = 0;
    for (double expectedTime : {0.0, 60.0}) {
        ASSERT_EQ(rbxReadItemTimeStep(header, file, &t, &f), 0) << rbxLastError();
        EXPECT_EQ(t, expectedTime);
        ASSERT_EQ(rbxReadItemTimeStep(header, file, &t, &u), 0);
        ASSERT_EQ(rbxReadItemTimeStep(header, file, &t, &s16), 0);
        ASSERT_EQ(rbxReadItemTimeStep(header, file, &t, &c), 0);
        ASSERT_EQ(rbxReadItemTimeStep(header, file, &t, &i64), 0);
        EXPECT_EQ(t, expectedTime);
        if (expectedTime == 0.0) {
            EXPECT_EQ(f, 2.5f);
            EXPECT_EQ(u, 3000000000u);
            EXPECT_EQ(s16, -3);
            EXPECT_EQ(c, 'x');
            EXPECT_EQ(i64, -5);
        }
    }
    EXPECT_EQ(f, 7.0f);
    EXPECT_EQ(i64, 1000000000000000);
    EXPECT_NE(rbxReadItemTimeStep(header, file, &t, &f), 0);
    rbxFileClose(header, file);
    rbxHeaderDestroy(header);
}

TEST(RbxWriter, DecidesTheAxisKindFromTheSteps)
{
    struct Case {
        const char* what;
        bool calendar;
        std::vector<double> times;
        int axisType;
        double step;
    };
    const std::vector<Case> cases = {
        {"no steps", true, {}, rbx::kEquidistantCalendar, 0.0},
        {"one step", true, {5.0}, rbx::kEquidistantCalendar, 0.0},
        {"two steps", false, {1.0, 3.0}, rbx::kEquidistantRelative, 2.0},
        {"last step differs", true, {0, 10, 20, 30, 41}, rbx::kNonEquidistantCalendar, 41.0},
        {"rounding noise is still equal", false, {0.0, 0.1, 0.2, 0.30000000000000004}, rbx::kEquidistantRelative, 0.1},
    };
    ScratchFolder folder;
    for (const Case& c : cases) {
        SCOPED_TRACE(c.what);
        const std::string path = folder.File("axis.rbx0");
        std::vector<std::vector<double>> rows(c.times.size(), {1.0});
        WriteRbxFile(path, Definition({Item("A", rbx::kFloat32)}, c.calendar), c.times, rows);
        rbx::CRbxReader reader;
        ASSERT_TRUE(reader.Open(path)) << reader.status().problem().Describe();
        EXPECT_EQ(reader.Header().axis.type, c.axisType);
        EXPECT_DOUBLE_EQ(reader.Header().axis.step, c.step);
        EXPECT_EQ(reader.Header().axis.steps, c.times.size());
    }
}

TEST(RbxWriter, CalendarStampsCountFromTheFirstStampInTheAxisUnit)
{
    ScratchFolder folder;
    const std::string path = folder.File("stamps.rbx0");
    auto definition = Definition({Item("A", rbx::kFloat64)});
    definition.calendarStart.reset();
    definition.timeUnitKey = 1402;
    definition.timeUnitText = "hour";
    rbx::CRbxWriter writer;
    ASSERT_TRUE(writer.Open(path, definition)) << writer.status().problem().Describe();
    const double value = 1.0;
    ASSERT_TRUE(writer.WriteStepAt(COleDateTime(2021, 6, 30, 22, 0, 0), &value));
    ASSERT_TRUE(writer.WriteStepAt(COleDateTime(2021, 6, 30, 23, 30, 0), &value));
    ASSERT_TRUE(writer.WriteStepAt(COleDateTime(2021, 7, 1, 2, 0, 0), &value));
    ASSERT_TRUE(writer.Close()) << writer.status().problem().Describe();

    rbx::CRbxReader reader;
    ASSERT_TRUE(reader.Open(path)) << reader.status().problem().Describe();
    EXPECT_EQ(reader.Header().axis.startDate, "2021-06-30");
    EXPECT_EQ(reader.Header().axis.startTime, "22:00:00");
    EXPECT_EQ(reader.Header().axis.type, rbx::kNonEquidistantCalendar);
    std::vector<double> times(3), values(3);
    std::size_t got = 0;
    ASSERT_TRUE(reader.ReadSteps(3, times.data(), values.data(), got));
    EXPECT_EQ(times, (std::vector<double>{0.0, 1.5, 4.0}));
}

TEST(RbxWriter, DifferentDeleteValuesMakeAPerItemFileAndNaNStoresTheDeleteValue)
{
    ScratchFolder folder;
    const std::string path = folder.File("deletes.rbx0");
    WriteRbxFile(path, Definition({Item("A", rbx::kFloat32, -1e-35), Item("B", rbx::kInt32, -9999)}), {0.0},
              {{NAN, NAN}});
    rbx::CRbxReader reader;
    ASSERT_TRUE(reader.Open(path)) << reader.status().problem().Describe();
    EXPECT_EQ(reader.Header().fileType, rbx::kPerItemDeleteValue);
    EXPECT_EQ(reader.Header().items[0].deleteValue, -1e-35);
    EXPECT_EQ(reader.Header().items[1].deleteValue, -9999.0);
    double time = 0, values[2] = {0, 0};
    std::size_t got = 0;
    ASSERT_TRUE(reader.ReadSteps(1, &time, values, got));
    EXPECT_EQ(values[0], static_cast<double>(-1e-35f));
    EXPECT_EQ(values[1], -9999.0);
}

TEST(RbxWriter, RejectsWhatTheFormatCannotHoldAndLeavesNoFileBehind)
{
    struct Case {
        const char* what;
        std::vector<rbx::ItemInfo> items;
        std::vector<double> times;
        std::vector<double> values;
        const char* message;
    };
    const std::vector<Case> cases = {
        {"time goes back", {Item("A", rbx::kFloat32)}, {10.0, 5.0}, {1, 1}, "does not come after"},
        {"repeated time", {Item("A", rbx::kFloat32)}, {10.0, 10.0}, {1, 1}, "does not come after"},
        {"int16 overflow", {Item("A", rbx::kInt16)}, {0.0}, {40000.0}, "does not fit its data type"},
        {"negative unsigned", {Item("A", rbx::kUInt32, 0)}, {0.0}, {-1.0}, "does not fit its data type"},
        {"float overflow", {Item("A", rbx::kFloat32)}, {0.0}, {1e300}, "does not fit its data type"},
        {"unknown data type", {Item("A", 9)}, {}, {}, "unknown data type 9"},
        {"delete value beyond int16", {Item("A", rbx::kInt16, 1e6)}, {}, {}, "delete value"},
    };
    ScratchFolder folder;
    for (const Case& c : cases) {
        SCOPED_TRACE(c.what);
        const std::string path = folder.File("bad.rbx0");
        rbx::CRbxWriter writer;
        bool ok = writer.Open(path, Definition(c.items)).ok();
        for (std::size_t s = 0; ok && s < c.times.size(); ++s)
            ok = writer.WriteStep(c.times[s], &c.values[s]);
        ok = ok && writer.Close();
        EXPECT_FALSE(ok);
        EXPECT_NE(writer.status().problem().Describe().find(c.message), std::string::npos) << writer.status().problem().Describe();
        EXPECT_EQ(writer.status().problem().Describe().rfind(path, 0), 0u) << "the message names the file";
        writer.Close();
        EXPECT_FALSE(std::filesystem::exists(path));
    }
}

TEST(RbxWriter, ProfileItemsCarryAllTheirValuesPerStep)
{
    ScratchFolder folder;
    const std::string path = folder.File("profile.rbx0");
    auto profile = Item("Profile", rbx::kFloat64);
    profile.axisType = rbx::kProfileItem;
    profile.elementCount = 3;
    WriteRbxFile(path, Definition({Item("A", rbx::kInt32), profile}), {0.0, 1.0}, {{1, 10, 11, 12}, {2, 20, 21, 22}});

    rbxHeader* header = nullptr;
    rbxFile* file = nullptr;
    ASSERT_EQ(rbxFileRead(path.c_str(), &header, &file), 0) << rbxLastError();
    EXPECT_EQ(rbxGetItemAxisType(rbxItemD(header, 2)), 2);
    EXPECT_EQ(rbxGetItemElementCount(rbxItemD(header, 2)), 3);
    double t = 0, p[3] = {0, 0, 0};
    std::int32_t a = 0;
    ASSERT_EQ(rbxReadItemTimeStep(header, file, &t, &a), 0);
    ASSERT_EQ(rbxReadItemTimeStep(header, file, &t, p), 0);
    ASSERT_EQ(rbxReadItemTimeStep(header, file, &t, &a), 0);
    ASSERT_EQ(rbxReadItemTimeStep(header, file, &t, p), 0);
    EXPECT_EQ(a, 2);
    EXPECT_EQ(p[0], 20.0);
    EXPECT_EQ(p[2], 22.0);
    rbxFileClose(header, file);
    rbxHeaderDestroy(header);
}

TEST(RbxWriter, ManyStepsCrossTheWriteBufferAndBlockReadsStayInOrder)
{
    ScratchFolder folder;
    const std::string path = folder.File("long.rbx0");
    rbx::CRbxWriter writer;
    ASSERT_TRUE(writer.Open(path, Definition({Item("A", rbx::kFloat64), Item("B", rbx::kInt32)}, false)));
    const std::size_t steps = 200000; // about 3 MB, several flushes
    for (std::size_t s = 0; s < steps; ++s) {
        const double values[2] = {s * 0.5, static_cast<double>(s)};
        ASSERT_TRUE(writer.WriteStep(static_cast<double>(s), values));
    }
    ASSERT_TRUE(writer.Close()) << writer.status().problem().Describe();

    rbx::CRbxReader reader;
    ASSERT_TRUE(reader.Open(path, rbx::VerifyChecksum::AtEnd)) << reader.status().problem().Describe();
    std::vector<double> times(7777), values(2 * 7777);
    std::size_t total = 0, got = 0;
    do {
        ASSERT_TRUE(reader.ReadSteps(times.size(), times.data(), values.data(), got)) << reader.status().problem().Describe();
        for (std::size_t i = 0; i < got; ++i) {
            ASSERT_EQ(times[i], static_cast<double>(total + i));
            ASSERT_EQ(values[2 * i + 1], static_cast<double>(total + i));
        }
        total += got;
    } while (got > 0);
    EXPECT_EQ(total, steps);
}

} // namespace
