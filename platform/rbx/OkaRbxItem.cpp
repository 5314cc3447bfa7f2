#include "platform/rbx/OkaRbxItem.h"

#include "platform/units/Units.h"

CString COkaRbxItem::GetRuqTypeName() const
{
    const units::ItemType* type = units::FindItemType(m_nRuqType);
    return type ? CString(type->name) : CString();
}

CString COkaRbxItem::GetRuqUnitName() const
{
    const units::Unit* unit = units::FindUnit(m_nRuqUnit);
    return unit ? CString(unit->name) : CString();
}
