// Running the tool: verify, hand the setup to the engine program in a temporary file, report.
#include "engine/Engine.h"
#include "platform/system/FileSystem.h"
#include "platform/ui/UserInterface.h"
#include "resources/StringTable.h"

namespace {

constexpr unsigned kTempPathBuffer = 260;
constexpr const char* kEngineProgram = "Velmora.exe";

int OutcomeMessageId(int result, int inputType)
{
    if (result == 0)
        return res::IDS_STATUS_OK;
    return inputType == 1 ? res::IDS_ERROR_RUNNING_ENGINE : res::IDS_FOLDER_FILES_SKIPPED;
}

// The temporary folder followed by `name`; the bare name (current folder) when the folder is
// unknown or longer than the buffer the toolbox allows.
CString TemporaryPath(const CString& name)
{
    std::string folder;
    unsigned length = sys::GetTempPath(kTempPathBuffer, folder);
    if (length == 0 || length >= kTempPathBuffer)
        return name;
    return folder + name;
}

} // namespace

int CEngine::RunTool(int silent)
{
    CString message;
    int result = _Verify(message);
    if (result == 0)
        result = LaunchEngine();
    CString caption = res::LoadString(res::IDS_RUN_ENGINE_CAPTION);
    if (!silent)
        ui::MessageBox(res::LoadString(OutcomeMessageId(result, m_nInputType)), caption, ui::MB_OK);
    return result;
}

int CEngine::LaunchEngine()
{
    WPXHANDLE document = wpxCreate();
    wpxAddTarget(document, "VELMORA");
    WriteSetupSections(document);
    wpxEndSection(document);

    CString path = TemporaryPath(EngineFileName());
    wpxWrite(document, path);
    wpxClose(&document);

    int result = RunEngine(kEngineProgram, path, 1);
    sys::DeleteFile(path);
    return result;
}
