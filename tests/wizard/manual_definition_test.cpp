// The manual definition grid's decisions without a window: how items enter the grid, which cells
// can be edited and how they look, the rules for a changed item type and a clicked unit, and the
// check of OK against the unit catalogue.
#include "tests/wizard/FormTestSupport.h"

#include "resources/StringTable.h"
#include "wizard/ManualDefForm.h"

namespace {

using namespace wizardtest;

constexpr std::array<int, 4> kAllEditable = {1, 1, 1, 1};

class ManualDefinition : public FormTest {
protected:
    // The message the OK check gave, or "" when it let the dialog close.
    std::string Refusal(const std::vector<CItemDefinition>& items)
    {
        screen.boxes.clear();
        const int accepted = CheckGridDefinitions(items);
        EXPECT_EQ(accepted == 1, screen.boxes.empty());
        if (screen.boxes.empty())
            return "";
        EXPECT_EQ(screen.boxes[0].type, ui::MB_OK) << "a plain box";
        EXPECT_EQ(screen.boxes[0].caption, "Velmora");
        return screen.boxes[0].text;
    }
};

TEST_F(ManualDefinition, ChoiceListsAreSortedByteWiseWithANewlineAfterEachEntry)
{
    EXPECT_EQ(GetUnitChoiceList("Water Level"), "centimeter\nfoot\nmeter\nmillimeter\n");
    EXPECT_EQ(GetUnitChoiceList("no such type"), "Undefined\n") << "the catalogue's starting item type";
    EXPECT_EQ(GetUnitChoiceList("water level"), "Undefined\n") << "the name must match exactly";
    const CString types = GetItemTypeChoiceList();
    const CStringList entries = ChoiceEntries(types);
    EXPECT_TRUE(std::is_sorted(entries.begin(), entries.end()));
    EXPECT_EQ(types.back(), '\n');
    EXPECT_EQ(FirstChoice(types), entries.front());
    EXPECT_EQ(FirstChoice("single"), "single");
    EXPECT_EQ(ChoiceEntries(kValueTypeChoiceList),
              (CStringList{"Instantaneous", "Accumulated", "Step_Accumulated", "Mean_Step_Accumulated",
                           "Reverse_Mean_Step_Accumulated", "Instantaneous"}));
}

TEST_F(ManualDefinition, EmptyTextsEnterAsUndefinedAndTheFirstChoices)
{
    const ManualDefGrid grid =
        MakeManualDefGrid({{"Level", "", "", ""}, {"Flow", "Discharge", "", "Accumulated"}}, kAllEditable);
    ASSERT_EQ(grid.rows.size(), 2u);
    EXPECT_EQ(grid.Cell(1, kTypeColumn).value, "Undefined");
    EXPECT_EQ(grid.Cell(1, kUnitColumn).value, "Undefined");
    EXPECT_EQ(grid.Cell(1, kValueTypeColumn).value, "Instantaneous");
    EXPECT_EQ(grid.Cell(2, kUnitColumn).value, "cubic foot per second") << "the alphabetically first unit";
    EXPECT_EQ(grid.Cell(2, kUnitColumn).choices, GetUnitChoiceList("Discharge"));
    EXPECT_EQ(grid.Cell(1, kNameColumn).choices, "") << "names are typed";
}

TEST_F(ManualDefinition, ColumnsThatCannotBeEditedAreShadedUnlessTheirTextWasEmpty)
{
    const ManualDefGrid grid = MakeManualDefGrid({{"Level", "", "m", "Instantaneous"}}, {1, 0, 0, 1});
    struct Case {
        int column;
        bool enabled;
        bool shaded;
    };
    for (const Case& c : {Case{kNameColumn, true, false}, Case{kTypeColumn, false, false},
                          Case{kUnitColumn, false, true}, Case{kValueTypeColumn, true, false}}) {
        EXPECT_EQ(grid.Cell(1, c.column).enabled, c.enabled) << c.column;
        EXPECT_EQ(grid.Cell(1, c.column).shaded, c.shaded) << c.column;
    }
}

TEST_F(ManualDefinition, ANewTypeBringsItsUnitsButKeepsTheUnitAndAClickResetsIt)
{
    ManualDefGrid grid = MakeManualDefGrid({{"Level", "Water Level", "meter", "Instantaneous"}}, kAllEditable);
    grid.Cell(1, kTypeColumn).value = "Discharge";
    EXPECT_EQ(EndEditing(grid, 1, kTypeColumn), 1);
    EXPECT_EQ(grid.Cell(1, kUnitColumn).choices, GetUnitChoiceList("Discharge"));
    EXPECT_EQ(grid.Cell(1, kUnitColumn).value, "meter") << "kept, though Discharge has no meter";
    std::vector<CItemDefinition> items;
    ASSERT_EQ(ReadGridDefinitions(grid, items), 1);
    EXPECT_EQ(Refusal(items), res::LoadString(res::IDS_UNIT_TYPE_MISMATCH));

    EXPECT_EQ(ClickCell(grid, 1, kUnitColumn), 1);
    EXPECT_EQ(grid.Cell(1, kUnitColumn).value, "cubic foot per second");
    ASSERT_EQ(ReadGridDefinitions(grid, items), 1);
    EXPECT_EQ(Refusal(items), "");

    grid.Cell(1, kUnitColumn).value.clear();
    grid.Cell(1, kTypeColumn).value = "Rainfall";
    EndEditing(grid, 1, kTypeColumn);
    EXPECT_EQ(grid.Cell(1, kUnitColumn).value, "centimeter") << "an empty unit takes the first";
}

TEST_F(ManualDefinition, CellsThatCannotBeEditedFollowNoRule)
{
    ManualDefGrid grid = MakeManualDefGrid({{"Level", "Water Level", "meter", "Instantaneous"}}, {1, 1, 0, 1});
    grid.Cell(1, kTypeColumn).value = "Discharge";
    EndEditing(grid, 1, kTypeColumn);
    ClickCell(grid, 1, kUnitColumn);
    EXPECT_EQ(grid.Cell(1, kUnitColumn).value, "meter");
    EXPECT_EQ(grid.Cell(1, kUnitColumn).choices, GetUnitChoiceList("Water Level"));
}

TEST_F(ManualDefinition, OkLooksTypesUpByKeyOrNameAndUnitsByKeyNameOrAbbreviation)
{
    struct Case {
        CItemDefinition item;
        int messageId; // 0: accepted
    };
    const Case cases[] = {
        {{"L", "Water Level", "meter", "Instantaneous"}, 0},
        {{"L", "WATER LEVEL", "meter", "x"}, 0},        // a type name in any case; value types unchecked
        {{"L", "100", "meter", "Instantaneous"}, 0},    // digits are a key
        {{"L", "101", "meter", "Instantaneous"}, 0},    // key 101 is Water Depth, which has meters
        {{"L", "100abc", "1000", "Instantaneous"}, 0},  // read as the number it starts with; a unit key
        {{"L", "Water Level", "M", "Instantaneous"}, 0}, // the abbreviation in another case
        {{"L", "Water Level", "Meter", "Instantaneous"}, res::IDS_UNIT_TYPE_MISMATCH}, // a name must match exactly
        {{"L", "Water Level", "m^3/s", "Instantaneous"}, res::IDS_UNIT_TYPE_MISMATCH},
        {{"L", "999999", "meter", "Instantaneous"}, res::IDS_UNIT_TYPE_MISMATCH},
        {{"L", "Water", "meter", "Instantaneous"}, res::IDS_UNIT_TYPE_MISMATCH},
        {{"", "Water Level", "meter", "Instantaneous"}, res::IDS_ITEM_NAME_EMPTY},
        {{"L", "Water Level", "meter", ""}, res::IDS_ITEM_NAME_EMPTY},
    };
    for (const Case& c : cases)
        EXPECT_EQ(Refusal({c.item}), c.messageId ? res::LoadString(c.messageId) : "")
            << c.item.m_strType << " / " << c.item.m_strUnit;
}

TEST_F(ManualDefinition, OkChecksEveryRowEvenWhenNothingCanBeEditedAndAnEmptyGridCloses)
{
    const ManualDefGrid locked =
        MakeManualDefGrid({{"Level", "Water Level", "meter", "Instantaneous"}, {"Flow", "Water Level", "liter", ""}},
                          {0, 0, 0, 0});
    std::vector<CItemDefinition> items;
    ASSERT_EQ(ReadGridDefinitions(locked, items), 1);
    EXPECT_EQ(items[1].m_strValueType, "Instantaneous");
    EXPECT_EQ(Refusal(items), res::LoadString(res::IDS_UNIT_TYPE_MISMATCH));
    EXPECT_EQ(Refusal({}), "");
    ManualDefGrid narrow;
    narrow.columnCount = 3;
    EXPECT_EQ(ReadGridDefinitions(narrow, items), 0);
}

} // namespace
