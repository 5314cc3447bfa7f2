#include "wizard/DataDescForm.h"

#include "engine/Engine.h"
#include "parsers/ExcelFilePreviewParser.h"
#include "platform/system/Text.h"
#include "platform/ui/UserInterface.h"
#include "resources/StringTable.h"
#include "wizard/PreviewChain.h"
#include "wizard/UnitChoices.h"

namespace {

enum : int { kSameForAll = 0, kInRow = 1, kByHand = 2 };

// Keeps the preview file's workbook open while the parser reads it; nothing for other formats.
class WorkbookSession {
public:
    WorkbookSession(CEngine& engine, const CString& file)
    {
        if (engine.m_nInputFormat != 3)
            return;
        m_excel = dynamic_cast<CExcelFilePreviewParser*>(engine.m_pParser.get());
        CString message;
        m_failed = !m_excel || !m_excel->OpenWorkbook(file, message);
    }
    ~WorkbookSession()
    {
        if (m_excel && !m_failed)
            m_excel->CloseWorkbook();
    }
    WorkbookSession(const WorkbookSession&) = delete;
    WorkbookSession& operator=(const WorkbookSession&) = delete;

    bool Failed() const { return m_failed; }

private:
    CExcelFilePreviewParser* m_excel = nullptr; // the engine's parser, not owned
    bool m_failed = false;
};

void EnableGroup(DescriptionGroup& group, int option)
{
    group.option = option;
    group.listEnabled = option == kSameForAll;
    group.rowEnabled = option == kInRow;
    group.defineEnabled = option == kByHand;
}

void EnableTitle(DataDescState& state, int option)
{
    state.titleOption = option;
    state.nameRowEnabled = option == 0;
    state.defineNamesEnabled = option == 1;
}

bool RowInUse(const DescriptionGroup& group) { return group.option == kInRow; }

bool AnyByHand(const DataDescState& state)
{
    if (state.titleOption == 1)
        return true;
    for (const DescriptionGroup& group : state.groups)
        if (group.option == kByHand)
            return true;
    return false;
}

// The template's record, so that what the page does not show (the sheet) is carried through.
CDataDescription TemplateRecord(const CEngine* engine)
{
    return engine && engine->m_pSpecification ? engine->m_pSpecification->m_DataDesc : CDataDescription();
}

void WriteIntoTemplate(CEngine& engine, const CDataDescription& record)
{
    if (engine.m_pSpecification)
        engine.m_pSpecification->m_DataDesc = record;
}

// Collects the page into the template; false (with the message shown) when refused.
bool CollectIntoTemplate(const DataDescState& state, CEngine& engine)
{
    CDataDescription record = TemplateRecord(&engine);
    if (!CollectDataDescription(state, record))
        return false;
    WriteIntoTemplate(engine, record);
    return true;
}

bool Refuse(int stringId)
{
    ui::ShowStringMessage(stringId);
    return false;
}

bool RowsAcceptable(const DataDescState& state)
{
    std::vector<int> inUse;
    for (const DescriptionGroup& group : state.groups)
        if (RowInUse(group))
            inUse.push_back(group.row);
    const std::vector<int> groupRows = inUse;
    if (state.titleOption == 0)
        inUse.push_back(state.nameRow);
    for (int row : inUse)
        if (state.startRow <= row)
            return Refuse(res::IDS_START_ROW_TOO_SMALL);
    if (state.titleOption == 0)
        for (int row : groupRows)
            if (row == state.nameRow)
                return Refuse(res::IDS_ITEM_NAME_ROW_CLASH);
    for (int row : inUse)
        if (row == 0)
            return Refuse(res::IDS_HEADER_ROW_ZERO);
    return true;
}

// Fills the unit list with the units of the selected item type, keeping the unit selected before
// when the new list has it, else the first.
void OfferUnitsOfItemType(DataDescState& state)
{
    CStringList units;
    if (!UnitNamesOf(state.groups[kItemTypeGroup].list.Text(), units))
        return;
    ChoiceList& unitList = state.groups[kUnitGroup].list;
    const CString previous = unitList.Text();
    unitList.FillSorted(units);
    if (!unitList.SelectStartingWith(previous))
        unitList.selected = unitList.entries.empty() ? -1 : 0;
}

// The i-th text of `values` (from 0), or `missing` when the list is shorter.
CString NthOr(const CStringList& values, size_t i, const CString& missing)
{
    return i < values.size() ? values[i] : missing;
}

} // namespace

