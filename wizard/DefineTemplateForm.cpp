#include "wizard/DefineTemplateForm.h"

#include "engine/Engine.h"
#include "platform/system/FileSystem.h"
#include "platform/system/Text.h"
#include "resources/StringTable.h"
#include "wizard/PreviewChain.h"

namespace {

void ShowMessage(const CString& text) { ui::MessageBox(text, CString(), ui::MB_OK | ui::MB_ICONEXCLAMATION); }

bool UsesTemplateFile(int option) { return option == 1 || option == 2; }

// The explanation lines for ASCII (2) and Excel (3) input, single file or folder.
std::array<CString, 3> LinesFor(int format, bool singleFile)
{
    using namespace res;
    if (singleFile)
        return {LoadString(format == 2 ? IDS_SINGLE_ASCII : IDS_SINGLE_EXCEL), LoadString(IDS_SPECIFY_FORMAT),
                LoadString(IDS_FOLLOWING_OPTIONS)};
    return {LoadString(format == 2 ? IDS_FOLDER_ASCII : IDS_FOLDER_EXCEL), LoadString(IDS_FOLDER_NEEDS_TEMPLATE),
            LoadString(IDS_CREATE_TEMPLATE_HINT)};
}

void ShowPreviewFor(DefineTemplateState& state, int option)
{
    state.previewEnabled = option != 3;
    state.previewVisible = option != 3;
}

// Stores the choice in the record and loads the template it names.
void StoreChoice(const DefineTemplateState& state, CEngine& engine)
{
    engine.SetTemplate(state.checkedOption, state.path);
    if (UsesTemplateFile(state.checkedOption))
        engine.LoadTemplate(state.path);
}

} // namespace

void LoadDefineTemplate(DefineTemplateState& state, const CEngine& engine)
{
    state.storedOption = engine.m_nTemplateOption;
    state.path = engine.m_strTemplateName;
    if (state.storedOption == 2 && state.path.empty())
        state.storedOption = 3;
    else if (state.storedOption == 3 && !state.path.empty())
        state.storedOption = 2;
    state.checkedOption = state.storedOption;
    const bool singleFile = engine.m_nInputType == 1;
    state.radiosVisible = singleFile;
    if (engine.m_nInputFormat == 2 || engine.m_nInputFormat == 3)
        state.lines = LinesFor(engine.m_nInputFormat, singleFile);
    // The record's own option decides, not the page's adjusted one.
    state.pathEnabled = !(engine.m_nTemplateOption == 3 && singleFile);
    ShowPreviewFor(state, state.storedOption);
}

void ClickExistingTemplate(DefineTemplateState& state, int option)
{
    state.checkedOption = option;
    state.pathEnabled = true;
    ShowPreviewFor(state, option);
}

void ClickManual(DefineTemplateState& state)
{
    state.checkedOption = 3;
    state.pathEnabled = false;
    state.path.clear();
    ShowPreviewFor(state, 3);
}

ui::FileDialogRequest TemplateFileRequest(const DefineTemplateState& state)
{
    ui::FileDialogRequest request;
    request.open = state.storedOption != 3;
    request.defaultExtension = "xml";
    request.initialName = "*.xml";
    request.flags = ui::OFN_FILEMUSTEXIST | ui::OFN_HIDEREADONLY | ui::OFN_OVERWRITEPROMPT;
    request.filter = "XML Files (*.xml)|*.xml|All Files (*.*)|*.*||";
    return request;
}

bool CheckTemplateChoice(const DefineTemplateState& state, CEngine* engine, bool check)
{
    const int option = state.checkedOption;
    if (UsesTemplateFile(option) && !sys::IsRegularFile(state.path)) {
        ShowMessage(res::LoadString(res::IDS_NO_TEMPLATE_SELECTED));
        return false;
    }
    if (!check || option != 1 || !engine)
        return true;
    CString message;
    if (engine->VerifyTemplate(option, state.path, message))
        return true;
    if (!message.empty())
        ShowMessage(message);
    return false;
}

bool AcceptDefineTemplate(const DefineTemplateState& state, CEngine* engine)
{
    const int option = state.checkedOption;
    const bool checked = CheckTemplateChoice(state, engine, true);
    if ((!checked && option == 1) || !engine)
        return false;
    StoreChoice(state, *engine);
    bool passed = checked;
    if (UsesTemplateFile(option)) {
        // A parse of the preview file stands only while the parser is still bound to that file.
        const bool bound =
            engine->m_pParser && text::EqualsNoCase(engine->m_pParser->m_strFile, engine->m_strPreviewFile);
        if (!bound)
            engine->m_bParsed = 0;
        if (!engine->m_bParsed) {
            CString previewFile;
            engine->GetPreviewFile(previewFile);
            if (option == 1 && checked)
                passed = engine->ParseInputFile(previewFile) != 0;
        }
    }
    return passed;
}

int PreviewDefineTemplate(const DefineTemplateState& state, CEngine* engine)
{
    if (!CheckTemplateChoice(state, engine, false) || !engine)
        return 0;
    StoreChoice(state, *engine);
    return RunDefaultPreview(engine);
}
