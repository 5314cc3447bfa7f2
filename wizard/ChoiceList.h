#pragma once
// A drop-down list as a page decides it: its entries and which one is selected. The pages' lists
// have the sorted style, so they keep their entries in alphabetical order whatever the order they
// are added in.
#include "platform/system/Types.h"

struct ChoiceList {
    CStringList entries;
    int selected = -1; // none

    // Adds `entry` where the sorted style puts it: alphabetical, letter case ignored, after equals.
    void AddSorted(const CString& entry);
    // Empties the list (and its selection), then adds every name sorted.
    void FillSorted(const CStringList& names);
    // Selects the first entry that begins with `prefix`, case ignored; false, and the selection
    // unchanged, when none does.
    bool SelectStartingWith(const CString& prefix);
    // The selected entry; empty when none is selected.
    CString Text() const;
};