DataDescState InitialDataDescription()
{
    DataDescState state;
    EnableTitle(state, 1);
    for (DescriptionGroup& group : state.groups)
        EnableGroup(group, kByHand);
    for (DescriptionGroup& group : state.groups)
        group.listEnabled = false;
    CStringList names;
    if (!ItemTypeNames(names))
        return state;
    state.groups[kItemTypeGroup].list.FillSorted(names);
    state.groups[kItemTypeGroup].list.SelectStartingWith("Undefined");
    if (!UnitNamesOf("Undefined", names))
        return state;
    state.groups[kUnitGroup].list.FillSorted(names);
    state.groups[kUnitGroup].list.SelectStartingWith("Undefined");
    state.groups[kValueTypeGroup].list.FillSorted(CStringList(kValueTypeNames.begin(), kValueTypeNames.end()));
    state.groups[kValueTypeGroup].list.SelectStartingWith("Instantaneous");
    return state;
}

void ShowDataDescription(DataDescState& state, const CDataDescription& record)
{
    if (record.m_nItemTitleOption == 0 || record.m_nItemTitleOption == 1)
        EnableTitle(state, record.m_nItemTitleOption);
    const int options[] = {record.m_nUnitTypeOption, record.m_nUnitOption, record.m_nValueTypeOption};
    for (size_t g = 0; g < 3; ++g)
        if (options[g] >= kSameForAll && options[g] <= kByHand)
            EnableGroup(state.groups[g], options[g]);
    const bool used = record.m_nDeleteValueCheck != 0;
    if (record.m_nDeleteValueRadio == 0) {
        state.deleteValueOption = 0;
        state.deleteRowEnabled = false;
        if (used)
            state.deleteValueEnabled = true;
    } else if (record.m_nDeleteValueRadio == 1) {
        state.deleteValueOption = 1;
        state.deleteValueEnabled = false;
        if (used)
            state.deleteRowEnabled = true;
    }
    state.deleteRadiosEnabled = used;
    state.deleteValueUsed = used ? 1 : 0;

    state.groups[kItemTypeGroup].list.SelectStartingWith(record.m_strGlobalUnitType);
    OfferUnitsOfItemType(state);
    state.groups[kUnitGroup].list.SelectStartingWith(record.m_strGlobalUnit);
    state.groups[kValueTypeGroup].list.SelectStartingWith(record.m_strGlobalValueType);
    state.groups[kItemTypeGroup].row = record.m_nUnitTypeRow;
    state.groups[kUnitGroup].row = record.m_nUnitRow;
    state.groups[kValueTypeGroup].row = record.m_nValueTypeRow;
    state.nameRow = record.m_nItemDescriptionRow;
    state.startRow = record.m_nStartRow;
    state.deleteValue = record.m_strDeleteValue;
    state.deleteValueRow = record.m_nDeleteValueRow;
    state.definitions = record.m_vecItemDefs;
}

void ClickTitleOption(DataDescState& state, int option) { EnableTitle(state, option); }

void ClickGroupOption(DataDescState& state, DescriptionGroupIndex group, int option)
{
    EnableGroup(state.groups[group], option);
}

void ClickDeleteValueUsed(DataDescState& state)
{
    state.deleteRadiosEnabled = state.deleteValueUsed != 0;
    if (!state.deleteValueUsed) {
        state.deleteValueEnabled = state.deleteRowEnabled = false;
        return;
    }
    if (state.deleteValueOption != 0)
        state.deleteValueOption = 1;
    state.deleteValueEnabled = state.deleteValueOption == 0;
    state.deleteRowEnabled = state.deleteValueOption == 1;
}

void ClickDeleteValueOption(DataDescState& state, int option)
{
    state.deleteValueOption = option;
    state.deleteValueEnabled = option == 0;
    state.deleteRowEnabled = option == 1;
}

void SelectItemType(DataDescState& state, int index)
{
    ChoiceList& types = state.groups[kItemTypeGroup].list;
    types.selected = index;
    CStringList units;
    if (!UnitNamesOf(types.Text(), units))
        return;
    ChoiceList& unitList = state.groups[kUnitGroup].list;
    unitList.FillSorted(units);
    unitList.selected = unitList.entries.empty() ? -1 : 0;
}

