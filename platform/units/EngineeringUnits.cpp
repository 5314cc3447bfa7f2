#include "platform/units/EngineeringUnits.h"

#include "platform/units/Units.h"

CEngineeringUnits::CEngineeringUnits() : m_nCurrentTypeKey(units::kItemTypeUndefined) {}

int CEngineeringUnits::GetItemTypeNames(CStringList& names) const
{
    names.clear();
    for (const units::ItemType& type : units::ItemTypes())
        names.emplace_back(type.name);
    return 1;
}

int CEngineeringUnits::SetCurrentItemType(int position)
{
    const auto types = units::ItemTypes();
    if (position < 1 || position > static_cast<int>(types.size()))
        return 0;
    m_nCurrentTypeKey = types[static_cast<size_t>(position - 1)].key;
    return 1;
}

int CEngineeringUnits::GetUnitNames(CStringList& names) const
{
    names.clear();
    const units::ItemType* type = units::FindItemType(m_nCurrentTypeKey);
    if (!type)
        return 0;
    for (const units::Unit* unit : units::UnitsOf(*type))
        names.emplace_back(unit->name);
    return 1;
}
