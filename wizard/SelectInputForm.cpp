#include "wizard/SelectInputForm.h"

#include "engine/Engine.h"
#include "platform/system/FileSystem.h"
#include "platform/ui/UserInterface.h"
#include "resources/StringTable.h"

namespace {

void ShowMessage(const CString& text) { ui::MessageBox(text, CString(), ui::MB_OK | ui::MB_ICONEXCLAMATION); }

void EnableFileControl(SelectInputState& state, bool file)
{
    state.fileEnabled = file;
    state.folderEnabled = !file;
}

// The single-file checks; on failure the message shown.
bool CheckInputFile(const SelectInputState& state, CEngine& engine)
{
    CString message;
    if (sys::FileExists(state.file) && engine.CheckFileExtension(state.file, state.format, message)) {
        engine.SetPreviewFile(state.file);
        return true;
    }
    ShowMessage(message.empty() ? res::LoadString(res::IDS_FILE_INVALID) : message);
    return false;
}

bool CheckInputFolder(const SelectInputState& state, CEngine& engine)
{
    CString first;
    if (engine.FolderExists(state.folder) && engine.FindMatchingFile(state.folder, first, state.format, CString())) {
        if (state.format == 1)
            engine.SetPreviewFile(first);
        return true;
    }
    ShowMessage(res::LoadString(res::IDS_FOLDER_INVALID));
    return false;
}

// rbx0 files describe themselves: the preview file is parsed at once. Its result does not stop
// the page.
void ParseRbxPreviewFile(const SelectInputState& state, CEngine& engine)
{
    CString file = state.file;
    if (!state.singleFile) {
        engine.FindMatchingFile(state.folder, file, state.format, CString());
        engine.SetPreviewFile(file);
    }
    engine.ParseInputFile(file);
}

} // namespace

BrowseSettings BrowseSettingsFor(int format, RbxExtensionForm form)
{
    switch (format) {
    case 2:
        return {"Text Files (*.txt)|*.txt|Comma Separated Files (*.csv)|*.csv|Tab Delimited Files (*.tab)|*.tab|All Files (*.*)|*.*||",
                "*.txt", 2};
    case 3:
        return {"Excel Files (*.xls;*.xlsx) |*.xls;*.xlsx|All Files (*.*)|*.*||", "", 2};
    default:
        return {"Time Series Files (*.rbx0;*.rqt) |*.rbx0;*.rqt|All Files (*.*) |*.*||",
                form == RbxExtensionForm::Pattern ? "*.rbx0" : "rbx0", 1};
    }
}

SelectInputState InitialSelectInput()
{
    SelectInputState state;
    state.browse = BrowseSettingsFor(1, RbxExtensionForm::Bare);
    state.fileEnabled = true;
    state.folderEnabled = false;
    return state;
}

void LoadSelectInput(SelectInputState& state, const CEngine& engine)
{
    state.singleFile = engine.m_nInputType == 1;
    EnableFileControl(state, state.singleFile);
    if (engine.m_nInputFormat >= 1 && engine.m_nInputFormat <= 3) {
        state.format = engine.m_nInputFormat;
        state.browse = BrowseSettingsFor(state.format, RbxExtensionForm::Pattern);
    }
    state.file = engine.m_strInputFile;
    state.folder = engine.m_strInputFolder;
}

void ClickFolder(SelectInputState& state, CEngine* engine)
{
    state.singleFile = false;
    state.folder.clear();
    state.file.clear();
    EnableFileControl(state, false);
    if (engine)
        engine->ResetSetup();
}

void ClickSingleFile(SelectInputState& state, CEngine* engine)
{
    state.singleFile = true;
    state.browse = BrowseSettingsFor(state.format, RbxExtensionForm::Pattern);
    state.folder.clear();
    state.file.clear();
    EnableFileControl(state, true);
    if (engine)
        engine->ResetSetup();
}

void ClickFormat(SelectInputState& state, int format)
{
    state.format = format;
    if (state.singleFile) {
        state.browse = BrowseSettingsFor(format, RbxExtensionForm::Bare);
        state.folder.clear();
        state.file.clear();
        EnableFileControl(state, true);
    } else {
        EnableFileControl(state, false);
        state.file.clear();
    }
}

void SelectorOpening(const SelectInputState& state, CEngine* engine, COkaFileSelectorDlg* dialog)
{
    if (!engine || !state.singleFile || state.format != 1)
        return;
    engine->SetInputFileConstraints(dialog);
    engine->m_bConstraintsApplied = 1;
}

bool AcceptSelectInput(const SelectInputState& state, CEngine* engine)
{
    if (!engine)
        return true; // nothing to check against
    const bool accepted = state.singleFile ? CheckInputFile(state, *engine) : CheckInputFolder(state, *engine);
    if (!accepted)
        return false;
    engine->SetInput(state.singleFile ? 1 : 2, state.format, state.file, state.folder);
    if (state.singleFile)
        engine->SetPreviewFile(state.file); // the new parser now exists
    if (state.format == 1)
        ParseRbxPreviewFile(state, *engine);
    CString workTemplate;
    if (!engine->GetWorkTemplate(workTemplate))
        engine->SetWorkTemplate(MakeWorkTemplateName());
    return true;
}