int CollectDataDescription(const DataDescState& state, CDataDescription& record)
{
    record.m_nItemTitleOption = state.titleOption == 0 ? 0 : 1;
    record.m_nUnitTypeOption = state.groups[kItemTypeGroup].option;
    record.m_nUnitOption = state.groups[kUnitGroup].option;
    record.m_nValueTypeOption = state.groups[kValueTypeGroup].option;
    record.m_nDeleteValueCheck = state.deleteValueUsed ? 1 : 0;
    record.m_nDeleteValueRadio = state.deleteValueOption == 0 ? 0 : 1;
    if (!RowsAcceptable(state))
        return 0;
    record.m_strGlobalUnitType = state.groups[kItemTypeGroup].list.Text();
    record.m_strGlobalUnit = state.groups[kUnitGroup].list.Text();
    record.m_strGlobalValueType = state.groups[kValueTypeGroup].list.Text();
    record.m_nUnitTypeRow = state.groups[kItemTypeGroup].row;
    record.m_nUnitRow = state.groups[kUnitGroup].row;
    record.m_nValueTypeRow = state.groups[kValueTypeGroup].row;
    record.m_nItemDescriptionRow = state.nameRow;
    record.m_nStartRow = state.startRow;
    record.m_strDeleteValue = state.deleteValue;
    record.m_nDeleteValueRow = state.deleteValueRow;
    record.m_vecItemDefs = state.definitions;
    return 1;
}

int GetItemDefinitions(const DataDescState& state, CEngine& engine, std::vector<CItemDefinition>& definitions)
{
    if (!CollectIntoTemplate(state, engine))
        return 0;
    definitions.clear();
    CString previewFile;
    CFilePreviewParser* parser = engine.m_pParser.get();
    if (!engine.GetPreviewFile(previewFile) || !parser)
        return 0;
    CStringList names, types, units, valueTypes;
    int count = 0;
    try {
        const WorkbookSession workbook(engine, previewFile);
        if (workbook.Failed() || !parser->GetItemCount(count) || count < 1)
            return 0;
        if (!parser->GetItemNames(names) || !parser->GetItemTypes(types) || !parser->GetUnits(units) ||
            !parser->GetValueTypes(valueTypes))
            return 0;
    } catch (...) {
        // A file that cannot be read tells the page nothing; the page stays as it is.
        return 0;
    }
    const auto& groups = state.groups;
    for (size_t i = 0; i < static_cast<size_t>(count); ++i) {
        CItemDefinition item;
        item.m_strTitle = NthOr(names, i, text::Format("Item%d", static_cast<int>(i + 1)));
        item.m_strType = groups[kItemTypeGroup].option == kSameForAll ? groups[kItemTypeGroup].list.Text()
                                                                       : NthOr(types, i, "Undefined");
        item.m_strUnit = groups[kUnitGroup].option == kSameForAll ? groups[kUnitGroup].list.Text()
                                                                  : NthOr(units, i, "undefined");
        item.m_strValueType = groups[kValueTypeGroup].option == kSameForAll ? groups[kValueTypeGroup].list.Text()
                                                                            : NthOr(valueTypes, i, "Instantaneous");
        definitions.push_back(item);
    }
    return 1;
}

int CheckManualDefinitions(DataDescState& state, CEngine* engine)
{
    if (!engine)
        return 0;
    if (!AnyByHand(state))
        return 1;
    if (state.definitions.empty())
        GetItemDefinitions(state, *engine, state.definitions);
    if (!CollectIntoTemplate(state, *engine))
        return 0;
    for (const CItemDefinition& item : state.definitions) {
        if (item.m_strTitle.empty() || item.m_strType.empty() || item.m_strUnit.empty() ||
            item.m_strValueType.empty()) {
            Refuse(res::IDS_RECONFIGURE_ITEMS);
            return 0;
        }
    }
    return 1;
}

bool AcceptDataDescription(DataDescState& state, CEngine* engine)
{
    CDataDescription record = TemplateRecord(engine);
    if (!CollectDataDescription(state, record) || !engine)
        return false;
    WriteIntoTemplate(*engine, record);
    if (!CheckManualDefinitions(state, engine))
        return false;
    CString previewFile;
    if (!engine->GetPreviewFile(previewFile) || !TemplateFitsPreviewFile(*engine))
        return false;
    CStringList names;
    return state.titleOption != 0 || engine->ReadItemNames(previewFile, names);
}

int PreviewDataDescription(DataDescState& state, CEngine* engine)
{
    if (engine && (!CollectIntoTemplate(state, *engine) || !CheckManualDefinitions(state, engine)))
        return 0;
    return RunDefaultPreview(engine);
}

bool PrepareManualDefinition(const DataDescState& state, CEngine* engine, ManualDefinitionRequest& request)
{
    request.editable = {state.titleOption == 1, state.groups[kItemTypeGroup].option == kByHand,
                        state.groups[kUnitGroup].option == kByHand, state.groups[kValueTypeGroup].option == kByHand};
    return engine && GetItemDefinitions(state, *engine, request.definitions);
}
