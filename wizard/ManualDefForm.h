#pragma once
// What the manual definition grid shows and decides, apart from its widgets: one row per item with
// its name, item type, unit and value type; each cell with its choice list, whether it can be
// edited and its background; the rules for a changed item type and a clicked unit; and the check
// of OK against the unit catalogue.
#include "templates/Specification.h"

#include <array>
#include <vector>

enum GridColumn : int { kNameColumn = 1, kTypeColumn = 2, kUnitColumn = 3, kValueTypeColumn = 4 };
inline constexpr int kGridColumns = 4;

struct GridCell {
    CString value;
    CString choices; // a choice list: one entry per line; empty for the name's text cell
    bool enabled = true;
    bool shaded = false; // the button-face background of a cell that cannot be edited
};

// The grid's rows 1..n (row 0 holds the titles) and columns 1..4 (column 0 the row headers).
struct ManualDefGrid {
    int columnCount = kGridColumns;
    std::vector<std::array<GridCell, kGridColumns>> rows;

    GridCell& Cell(int row, int column) { return rows[static_cast<size_t>(row - 1)][static_cast<size_t>(column - 1)]; }
    const GridCell& Cell(int row, int column) const
    {
        return rows[static_cast<size_t>(row - 1)][static_cast<size_t>(column - 1)];
    }
};

// The value types offered in the grid, "Instantaneous" last once more.
extern const char* const kValueTypeChoiceList;

// All item type names, in ascending byte order, each followed by a newline.
CString GetItemTypeChoiceList();
// The unit names of `itemType` (or of the catalogue's starting item type when no name equals it),
// sorted and joined the same way.
CString GetUnitChoiceList(const CString& itemType);
// The text before the first newline of a choice list; all of it when there is none.
CString FirstChoice(const CString& list);
// The entries of a choice list, one per line.
CStringList ChoiceEntries(const CString& list);

// The grid the dialog opens with: an empty type enters as "Undefined", an empty unit or value type
// as the first entry of its list; a cell can be edited when its column's flag (names, item types,
// units, value types) is 1, and is shaded when it cannot, unless its text was empty on entry.
ManualDefGrid MakeManualDefGrid(const std::vector<CItemDefinition>& items, const std::array<int, 4>& editable);
// The end of an edit in (row, column): a new item type gives the row's unit cell that type's units,
// keeping a unit already there. Always 1.
int EndEditing(ManualDefGrid& grid, int row, int column);
// A click in (row, column): an editable unit cell is reset to the first unit of its row's type.
// Always 1.
int ClickCell(ManualDefGrid& grid, int row, int column);
// The grid's rows as item definitions; 0 when the grid does not have four columns.
int ReadGridDefinitions(const ManualDefGrid& grid, std::vector<CItemDefinition>& items);
// OK: every item complete (else 2331) with an item type and unit the catalogue knows (else 2329).
// 0 with the message shown when refused.
int CheckGridDefinitions(const std::vector<CItemDefinition>& items);
