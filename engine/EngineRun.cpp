// Running the tool: verify, hand the setup to the engine program in a temporary file, report.
#include "engine/Engine.h"
#include "engine/TemporarySetupFile.h"
#include "platform/system/FileSystem.h"
#include "platform/system/Text.h"
#include "platform/ui/UserInterface.h"
#include "resources/StringTable.h"

#include <cstdio>

namespace {

constexpr unsigned kTempPathBuffer = 260;
constexpr const char* kEngineProgram = "Velmora.exe";
// The run's result when the engine could not be started: there was no setup file to give it.
constexpr int kNoSetupFile = 126;

int OutcomeMessageId(int result, int inputType)
{
    if (result == 0)
        return res::IDS_STATUS_OK;
    return inputType == 1 ? res::IDS_ERROR_RUNNING_ENGINE : res::IDS_FOLDER_FILES_SKIPPED;
}

// The temporary folder, ending in "/"; empty (the current folder) when it is unknown or longer than
// the buffer the toolbox allows.
std::string TemporaryFolder()
{
    std::string folder;
    unsigned length = sys::GetTempPath(kTempPathBuffer, folder);
    if (length == 0 || length >= kTempPathBuffer)
        return {};
    return folder;
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

int CEngine::LaunchEngine() { return LaunchEngine({}); }

int CEngine::LaunchEngine(const std::vector<CString>& options)
{
    WPXHANDLE document = wpxCreate();
    wpxAddTarget(document, "VELMORA");
    WriteSetupSections(document);
    wpxEndSection(document);
    const std::string content = wpxFormat(document);
    wpxClose(&document);

    const TemporarySetupFile file(TemporaryFolder(), EngineFileName(), content);
    if (!file.Created()) {
        // Never start the engine on a file this run did not write.
        std::fprintf(stderr, "Velmora: %s\n", text::EscapeControls(file.status().problem().message).c_str());
        return kNoSetupFile;
    }
    return RunEngine(kEngineProgram, file.Path(), 1, options);
}
