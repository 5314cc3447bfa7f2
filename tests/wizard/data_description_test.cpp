// The data description page's decisions without a window: the groups the radios enable, the delete
// value controls, the unit list that follows the item type, the three row tests in their order,
// the definitions read from the file, the check of hand-made definitions, and Next's chain.
#include "tests/wizard/FormTestSupport.h"

#include "platform/system/Text.h"
#include "resources/StringTable.h"
#include "wizard/DataDescForm.h"

#include <filesystem>

namespace {

using namespace wizardtest;

const std::string kStartRow = res::LoadString(res::IDS_START_ROW_TOO_SMALL);
const std::string kNameRow = res::LoadString(res::IDS_ITEM_NAME_ROW_CLASH);
const std::string kZeroRow = res::LoadString(res::IDS_HEADER_ROW_ZERO);

class DataDescription : public FormTest {
protected:
    DataDescState Shown()
    {
        DataDescState state = InitialDataDescription();
        ShowDataDescription(state, engine.m_pSpecification ? engine.m_pSpecification->m_DataDesc : CDataDescription());
        return state;
    }
    // The message CollectDataDescription gave, or "" when it accepted the page.
    std::string Refusal(const DataDescState& state)
    {
        screen.boxes.clear();
        CDataDescription record;
        return WarningOf(CollectDataDescription(state, record));
    }
    bool TempFolderEmpty() const { return std::filesystem::is_empty(inputs.temp); }
};

TEST_F(DataDescription, TheRowsInUseAreTestedInOrderAndOnlyThey)
{
    enum { Same = 0, Row = 1, Hand = 2 };
    struct Case {
        int title;
        int nameRow;
        std::array<int, 3> options; // item type, unit, value type
        std::array<int, 3> rows;
        int startRow;
        std::string expected;
    };
    const Case cases[] = {
        {0, 2, {Row, Row, Row}, {1, 1, 1}, 3, ""}, // the defaults
        {0, 3, {Row, Row, Row}, {1, 1, 1}, 3, kStartRow},
        {0, 2, {Row, Row, Row}, {1, 2, 1}, 3, kNameRow},
        {0, 2, {Row, Same, Row}, {1, 2, 1}, 3, ""},
        {0, 2, {Row, Row, Row}, {0, 1, 1}, 5, kZeroRow},
        {0, 2, {Same, Row, Row}, {0, 1, 1}, 5, ""},
        {1, 0, {Hand, Hand, Hand}, {0, 0, 0}, 0, ""},
        {1, 9, {Same, Same, Hand}, {9, 9, 9}, 1, ""},      // no row in use
        {0, 0, {Row, Row, Row}, {0, 1, 1}, 0, kStartRow},  // all three wrong: the first test speaks
        {0, 4, {Row, Row, Row}, {0, 4, 1}, 5, kNameRow},   // 2297 before 2298
        {1, 5, {Row, Row, Row}, {5, 1, 1}, 6, ""},         // the name row is not in use
    };
    for (const Case& c : cases) {
        DataDescState state = InitialDataDescription();
        ClickTitleOption(state, c.title);
        state.nameRow = c.nameRow;
        for (size_t g = 0; g < 3; ++g) {
            ClickGroupOption(state, static_cast<DescriptionGroupIndex>(g), c.options[g]);
            state.groups[g].row = c.rows[g];
        }
        state.startRow = c.startRow;
        state.deleteValueRow = 0; // never tested
        EXPECT_EQ(Refusal(state), c.expected) << "title " << c.title << " name row " << c.nameRow << " start " << c.startRow;
    }
}

TEST_F(DataDescription, TheListsComeFromTheUnitCatalogueSorted)
{
    const DataDescState state = InitialDataDescription();
    const ChoiceList& types = state.groups[kItemTypeGroup].list;
    EXPECT_TRUE(std::is_sorted(types.entries.begin(), types.entries.end(),
                               [](const CString& a, const CString& b) { return text::ToLower(a) < text::ToLower(b); }));
    EXPECT_EQ(types.Text(), "Undefined");
    EXPECT_EQ(state.groups[kUnitGroup].list.entries, CStringList{"Undefined"});
    EXPECT_EQ(state.groups[kValueTypeGroup].list.entries,
              (CStringList{"Accumulated", "Instantaneous", "Mean_Step_Accumulated", "Reverse_Mean_Step_Accumulated",
                           "Step_Accumulated"}));
    EXPECT_EQ(state.groups[kValueTypeGroup].list.Text(), "Instantaneous");
    EXPECT_FALSE(state.groups[kItemTypeGroup].listEnabled);
    EXPECT_FALSE(state.deleteRadiosEnabled || state.deleteValueEnabled || state.deleteRowEnabled);
}

TEST_F(DataDescription, AnotherItemTypeBringsItsUnitsWithTheFirstSelected)
{
    DataDescState state = InitialDataDescription();
    ChoiceList& types = state.groups[kItemTypeGroup].list;
    const auto water = std::find(types.entries.begin(), types.entries.end(), "Water Level");
    ASSERT_NE(water, types.entries.end());
    SelectItemType(state, static_cast<int>(water - types.entries.begin()));
    EXPECT_EQ(state.groups[kUnitGroup].list.entries, (CStringList{"centimeter", "foot", "meter", "millimeter"}));
    EXPECT_EQ(state.groups[kUnitGroup].list.Text(), "centimeter");
}

TEST_F(DataDescription, AStoredUnitForAllItemsIsFoundAmongTheUnitsOfTheStoredItemType)
{
    DescribeByHand(2, inputs.asciiFile);
    CDataDescription& stored = engine.m_pSpecification->m_DataDesc;
    stored.m_nUnitTypeOption = stored.m_nUnitOption = 0;
    stored.m_strGlobalUnitType = "Water Level";
    stored.m_strGlobalUnit = "meter";
    DataDescState state = Shown();
    EXPECT_EQ(state.groups[kUnitGroup].list.entries, (CStringList{"centimeter", "foot", "meter", "millimeter"}));
    EXPECT_EQ(state.groups[kUnitGroup].list.Text(), "meter");
    CDataDescription collected;
    ASSERT_EQ(CollectDataDescription(state, collected), 1);
    EXPECT_EQ(collected.m_strGlobalUnit, "meter") << "Next stores the unit it was given";
}

TEST_F(DataDescription, TheRadiosAndTheDeleteValueBoxEnableTheirControls)
{
    DataDescState state = InitialDataDescription();
    ClickGroupOption(state, kUnitGroup, 0);
    const DescriptionGroup& unit = state.groups[kUnitGroup];
    EXPECT_TRUE(unit.listEnabled && !unit.rowEnabled && !unit.defineEnabled);
    ClickGroupOption(state, kUnitGroup, 1);
    EXPECT_TRUE(!unit.listEnabled && unit.rowEnabled && !unit.defineEnabled);
    ClickTitleOption(state, 0);
    EXPECT_TRUE(state.nameRowEnabled && !state.defineNamesEnabled);

    // Ticked while "Use delete value:" is not chosen: "Delete value in row:" is, with its row box.
    state.deleteValueUsed = 1;
    ClickDeleteValueUsed(state);
    EXPECT_EQ(state.deleteValueOption, 1);
    EXPECT_TRUE(state.deleteRadiosEnabled && state.deleteRowEnabled && !state.deleteValueEnabled);
    ClickDeleteValueOption(state, 0);
    EXPECT_TRUE(state.deleteValueEnabled && !state.deleteRowEnabled);
    state.deleteValueUsed = 0;
    ClickDeleteValueUsed(state);
    EXPECT_FALSE(state.deleteRadiosEnabled || state.deleteValueEnabled || state.deleteRowEnabled);
    EXPECT_EQ(state.deleteValueOption, 0) << "clearing the box keeps the choice";
}

TEST_F(DataDescription, AStoredRecordIsShownAndAnOptionOutOfRangeLeavesItsGroup)
{
    DescribeByHand(2, inputs.asciiFile);
    CDataDescription& stored = engine.m_pSpecification->m_DataDesc;
    stored.m_nUnitTypeOption = 0;
    stored.m_strGlobalUnitType = "rain"; // found by its beginning, in any case
    stored.m_nUnitOption = 7;
    stored.m_nDeleteValueCheck = 1;
    stored.m_nDeleteValueRadio = 0;
    stored.m_strDeleteValue = "-999";
    const DataDescState state = Shown();
    EXPECT_EQ(state.groups[kItemTypeGroup].option, 0);
    EXPECT_EQ(state.groups[kItemTypeGroup].list.Text(), "Rainfall");
    EXPECT_EQ(state.groups[kUnitGroup].option, 2) << "as the page was made";
    EXPECT_TRUE(state.groups[kUnitGroup].defineEnabled);
    EXPECT_EQ(state.deleteValueOption, 0);
    EXPECT_TRUE(state.deleteRadiosEnabled && state.deleteValueEnabled && !state.deleteRowEnabled);
    EXPECT_EQ(state.deleteValue, "-999");
}

TEST_F(DataDescription, DefinitionsComeFromTheFileOrFromThePageForAllItems)
{
    const std::string file = scratch.Write("short.txt", "Water Level[m]:Accumulated\n"
                                                        "Time\tA\tB\tC\n"
                                                        "2021/01/01 00:00:00\t1\t2\t3\n");
    DescribeByHand(2, file);
    DataDescState state = Shown();
    ClickGroupOption(state, kValueTypeGroup, 0);
    state.groups[kValueTypeGroup].list.SelectStartingWith("Step");
    std::vector<CItemDefinition> items;
    ASSERT_EQ(GetItemDefinitions(state, engine, items), 1) << (screen.boxes.empty() ? "" : screen.boxes[0].text);
    ASSERT_EQ(items.size(), 3u);
    const CItemDefinition expected[] = {{"A", "Water Level", "m", "Step_Accumulated"},
                                        {"B", "Undefined", "undefined", "Step_Accumulated"},
                                        {"C", "Undefined", "undefined", "Step_Accumulated"}};
    for (size_t i = 0; i < 3; ++i) {
        EXPECT_EQ(items[i].m_strTitle, expected[i].m_strTitle);
        EXPECT_EQ(items[i].m_strType, expected[i].m_strType);
        EXPECT_EQ(items[i].m_strUnit, expected[i].m_strUnit);
        EXPECT_EQ(items[i].m_strValueType, expected[i].m_strValueType);
    }
}

TEST_F(DataDescription, NamesDefinedByHandForMoreItemsThanDefinitionsAreNumbered)
{
    DescribeByHand(2, inputs.asciiFile);
    DataDescState state = Shown();
    ClickTitleOption(state, 1);
    state.definitions = {{"A", "Water Level", "m", "Instantaneous"}, {"B", "Discharge", "m^3/s", "Instantaneous"}};
    ManualDefinitionRequest request;
    ASSERT_TRUE(PrepareManualDefinition(state, &engine, request));
    ASSERT_EQ(request.definitions.size(), 3u);
    EXPECT_EQ(request.definitions[2].m_strTitle, "Item3");
    EXPECT_EQ(request.editable, (std::array<int, 4>{1, 0, 0, 0}));
}

TEST_F(DataDescription, AHandMadeDefinitionMissingATextIsRefusedWhateverGroupIsByHand)
{
    DescribeByHand(2, inputs.asciiFile);
    DataDescState state = Shown();
    state.definitions = {{"Level", "Water Level", "", "Instantaneous"}};
    EXPECT_EQ(CheckManualDefinitions(state, &engine), 1) << "nothing by hand: not looked at";
    EXPECT_TRUE(screen.boxes.empty());
    ClickTitleOption(state, 1);
    EXPECT_EQ(CheckManualDefinitions(state, &engine), 0);
    EXPECT_EQ(Messages(), std::vector<std::string>{res::LoadString(res::IDS_RECONFIGURE_ITEMS)});
}

TEST_F(DataDescription, EmptyHandMadeDefinitionsAreFilledFromTheFile)
{
    DescribeByHand(2, inputs.asciiFile);
    DataDescState state = Shown();
    for (size_t g = 0; g < 3; ++g)
        ClickGroupOption(state, static_cast<DescriptionGroupIndex>(g), 2);
    ASSERT_EQ(CheckManualDefinitions(state, &engine), 1);
    ASSERT_EQ(state.definitions.size(), 3u);
    EXPECT_EQ(state.definitions[0].m_strTitle, "Level");
    EXPECT_EQ(engine.m_pSpecification->m_DataDesc.m_vecItemDefs.size(), 3u) << "and written into the template";
}

TEST_F(DataDescription, NextAsksTheBridgeAndLeavesNoWorkingFile)
{
    DescribeByHand(2, inputs.asciiFile);
    DataDescState state = Shown();
    EXPECT_TRUE(AcceptDataDescription(state, &engine)) << (screen.boxes.empty() ? "" : screen.boxes[0].text);
    EXPECT_TRUE(TempFolderEmpty());
    state.startRow = 9; // beyond the file: the bridge refuses, and the page adds no word of its own
    EXPECT_FALSE(AcceptDataDescription(state, &engine));
    EXPECT_TRUE(TempFolderEmpty());
    EXPECT_EQ(engine.m_pSpecification->m_DataDesc.m_nStartRow, 9) << "written before the check";
}

TEST_F(DataDescription, ThePageCarriesTheSheetNumberThrough)
{
    DescribeByHand(3, inputs.excelFile);
    engine.m_pSpecification->m_DataDesc.m_nExcelSheet = 2;
    DataDescState state = Shown();
    EXPECT_EQ(PreviewDataDescription(state, &engine), 0) << "there is no second sheet";
    EXPECT_EQ(engine.m_pSpecification->m_DataDesc.m_nExcelSheet, 2);
}

} // namespace
