#pragma once
// What the item selection page shows and decides, apart from its list: the items of the preview
// file, which of them are ticked, and what Next and Preview store.
#include "platform/system/Types.h"

#include <vector>

class CEngine;

struct ItemSelection {
    CStringList names;         // the items of the preview file, in file order
    std::vector<bool> ticked;  // one per name
};

// Activation: the items of the preview file (none when it cannot be read), ticked as the record's
// selection says, else as the template's, else all of them.
ItemSelection LoadItemSelection(CEngine* engine);
// The 0-based positions of the ticked rows, ascending.
CUIntArray TickedPositions(const std::vector<bool>& ticked);
// Next: an empty selection is refused with 2300. The selection is stored; for a folder or an
// unchanged template the template file is rewritten with it at once.
bool AcceptItemSelection(const std::vector<bool>& ticked, CEngine* engine);
// Preview: stores the selection (refusing an empty one with 2300 and -1) and runs the common
// preview.
int PreviewItemSelection(const std::vector<bool>& ticked, CEngine* engine);
