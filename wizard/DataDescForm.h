#pragma once
// What the data description page shows and decides, apart from its widgets: where item names,
// item types, units and value types come from, the data start row, the delete value, which
// controls are enabled, the item definitions made by hand, and the checks of Next and Preview.
#include "templates/Specification.h"
#include "wizard/ChoiceList.h"

#include <array>
#include <vector>

class CEngine;

// The item type, unit or value type group: one value for all items, a row of the file, or
// definitions made by hand.
struct DescriptionGroup {
    int option = 2;   // the checked radio: 0 same for all, 1 in a row, 2 by hand
    ChoiceList list;  // the value for all items
    int row = 1;
    bool listEnabled = false;
    bool rowEnabled = true; // the row box and its spin
    bool defineEnabled = true;
};

enum DescriptionGroupIndex : size_t { kItemTypeGroup = 0, kUnitGroup = 1, kValueTypeGroup = 2 };

struct DataDescState {
    int titleOption = 1; // the checked radio: 0 names in a row, 1 names by hand
    int nameRow = 2;
    bool nameRowEnabled = true; // the row box and its spin
    bool defineNamesEnabled = true;
    std::array<DescriptionGroup, 3> groups;
    int startRow = 3;
    int deleteValueUsed = 0;    // "Delete value is not empty value"
    int deleteValueOption = -1; // the checked radio: 0 "Use delete value:", 1 "Delete value in row:", -1 none
    CString deleteValue;
    int deleteValueRow = 1;
    bool deleteRadiosEnabled = false;
    bool deleteValueEnabled = false;
    bool deleteRowEnabled = false; // the row box and its spin
    std::vector<CItemDefinition> definitions; // the page's own copy
};

// What the manual definition dialog opens with: the items of the file and which columns may be
// edited (names, item types, units, value types).
struct ManualDefinitionRequest {
    std::vector<CItemDefinition> definitions;
    std::array<int, 4> editable = {0, 0, 0, 0};
};

// The page as it is first made: every group "by hand", the lists filled from the unit catalogue
// with "Undefined", its units and "Instantaneous" selected, the lists and delete value controls
// disabled.
DataDescState InitialDataDescription();
// Activation: `record` into the page. An option outside its range leaves that group as it was. The
// unit list offers the units of the item type shown, so that a stored unit can be found in it.
void ShowDataDescription(DataDescState& state, const CDataDescription& record);

// The radios and the check box of the page, clicked.
void ClickTitleOption(DataDescState& state, int option);
void ClickGroupOption(DataDescState& state, DescriptionGroupIndex group, int option);
void ClickDeleteValueUsed(DataDescState& state);
void ClickDeleteValueOption(DataDescState& state, int option);
// Another item type picked for all items: the unit list becomes that type's units, the first
// selected.
void SelectItemType(DataDescState& state, int index);

// Reads the page into `record` and checks its rows in use: 2296, 2297, 2298 in that order. 0, with
// the message shown, when refused. The sheet stays as the record had it.
int CollectDataDescription(const DataDescState& state, CDataDescription& record);
// The definitions of the file's items as the page describes them: names, item types, units and
// value types from the file, or the page's values for all items. 0 when the file cannot say.
int GetItemDefinitions(const DataDescState& state, CEngine& engine, std::vector<CItemDefinition>& definitions);
// With anything defined by hand: fills empty definitions from the file, then every definition must
// be complete (2299). 1 when nothing is defined by hand.
int CheckManualDefinitions(DataDescState& state, CEngine* engine);
// Next: collect, write into the template, check the definitions, ask the bridge whether the
// template fits the preview file and read its item names. False keeps the page.
bool AcceptDataDescription(DataDescState& state, CEngine* engine);
// Preview: collect, write, check the definitions, then the common preview; 0 when refused.
int PreviewDataDescription(DataDescState& state, CEngine* engine);
// "Define...": the file's items for the dialog and the columns the "by hand" radios open; false
// when the items cannot be read.
bool PrepareManualDefinition(const DataDescState& state, CEngine* engine, ManualDefinitionRequest& request);
