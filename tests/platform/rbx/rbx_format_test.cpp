// The bytes on disk stay what docs/rbx0-format.md shows, and the axis calls answer per axis type.
#include "tests/support/RbxFiles.h"

#include "platform/rbx/Rbx.h"
#include "platform/rbx/RbxReader.h"

using namespace testsupport;

namespace {

rbx::FileDefinition GaugeDefinition()
{
    rbx::FileDefinition definition;
    definition.title = "Gauge";
    definition.calendarStart = COleDateTime(2020, 1, 1, 0, 0, 0);
    rbx::ItemInfo item = Item("Level", rbx::kFloat32, -999.0);
    item.unitText = "m";
    definition.items = {item};
    return definition;
}

// Files written by earlier builds must stay readable, and new files must not drift from the layout.
TEST(RbxFormat, TheWriterProducesTheDocumentedExampleByteForByte)
{
    ScratchFolder folder;
    const std::string path = folder.File("gauge.rbx0");
    WriteRbxFile(path, GaugeDefinition(), {0.0, 3600.0}, {{1.25}, {1.5}});
    const auto golden = ReadBytes(std::string(VELMORA_TEST_DATA) + "/rbx/gauge.rbx0");
    ASSERT_EQ(golden.size(), 178u);
    EXPECT_EQ(ReadBytes(path), golden);
}

TEST(RbxFormat, TheDocumentedExampleReads)
{
    rbx::CRbxReader reader;
    ASSERT_TRUE(reader.Open(std::string(VELMORA_TEST_DATA) + "/rbx/gauge.rbx0")) << reader.status().problem().Describe();
    EXPECT_EQ(reader.Header().title, "Gauge");
    EXPECT_EQ(reader.Header().axis.type, rbx::kEquidistantCalendar);
    EXPECT_EQ(reader.Header().axis.step, 3600.0);
    EXPECT_EQ(reader.Header().deleteValue, -999.0);
    double times[2], values[2];
    std::size_t got = 0;
    ASSERT_TRUE(reader.ReadSteps(2, times, values, got));
    ASSERT_EQ(got, 2u);
    EXPECT_EQ(values[1], 1.5);
}

TEST(RbxCalls, EachAxisCallAnswersOnlyForItsAxisType)
{
    struct Case {
        bool calendar;
        std::vector<double> times;
        int axisType;
        double stepOrSpan;
    };
    const std::vector<Case> cases = {
        {false, {0, 2, 4}, 1, 2.0},
        {false, {0, 1.5, 4}, 2, 4.0},
        {true, {0, 2, 4}, 3, 2.0},
        {true, {0, 1.5, 4}, 4, 4.0},
    };
    ScratchFolder folder;
    for (const Case& c : cases) {
        SCOPED_TRACE(c.axisType);
        const std::string path = folder.File("axis.rbx0");
        auto definition = Definition({Item("A", rbx::kFloat32)}, c.calendar);
        definition.timeUnitKey = 1402;
        definition.timeUnitText = "hour";
        definition.startOffset = 0.5;
        definition.startIndex = 7;
        WriteRbxFile(path, definition, c.times, {{1}, {2}, {3}});

        rbxHeader* header = nullptr;
        rbxFile* file = nullptr;
        ASSERT_EQ(rbxFileRead(path.c_str(), &header, &file), 0) << rbxLastError();
        ASSERT_EQ(rbxGetTimeAxisType(header), c.axisType);
        CString date = "unset", time = "unset", unitText;
        int unitKey = 0, steps = 0, index = 0;
        double start = 0, step = 0;
        const int results[4] = {
            rbxGetEqTimeAxis(header, &unitKey, &unitText, &start, &step, &steps, &index),
            rbxGetNeqTimeAxis(header, &unitKey, &unitText, &start, &step, &steps, &index),
            rbxGetEqCalendarAxis(header, &date, &time, &unitKey, &unitText, &start, &step, &steps, &index),
            rbxGetNeqCalendarAxis(header, &date, &time, &unitKey, &unitText, &start, &step, &steps, &index),
        };
        for (int type = 1; type <= 4; ++type)
            EXPECT_EQ(results[type - 1] == 0, type == c.axisType) << "call for axis type " << type;
        EXPECT_EQ(unitKey, 1402);
        EXPECT_EQ(unitText, "hour");
        EXPECT_EQ(start, 0.5);
        EXPECT_EQ(step, c.stepOrSpan);
        EXPECT_EQ(steps, 3);
        EXPECT_EQ(index, 7);
        EXPECT_EQ(date, c.calendar ? "2020-01-01" : "unset");
        EXPECT_EQ(time, c.calendar ? "00:00:00" : "unset");

        double stepTime = -1;
        float value = 0;
        std::vector<double> seen;
        while (rbxReadItemTimeStep(header, file, &stepTime, &value) == 0)
            seen.push_back(stepTime);
        EXPECT_EQ(seen, c.times);
        rbxFileClose(header, file);
        rbxHeaderDestroy(header);
    }
}

TEST(RbxCalls, ItemInfoSkipsNullOutputsAndGivesPerItemDeleteValues)
{
    ScratchFolder folder;
    const std::string path = folder.File("items.rbx0");
    rbx::ItemInfo rain = Item("Rain", rbx::kInt16, -1);
    rain.itemTypeKey = 103;
    rain.itemTypeText = "Rainfall";
    rain.unitKey = 1002;
    rain.unitText = "mm";
    rain.valueType = rbx::kStepAccumulated;
    WriteRbxFile(path, Definition({Item("Level", rbx::kFloat32, -999), rain}), {0}, {{1, 2}});

    rbxHeader* header = nullptr;
    rbxFile* file = nullptr;
    ASSERT_EQ(rbxFileRead(path.c_str(), &header, &file), 0) << rbxLastError();
    EXPECT_EQ(rbxGetFileType(header), 4);
    rbxItem* item = rbxItemD(header, 2);
    int typeKey = 0, unitKey = 0, dataType = 0, valueType = -1;
    CString typeText, name = "untouched", unitText;
    ASSERT_EQ(rbxGetItemInfo(item, &typeKey, &typeText, nullptr, &unitKey, &unitText, &dataType), 0);
    EXPECT_EQ(typeKey, 103);
    EXPECT_EQ(typeText, "Rainfall");
    EXPECT_EQ(name, "untouched");
    EXPECT_EQ(unitKey, 1002);
    EXPECT_EQ(unitText, "mm");
    EXPECT_EQ(dataType, 6);
    ASSERT_EQ(rbxGetItemValueType(item, &valueType), 0);
    EXPECT_EQ(valueType, rbx::kStepAccumulated);
    double deleteValue = 0;
    ASSERT_EQ(rbxGetItemDeleteValue(rbxItemD(header, 1), &deleteValue), 0);
    EXPECT_EQ(deleteValue, -999.0);
    ASSERT_EQ(rbxGetItemDeleteValue(item, &deleteValue), 0);
    EXPECT_EQ(deleteValue, -1.0);
    CString title;
    ASSERT_EQ(rbxGetTitle(header, &title), 0);
    EXPECT_EQ(title, "Test file");
    rbxFileClose(header, file);
    rbxHeaderDestroy(header);
}

} // namespace
