#pragma once
// The engineering-unit component the data description page and the manual definition grid ask for
// item type and unit names. A fresh instance starts with "Undefined" as its current item type.
#include "platform/system/Types.h"

class CEngineeringUnits {
public:
    CEngineeringUnits();

    // Replaces `names` with the names of all item types, in catalogue order. Nonzero on success.
    int GetItemTypeNames(CStringList& names) const;
    // Makes the item type at 1-based `position` of GetItemTypeNames current; 0 (and no change) when
    // the position is out of range.
    int SetCurrentItemType(int position);
    // Replaces `names` with the unit names of the current item type. Nonzero on success.
    int GetUnitNames(CStringList& names) const;

    int CurrentItemTypeKey() const { return m_nCurrentTypeKey; }

private:
    int m_nCurrentTypeKey;
};
