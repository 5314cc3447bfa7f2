#include "ParserTestSupport.h"
#include "parsers/ParserFactory.h"
#include "parsers/RbxPreviewFileParser.h"
#include "platform/rbx/RbxWriter.h"
#include "platform/system/Text.h"
#include "platform/units/Units.h"

#include <gtest/gtest.h>

#include <fstream>
#include <sys/stat.h>

namespace {

rbx::ItemInfo Item(const char* name, int dataType, int axisType = rbx::kScalarItem, unsigned elements = 1)
{
    rbx::ItemInfo item;
    item.name = name;
    item.itemTypeKey = 102;
    item.itemTypeText = "Discharge";
    item.unitKey = 1300;
    item.unitText = "m^3/s";
    item.dataType = dataType;
    item.axisType = axisType;
    item.elementCount = elements;
    return item;
}

struct Step {
    double time;
    std::vector<double> values;
};

class RbxParserTest : public ::testing::Test {
protected:
    std::string Write(const rbx::FileDefinition& definition, const std::vector<Step>& steps)
    {
        const std::string path = folder.File("series.rbx0");
        rbx::CRbxWriter writer;
        EXPECT_TRUE(writer.Open(path, definition)) << writer.status().problem().Describe();
        for (const Step& step : steps)
            EXPECT_TRUE(writer.WriteStep(step.time, step.values.data())) << writer.status().problem().Describe();
        EXPECT_TRUE(writer.Close()) << writer.status().problem().Describe();
        return path;
    }

    static rbx::FileDefinition Calendar(int unitKey, std::vector<rbx::ItemInfo> items)
    {
        rbx::FileDefinition definition;
        definition.calendar = true;
        definition.timeUnitKey = unitKey;
        definition.calendarStart = COleDateTime(2020, 1, 1, 0, 0, 0);
        definition.items = std::move(items);
        return definition;
    }

    CStringList Stamps() const
    {
        CStringList stamps;
        for (const ui::Row& row : parser.m_vecRows)
            stamps.push_back(row.at(0));
        return stamps;
    }

