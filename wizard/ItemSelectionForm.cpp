#include "wizard/ItemSelectionForm.h"

#include "engine/Engine.h"
#include "platform/ui/UserInterface.h"
#include "resources/StringTable.h"
#include "wizard/PreviewChain.h"

namespace {

// The selection, or 2300 when nothing is ticked.
bool SelectionOf(const std::vector<bool>& ticked, CUIntArray& items)
{
    items = TickedPositions(ticked);
    if (!items.empty())
        return true;
    ui::ShowStringMessage(res::IDS_SELECT_MORE_ITEMS);
    return false;
}

} // namespace

ItemSelection LoadItemSelection(CEngine* engine)
{
    ItemSelection selection;
    if (!engine)
        return selection;
    CString previewFile;
    engine->GetPreviewFile(previewFile);
    engine->ReadItemNames(previewFile, selection.names);
    CUIntArray stored = engine->m_arrItems;
    if (stored.empty() && engine->m_pSpecification)
        stored = engine->m_pSpecification->m_arrSelItems;
    selection.ticked.assign(selection.names.size(), stored.empty());
    for (unsigned position : stored)
        if (position < selection.ticked.size())
            selection.ticked[position] = true;
    return selection;
}

CUIntArray TickedPositions(const std::vector<bool>& ticked)
{
    CUIntArray positions;
    for (size_t i = 0; i < ticked.size(); ++i)
        if (ticked[i])
            positions.push_back(static_cast<unsigned>(i));
    return positions;
}

bool AcceptItemSelection(const std::vector<bool>& ticked, CEngine* engine)
{
    CUIntArray items;
    if (!SelectionOf(ticked, items))
        return false;
    if (!engine)
        return true;
    engine->SetItems(items);
    const bool templateKept = engine->m_nInputType == 2 || engine->m_nTemplateOption == 1;
    if (templateKept && engine->m_pSpecification)
        engine->m_pSpecification->Save(engine->m_strTemplateName);
    return true;
}

int PreviewItemSelection(const std::vector<bool>& ticked, CEngine* engine)
{
    if (!engine)
        return RunDefaultPreview(engine);
    CUIntArray items;
    if (!SelectionOf(ticked, items))
        return -1;
    engine->SetItems(items);
    return RunDefaultPreview(engine);
}
