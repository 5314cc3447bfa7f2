// The setup record in a parameter document: the host's document (target "OkaToolbox", section
// "Setup") and the engine's temporary file (target "VELMORA") share the three sections.
#include "engine/Engine.h"

namespace {

void ReadInt(WPXHANDLE section, const char* key, int& field) { wpxGetParam(section, key, &field, 1, 1); }

void ReadText(WPXHANDLE section, const char* key, CString& field) { wpxGetParam(section, key, &field, 1, 1); }

void ReadFileName(WPXHANDLE section, const char* key, CString& field)
{
    wpxGetParamFilename(section, key, &field, 1, 1);
}

// The keywords the input and the output section share, in the order both write them.
struct FileChoice {
    int& format;
    CString& bridge;
    CString& file;
    CString& folder;
};

void WriteFileChoice(WPXHANDLE document, const FileChoice& choice)
{
    wpxPutParam(document, "File_format", choice.format);
    wpxPutParam(document, "Bridge", choice.bridge);
    wpxPutParamFilename(document, "File_name", choice.file.c_str());
    wpxPutParamFilename(document, "Folder_name", choice.folder.c_str());
}

void ReadFileChoice(WPXHANDLE section, const FileChoice& choice)
{
    ReadInt(section, "File_format", choice.format);
    ReadText(section, "Bridge", choice.bridge);
    ReadFileName(section, "File_name", choice.file);
    ReadFileName(section, "Folder_name", choice.folder);
}

} // namespace

void CEngine::WriteSetupSections(WPXHANDLE document)
{
    GetBridgeName(m_nInputFormat, m_strInputBridge);
    wpxAddSection(document, "INPUT");
    wpxPutParam(document, "Type", m_nInputType);
    WriteFileChoice(document, {m_nInputFormat, m_strInputBridge, m_strInputFile, m_strInputFolder});
    wpxEndSection(document);

    wpxAddSection(document, "TEMPLATE");
    wpxPutParam(document, "Template_option", m_nTemplateOption);
    wpxPutParamFilename(document, "Template_name", StoredTemplateName().c_str());
    wpxAddKeyword(document, "Items");
    for (unsigned item : m_arrItems)
        wpxAddInt(document, static_cast<int>(item));
    wpxEndSection(document);

    GetBridgeName(m_nOutputFormat, m_strOutputBridge);
    CString logFile;
    GetLogFileDir(logFile);
    wpxAddSection(document, "OUTPUT");
    WriteFileChoice(document, {m_nOutputFormat, m_strOutputBridge, m_strOutputFile, m_strOutputFolder});
    wpxPutParam(document, "File_title", m_strOutputTitle);
    wpxPutParamFilename(document, "Log_file", logFile.c_str());
    wpxEndSection(document);
}

void CEngine::ReadSetupSections(WPXHANDLE section)
{
    WPXHANDLE input = wpxSectionByNameNum(section, "INPUT", 1);
    ReadInt(input, "Type", m_nInputType);
    ReadFileChoice(input, {m_nInputFormat, m_strInputBridge, m_strInputFile, m_strInputFolder});

    WPXHANDLE templ = wpxSectionByNameNum(section, "TEMPLATE", 1);
    ReadInt(templ, "Template_option", m_nTemplateOption);
    ReadFileName(templ, "Template_name", m_strTemplateName);
    // A hand-made template that was saved to a file reopens as a template to modify.
    if (!m_strTemplateName.empty() && m_nTemplateOption == 3)
        m_nTemplateOption = 2;
    m_arrItems.clear();
    WPXHANDLE items = wpxKeywordByNameNum(templ, "Items", 1);
    for (int n = 1; n <= wpxGetNoParams(items); ++n)
        m_arrItems.push_back(static_cast<unsigned>(wpxGetInt(wpxParamByNum(items, n))));

    WPXHANDLE output = wpxSectionByNameNum(section, "OUTPUT", 1);
    ReadFileChoice(output, {m_nOutputFormat, m_strOutputBridge, m_strOutputFile, m_strOutputFolder});
    ReadText(output, "File_title", m_strOutputTitle);
    CString logFile;
    GetLogFileDir(logFile);
    ReadFileName(output, "Log_file", logFile);
    SetLogFileDir(logFile);
}

int ReadSetup(CEngine& engine)
{
    if (GetModuleWpxHandle() == 0)
        return 1;
    WPXHANDLE setup = wpxSectionByNum(wpxTargetByNum(ModuleWpxDocument(), 1), 1);
    if (!setup)
        return -1;
    CString name;
    engine.GetSetupName(name);
    wpxGetParam(setup, "Name", &name, 1, 1);
    engine.SetSetupName(name);
    engine.ReadSetupSections(setup);
    return 0;
}

int WriteSetup(CEngine& engine)
{
    WPXHANDLE document = wpxCreate();
    if (!document)
        return -1;
    CString name;
    engine.GetSetupName(name);
    wpxAddTarget(document, "OkaToolbox");
    wpxAddSection(document, "Setup");
    wpxPutParam(document, "Name", name);
    engine.WriteSetupSections(document);
    wpxEndSection(document);
    wpxEndSection(document);

    if (GetModuleWpxHandle() != 0) {
        WPXHANDLE previous = ModuleWpxDocument();
        wpxClose(&previous);
    }
    SetModuleWpxHandle(wpxHandleToInt(document));
    return 0;
}
