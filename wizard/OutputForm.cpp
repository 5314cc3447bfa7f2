#include "wizard/OutputForm.h"

#include "engine/Engine.h"
#include "parsers/ExcelFilePreviewParser.h"
#include "platform/system/FileSystem.h"
#include "platform/system/Text.h"
#include "resources/StringTable.h"

namespace {

constexpr int kFirstXlsxVersion = 12;
constexpr unsigned kFolderBrowserFlags = 0x55; // file-system folders only, status text, edit box, new style

void ShowMessage(const CString& text) { ui::MessageBox(text, CString(), ui::MB_OK | ui::MB_ICONEXCLAMATION); }

} // namespace

void LoadOutput(OutputState& state, const CEngine& engine)
{
    state.file = engine.m_strOutputFile;
    state.folder = engine.m_strOutputFolder;
    state.title = engine.m_strOutputTitle;
    if (engine.m_nOutputFormat >= 1 && engine.m_nOutputFormat <= 3)
        state.format = engine.m_nOutputFormat;
    EnableOutputControls(state, engine.m_nInputType);
}

void EnableOutputControls(OutputState& state, int inputType)
{
    state.fileEnabled = inputType == 1;
    state.folderEnabled = inputType != 1;
    state.titleEnabled = state.format == 1;
}

void ClickOutputFormat(OutputState& state, int format)
{
    state.format = format;
    state.titleEnabled = format == 1;
}

ui::FileDialogRequest OutputFileRequest(int format, int excelVersion)
{
    ui::FileDialogRequest request;
    request.open = false;
    request.flags = ui::OFN_OVERWRITEPROMPT | ui::OFN_HIDEREADONLY | ui::OFN_FILEMUSTEXIST;
    switch (format) {
    case 1:
        request.defaultExtension = "rbx0";
        request.initialName = "*.rbx0";
        request.filter = "Time Series Files (*.rbx0;*.rqt) |*.rbx0;*.rqt|All Files (*.*) |*.*||";
        break;
    case 2:
        request.defaultExtension = "txt";
        request.initialName = "*.txt";
        request.filter = "Text Files (*.txt)|*.txt|Tab Delimited Files (*.tab)|*.tab|All Files (*.*)|*.*||";
        break;
    default:
        if (excelVersion >= kFirstXlsxVersion) {
            request.defaultExtension = ".xlsx";
            request.initialName = "*.xlsx";
            request.filter = "Excel Files (*.xlsx) | *.xlsx| All Files (*.*) | *.*||";
        } else {
            request.defaultExtension = ".xls";
            request.initialName = "*.xls";
            request.filter = "Excel Files (*.xls) | *.xls| All Files (*.*) | *.*||";
        }
        break;
    }
    return request;
}

int AddDefaultExtension(CString& name, int format, int excelVersion)
{
    if (name.empty())
        return 1;
    const CString extension = sys::FileExtension(name);
    if (extension.empty() && format == 1) {
        name += ".rbx0";
    } else if (format == 2) {
        if (text::EqualsNoCase(extension, ".csv")) {
            ShowMessage(res::LoadString(res::IDS_FILE_NAME_INVALID));
            return 0;
        }
        if (extension.empty())
            name += ".txt";
    } else if (extension.empty()) {
        name += excelVersion >= kFirstXlsxVersion ? ".xlsx" : ".xls";
    }
    return 1;
}

int ExcelVersionFor(int format) { return format == 3 ? GetExcelVersion() : 0; }

void BrowseOutputFile(OutputState& state, int excelVersion)
{
    std::string path;
    if (!ui::Current().ChooseFile(OutputFileRequest(state.format, excelVersion), path))
        return;
    state.file = path;
    AddDefaultExtension(state.file, state.format, excelVersion);
}

void BrowseOutputFolder(OutputState& state)
{
    std::string path;
    if (ui::Current().BrowseForFolder({res::LoadString(res::IDS_SELECT_FOLDER), state.folder, kFolderBrowserFlags}, path) &&
        !path.empty())
        state.folder = path;
}

int ValidateOutput(OutputState& state, CEngine* engine, int excelVersion)
{
    if (!engine)
        return 0;
    if (engine->m_nInputType == 1 && !AddDefaultExtension(state.file, state.format, excelVersion))
        return 0;
    CString message;
    if (!engine->VerifyOutput(state.format, state.file, state.folder, state.title, message)) {
        ShowMessage(message);
        return 0;
    }
    engine->m_nOutputFormat = state.format;
    engine->m_strOutputFile = state.file;
    engine->m_strOutputFolder = state.folder;
    engine->m_strOutputTitle = state.title;
    return 1;
}
