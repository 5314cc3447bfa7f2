#include "wizard/ManualDefForm.h"

#include "platform/ui/UserInterface.h"
#include "platform/units/Units.h"
#include "resources/StringTable.h"
#include "wizard/UnitChoices.h"

#include <algorithm>

const char* const kValueTypeChoiceList = "Instantaneous\nAccumulated\nStep_Accumulated\nMean_Step_Accumulated\n"
                                         "Reverse_Mean_Step_Accumulated\nInstantaneous";

namespace {

CString JoinSorted(CStringList names)
{
    std::sort(names.begin(), names.end());
    CString list;
    for (const CString& name : names)
        list += name + "\n";
    return list;
}

// The grid's messages are plain boxes under the application's name.
int Refuse(int stringId)
{
    ui::MessageBox(res::LoadString(stringId), res::LoadString(res::IDS_VELMORA), ui::MB_OK);
    return 0;
}

bool KnownToCatalogue(const CItemDefinition& item)
{
    const units::ItemType* type = units::LookupItemType(item.m_strType);
    return type && units::LookupUnit(*type, item.m_strUnit);
}

// Gives the row's unit cell, when it can be edited, the units of the row's item type; with `reset`,
// or when the cell is empty, its first unit.
void OfferUnitsOfType(ManualDefGrid& grid, int row, bool reset)
{
    GridCell& unit = grid.Cell(row, kUnitColumn);
    if (!unit.enabled)
        return;
    unit.choices = GetUnitChoiceList(grid.Cell(row, kTypeColumn).value);
    if (reset || unit.value.empty())
        unit.value = FirstChoice(unit.choices);
}

} // namespace

CString GetItemTypeChoiceList()
{
    CStringList names;
    ItemTypeNames(names);
    return JoinSorted(names);
}

CString GetUnitChoiceList(const CString& itemType)
{
    CStringList names;
    UnitNamesOf(itemType, names);
    return JoinSorted(names);
}

CString FirstChoice(const CString& list) { return list.substr(0, list.find('\n')); }

CStringList ChoiceEntries(const CString& list)
{
    CStringList entries;
    size_t start = 0;
    while (start < list.size()) {
        const size_t end = std::min(list.find('\n', start), list.size());
        entries.push_back(list.substr(start, end - start));
        start = end + 1;
    }
    return entries;
}

ManualDefGrid MakeManualDefGrid(const std::vector<CItemDefinition>& items, const std::array<int, 4>& editable)
{
    ManualDefGrid grid;
    const CString typeChoices = GetItemTypeChoiceList();
    for (const CItemDefinition& item : items) {
        std::array<GridCell, kGridColumns> row;
        const CString type = item.m_strType.empty() ? CString("Undefined") : item.m_strType;
        row[0] = {item.m_strTitle, CString()};
        row[1] = {type, typeChoices};
        row[2].choices = GetUnitChoiceList(type);
        row[2].value = item.m_strUnit.empty() ? FirstChoice(row[2].choices) : item.m_strUnit;
        row[3] = {item.m_strValueType.empty() ? FirstChoice(kValueTypeChoiceList) : item.m_strValueType,
                  kValueTypeChoiceList};
        const CString* entered[] = {&item.m_strTitle, &item.m_strType, &item.m_strUnit, &item.m_strValueType};
        for (size_t column = 0; column < kGridColumns; ++column) {
            row[column].enabled = editable[column] == 1;
            row[column].shaded = !row[column].enabled && !entered[column]->empty();
        }
        grid.rows.push_back(row);
    }
    return grid;
}

int EndEditing(ManualDefGrid& grid, int row, int column)
{
    if (column == kTypeColumn)
        OfferUnitsOfType(grid, row, false);
    return 1;
}

int ClickCell(ManualDefGrid& grid, int row, int column)
{
    if (column == kUnitColumn)
        OfferUnitsOfType(grid, row, true);
    return 1;
}

int ReadGridDefinitions(const ManualDefGrid& grid, std::vector<CItemDefinition>& items)
{
    if (grid.columnCount != kGridColumns)
        return 0;
    items.clear();
    items.reserve(grid.rows.size());
    for (const auto& row : grid.rows)
        items.push_back({row[0].value, row[1].value, row[2].value, row[3].value});
    return 1;
}

int CheckGridDefinitions(const std::vector<CItemDefinition>& items)
{
    for (const CItemDefinition& item : items) {
        if (item.m_strTitle.empty() || item.m_strType.empty() || item.m_strUnit.empty() ||
            item.m_strValueType.empty())
            return Refuse(res::IDS_ITEM_NAME_EMPTY);
        if (!KnownToCatalogue(item))
            return Refuse(res::IDS_UNIT_TYPE_MISMATCH);
    }
    return 1;
}
