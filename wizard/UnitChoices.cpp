#include "wizard/UnitChoices.h"

#include "platform/units/EngineeringUnits.h"

#include <algorithm>

bool ItemTypeNames(CStringList& names) { return CEngineeringUnits().GetItemTypeNames(names) != 0; }

bool UnitNamesOf(const CString& itemType, CStringList& names)
{
    CEngineeringUnits component;
    CStringList types;
    if (!component.GetItemTypeNames(types))
        return false;
    const auto found = std::find(types.begin(), types.end(), itemType);
    if (found != types.end())
        component.SetCurrentItemType(static_cast<int>(found - types.begin()) + 1);
    return component.GetUnitNames(names) != 0;
}