    testsupport::ScratchFolder folder;
    ui::ScriptedUserInterface ui;
    ui::ScopedUserInterface scope{ui};
    CRbxPreviewFileParser parser;
};

TEST_F(RbxParserTest, EquidistantCalendarAxisInSeconds)
{
    const std::string path = Write(Calendar(units::kUnitSecond, {Item("Flow", rbx::kFloat32)}),
                                   {{0, {1}}, {3600, {2}}, {7200, {3}}});
    ASSERT_EQ(parser.Parse(path), 1);
    EXPECT_EQ(Stamps(), (CStringList{"2020-01-01 00:00:00", "2020-01-01 01:00:00", "2020-01-01 02:00:00"}));
    EXPECT_EQ(parser.m_vecItemNames, (CStringList{"Date/time", "Flow"}));
    EXPECT_EQ(parser.m_strFile, path); // a successful parse binds the parser
    EXPECT_TRUE(parser.m_vecRawLines.empty());
}

TEST_F(RbxParserTest, NonEquidistantCalendarAxisUsesTheStepTimes)
{
    const std::string path = Write(Calendar(units::kUnitHour, {Item("Flow", rbx::kFloat64)}),
                                   {{0, {1}}, {1.5, {2}}, {4, {3}}});
    ASSERT_EQ(parser.Parse(path), 1);
    EXPECT_EQ(Stamps(), (CStringList{"2020-01-01 00:00:00", "2020-01-01 01:30:00", "2020-01-01 04:00:00"}));
}

TEST_F(RbxParserTest, StartOffsetCountsInTheAxisUnit)
{
    rbx::FileDefinition definition = Calendar(units::kUnitHour, {Item("Flow", rbx::kFloat32)});
    definition.startOffset = 2.5;
    ASSERT_EQ(parser.Parse(Write(definition, {{0, {1}}, {1, {2}}})), 1);
    EXPECT_EQ(Stamps(), (CStringList{"2020-01-01 02:30:00", "2020-01-01 03:30:00"}));
}

TEST_F(RbxParserTest, RelativeAxesCountFromTheOleEpoch)
{
    struct Case {
        std::vector<Step> steps;
        CStringList stamps;
    };
    const Case cases[] = {
        {{{0, {1}}, {1, {2}}}, {"1899-12-30 00:00:00", "1899-12-30 01:00:00"}},               // equidistant
        {{{0, {1}}, {0.5, {2}}, {26, {3}}}, {"1899-12-30 00:00:00", "1899-12-30 00:30:00", "1899-12-31 02:00:00"}},
    };
    for (const Case& c : cases) {
        rbx::FileDefinition definition;
        definition.calendar = false;
        definition.timeUnitKey = units::kUnitHour;
        definition.items = {Item("Flow", rbx::kFloat32)};
        ASSERT_EQ(parser.Parse(Write(definition, c.steps)), 1);
        EXPECT_EQ(Stamps(), c.stamps);
    }
}

TEST_F(RbxParserTest, EveryDataTypeAsText)
{
    const std::string path = Write(Calendar(units::kUnitSecond,
                                            {Item("f32", rbx::kFloat32), Item("f64", rbx::kFloat64),
                                             Item("chr", rbx::kChar), Item("i32", rbx::kInt32),
                                             Item("u32", rbx::kUInt32), Item("i16", rbx::kInt16),
                                             Item("int", rbx::kInteger)}),
                                   {{0, {2.5, -0.125, 65, 7, 3000000000.0, -3, 1099511627776.0}}});
    ASSERT_EQ(parser.Parse(path), 1);
    ASSERT_EQ(parser.m_vecRows.size(), 1u);
    EXPECT_EQ(parser.m_vecRows[0], (ui::Row{"2020-01-01 00:00:00", "2.500000", "-0.125000", "A", "7", "3000000000",
                                            "-3", "1099511627776"}));
}

// The values are formatted without printf for speed; the texts must stay printf's "%f" to the letter,
// rounding ties, tiny and huge magnitudes, negative zero and infinities included (a NaN is stored
// as the delete value, so it never reaches the text).
TEST_F(RbxParserTest, FloatTextsAreExactlyPrintfs)
{
    const std::vector<double> values = {
        0.0, -0.0, 0.5e-6, 1.5e-6, 2.5e-6, 0.1234565, 1e-300, -1e-7, 123456.7890125, 1e15 + 0.3, 1e300,
        -1.7976931348623157e308, 1.0 / 0.0, -1.0 / 0.0};
    std::vector<rbx::ItemInfo> items;
    for (size_t i = 0; i < values.size(); ++i)
        items.push_back(Item("v", rbx::kFloat64));
    items.push_back(Item("f", rbx::kFloat32));
    std::vector<double> step = values;
    step.push_back(0.1); // read back as the float nearest 0.1, printed through double
    const std::string path = Write(Calendar(units::kUnitSecond, items), {{0, step}});
    ASSERT_EQ(parser.Parse(path), 1);
    ASSERT_EQ(parser.m_vecRows.size(), 1u);
    const ui::Row& row = parser.m_vecRows[0];
    ASSERT_EQ(row.size(), values.size() + 2);
    for (size_t i = 0; i < values.size(); ++i)
        EXPECT_EQ(row[i + 1], text::Format("%f", values[i])) << i;
    EXPECT_EQ(row.back(), text::Format("%f", static_cast<double>(0.1f)));
}

TEST_F(RbxParserTest, ProfileItemFailsAllButTheNames)
{
    const std::string path = Write(Calendar(units::kUnitSecond, {Item("Level", rbx::kFloat32),
                                                                 Item("Profile", rbx::kFloat32, rbx::kProfileItem, 3)}),
                                   {{0, {1, 2, 3, 4}}});
    EXPECT_EQ(parser.Parse(path), 0);
    parser.SetFile(path);
    CStringList list{"x"};
    EXPECT_EQ(parser.GetItemTypes(list), 0);
    EXPECT_EQ(parser.GetUnits(list), 0);
    EXPECT_EQ(parser.GetValueTypes(list), 0);
    ASSERT_EQ(parser.GetItemNames(list), 1);
    EXPECT_EQ(list, (CStringList{"Level", "Profile"}));
    EXPECT_TRUE(ui.boxes.empty()); // this parser never shows a message
}

TEST_F(RbxParserTest, ItemDescriptionsOfAGoodFile)
{
    rbx::ItemInfo level = Item("Level", rbx::kFloat32);
    level.itemTypeText = "Water Level";
    level.unitText = "m";
    const std::string path = Write(Calendar(units::kUnitSecond, {level, Item("Flow", rbx::kInt32)}), {{0, {1, 2}}});
    parser.SetFile(path);
    CStringList list{"stale"};
    ASSERT_EQ(parser.GetItemNames(list), 1);
    EXPECT_EQ(list, (CStringList{"Level", "Flow"}));
    ASSERT_EQ(parser.GetItemTypes(list), 1);
    EXPECT_EQ(list, (CStringList{"Water Level", "Discharge"}));
    ASSERT_EQ(parser.GetUnits(list), 1);
    EXPECT_EQ(list, (CStringList{"m", "m^3/s"}));
    ASSERT_EQ(parser.GetValueTypes(list), 1);
    EXPECT_TRUE(list.empty());
    int count = 42;
    EXPECT_EQ(parser.GetItemCount(count), 1);
    EXPECT_EQ(count, 42);
}

TEST_F(RbxParserTest, UnreadableFilesGiveZeroQuietly)
{
    const std::string good = Write(Calendar(units::kUnitSecond, {Item("Flow", rbx::kFloat32)}), {{0, {1}}});
    std::string bytes;
    {
        std::ifstream in(good, std::ios::binary);
        bytes.assign(std::istreambuf_iterator<char>(in), {});
    }
    const std::string damaged = folder.Write("damaged.rbx0", bytes.substr(0, bytes.size() / 2));
    const std::string text = folder.Write("text.rbx0", "Time\tA\n");
    const std::string fifo = folder.File("fifo.rbx0");
    ASSERT_EQ(::mkfifo(fifo.c_str(), 0600), 0);
    const std::pair<std::string, const char*> cases[] = {
        {damaged, "rbx0 header"}, {text, "rbx0"}, {folder.File("absent.rbx0"), "does not exist"}, {fifo, "FIFO"}};
    for (const auto& [path, reason] : cases) {
        parser.m_vecRows = {{"old"}};
        EXPECT_EQ(ParseGuarded(parser, path), 0) << path;
        EXPECT_TRUE(parser.m_vecRows.empty());
        // Quiet for the user, but the reason is there for whoever reports it.
        EXPECT_EQ(parser.m_strFailure.rfind(path + ": ", 0), 0u) << parser.m_strFailure;
        EXPECT_NE(parser.m_strFailure.find(reason), std::string::npos) << parser.m_strFailure;
        parser.SetFile(path);
        CStringList names;
        EXPECT_EQ(parser.GetItemNames(names), 0) << path;
        EXPECT_EQ(parser.GetItemTypes(names), 0) << path;
    }
    EXPECT_TRUE(ui.boxes.empty());
}

TEST_F(RbxParserTest, PreviewShowsOnlyTheResult)
{
    const std::string path = Write(Calendar(units::kUnitSecond, {Item("Flow", rbx::kFloat32)}), {{0, {1}}});
    ASSERT_EQ(parser.Parse(path), 1);
    ASSERT_EQ(parser.ShowPreview(""), 1);
    ASSERT_EQ(ui.previews.size(), 1u);
    EXPECT_TRUE(ui.previews[0].inputLines.empty());
    EXPECT_EQ(ui.previews[0].title, "series.rbx0");
    EXPECT_EQ(ui.previews[0].headers, (CStringList{"Date/time", "Flow"}));
}

} // namespace
