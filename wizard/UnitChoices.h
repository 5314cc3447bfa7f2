#pragma once
// The names the data description page and the manual definition grid offer, asked of a fresh
// engineering-unit component each time, as both use it.
#include "platform/system/Types.h"

// The item type names in the component's order; false when the component fails.
bool ItemTypeNames(CStringList& names);
// The unit names of item type `itemType`, made current by its name (compared exactly); when no
// name equals it, the units of the item type a fresh component starts with. False on failure.
bool UnitNamesOf(const CString& itemType, CStringList& names);
