// The checks that hold a setup against the real files (folder, extension, Excel version, the bridge
// component's verdict on a template), and the working files they rely on: the data file the parser
// is bound to and the temporary working copy of the template.
#include "engine/Engine.h"

#include "parsers/ExcelFilePreviewParser.h"
#include "parsers/ParserFactory.h"
#include "platform/bridge/BridgeComponent.h"
#include "platform/system/FileFormat.h"
#include "platform/system/FileSystem.h"
#include "platform/system/Text.h"
#include "resources/StringTable.h"

#include <filesystem>

namespace {

constexpr size_t kMaxPath = 260;

// False for the entries a folder scan passes over: folders, and files that are hidden, temporary or
// unreadable.
bool IsCandidateEntry(const CString& path)
{
    const auto attributes = sys::GetAttributes(path);
    return attributes && !attributes->directory && !attributes->temporary && attributes->readable &&
           !attributes->hidden;
}

CString CurrentFolderWithSeparator()
{
    std::error_code error;
    CString folder = std::filesystem::current_path(error).string();
    if (error || folder.empty())
        return CString();
    if (folder.back() != '/')
        folder += '/';
    return folder;
}

} // namespace

int CEngine::FolderExists(const CString& path)
{
    if (path.size() < 2 || path.size() > kMaxPath)
        return 0;
    CString folder = path;
    if (folder.back() == '/')
        folder.pop_back();
    const auto attributes = sys::GetAttributes(folder);
    return attributes && attributes->directory ? 1 : 0;
}

int CEngine::CheckFileExtension(const CString& path, int format, CString& message)
{
    switch (static_cast<sys::FileFormat>(format)) {
    case sys::FileFormat::Rbx0:
    case sys::FileFormat::Ascii:
        return sys::IsInputOf(static_cast<sys::FileFormat>(format), path) ? 1 : 0;
    case sys::FileFormat::Excel: {
        // Excel may have been installed or removed since the last test; .xlsx needs Excel 2007.
        const CString extension = sys::FileExtension(path);
        const int version = GetExcelVersion();
        if (sys::HasInputExtension(sys::FileFormat::Excel, path) &&
            version >= (text::EqualsNoCase(extension, ".xlsx") ? 12 : 11))
            return 1;
        message = res::LoadString(res::IDS_EXCEL_MISSING);
        return 0;
    }
    }
    return 0;
}

int CEngine::IsTextFile(const CString& path) { return sys::LooksLikeText(path) ? 1 : 0; }

int CEngine::BridgeAccepts(const CString& file, const CString& templatePath, int format, short folderScan)
{
    std::unique_ptr<bridge::ITimeSeriesComponent> component = bridge::CreateComponent();
    if (!component || file.empty() || templatePath.empty())
        return 0;
    std::unique_ptr<bridge::ITimeSeriesBridge> tsBridge;
    component->GetBridge(tsBridge);
    if (!tsBridge)
        return 0;
    CString bridgeName;
    GetBridgeName(format, bridgeName);
    tsBridge->SetBridgeName(bridgeName);
    tsBridge->SetParameters("TemplateFilePath=" + templatePath);
    tsBridge->SetDataFile(file);
    tsBridge->SetFolderScan(folderScan);
    unsigned short verdict = 0;
    try {
        tsBridge->GetVerdict(&verdict);
    } catch (...) {
        return 0;
    }
    return verdict == bridge::kVerdictTrue ? 1 : 0;
}

int CEngine::FindMatchingFile(const CString& folder, CString& firstMatch, int format, const CString& templatePath)
{
    firstMatch.clear();
    const auto entries = sys::ListFolder(folder);
    if (!entries)
        return 0;
    for (const CString& name : *entries) {
        const CString path = sys::JoinPath(folder, name);
        if (!IsCandidateEntry(path))
            continue;
        CString scratch;
        if (!CheckFileExtension(path, format, scratch))
            continue;
        if (templatePath.empty() || BridgeAccepts(path, templatePath, format, bridge::kFolderScan)) {
            firstMatch = path;
            return 1;
        }
    }
    return 0;
}

int CEngine::VerifyTemplate(const int& option, const CString& templatePath, CString& message)
{
    if (option > 3)
        return 0;
    if (option == 3)
        return 1; // described by hand: there is no file to hold against the input yet
    if (!IsValidFileName(templatePath)) {
        message = res::LoadString(res::IDS_FILE_INVALID);
        return 0;
    }
    if (m_nInputType == 1) {
        const int accepted = BridgeAccepts(m_strInputFile, templatePath, m_nInputFormat, bridge::kSingleFile);
        if (accepted)
            SetPreviewFile(m_strInputFile);
        return accepted;
    }
    if (m_nInputType == 2) {
        CString match;
        if (!FindMatchingFile(m_strInputFolder, match, m_nInputFormat, templatePath)) {
            message = res::LoadString(res::IDS_TEMPLATE_NO_MATCH);
            return 0;
        }
        SetPreviewFile(match);
        return 1;
    }
    return 0;
}

int CEngine::VerifyOutput(int format, const CString& file, const CString& folder, CString /*title*/,
                          CString& message)
{
    if (format < 1 || format > 3)
        return 0;
    if (m_nInputType == 1) {
        CString scratch;
        if (IsValidFileName(file) && CheckFileExtension(file, format, scratch))
            return 1;
        message = res::LoadString(res::IDS_FILE_INVALID);
        return 0;
    }
    if (FolderExists(folder))
        return 1;
    message = res::LoadString(res::IDS_FOLDER_INVALID);
    return 0;
}

int CEngine::LoadTemplate(const CString& path)
{
    if (!m_pSpecification)
        return 0;
    int result = 1;
    const bool alreadyLoaded =
        m_pSpecification->m_bLoaded && text::EqualsNoCase(m_pSpecification->m_strTemplateFile, path);
    if (!alreadyLoaded) {
        result = m_pSpecification->Load(path);
        if (!result)
            return 0;
    }
    if (!text::EqualsNoCase(m_strTemplateName, path))
        m_strTemplateName = path;
    // Keeps the working copy the bridge and the parser read in step with what was loaded.
    if (!m_strWorkTemplate.empty())
        m_pSpecification->Save(m_strWorkTemplate);
    return result;
}

int CEngine::ParseInputFile(const CString& path)
{
    if (!m_pParser)
        return 0;
    if (m_bParsed && text::EqualsNoCase(path, m_strPreviewFile))
        return 1;
    const CString& file = path.empty() ? m_strPreviewFile : path;
    // Unreadable files and spreadsheet automation errors surface as exceptions.
    bool threw = false;
    const int result = ParseGuarded(*m_pParser, file, &threw);
    if (threw)
        m_bParsed = 0;
    else if (result)
        m_bParsed = 1;
    return result;
}

int CEngine::ReadItemNames(const CString& path, CStringList& names)
{
    names.clear();
    if (!m_pParser)
        return 0;
    m_pParser->SetFile(path);
    CExcelFilePreviewParser* excel = nullptr;
    if (m_nInputFormat == sys::Number(sys::FileFormat::Excel)) {
        excel = dynamic_cast<CExcelFilePreviewParser*>(m_pParser.get());
        CString message;
        if (!excel || !excel->OpenWorkbook(path, message))
            return 0;
    }
    int result = 0;
    try {
        result = m_pParser->GetItemNames(names);
    } catch (...) {
        // An unreadable file must not take the wizard down; the caller only learns the failure.
        result = 0;
    }
    if (excel)
        excel->CloseWorkbook();
    return result;
}

int CEngine::SetPreviewFile(const CString& path)
{
    if (path.empty())
        return 0;
    if (!m_pParser) {
        m_strPreviewFile.clear();
        m_bParsed = 0;
        return 0;
    }
    if (text::EqualsNoCase(path, m_strPreviewFile) && text::EqualsNoCase(m_pParser->m_strFile, path))
        return 1;
    m_strPreviewFile = path;
    m_bParsed = 0;
    m_pParser->SetFile(path);
    return 1;
}

int CEngine::GetPreviewFile(CString& path)
{
    if (!m_pParser) {
        m_strPreviewFile.clear();
        m_bParsed = 0;
        return 0;
    }
    if (m_strPreviewFile.empty())
        return 0;
    path = m_strPreviewFile;
    if (!text::EqualsNoCase(m_pParser->m_strFile, m_strPreviewFile))
        m_pParser->SetFile(m_strPreviewFile);
    return 1;
}

int CEngine::SetWorkTemplate(const CString& path)
{
    if (path.empty())
        return 0;
    if (!m_pSpecification) {
        m_strWorkTemplate.clear();
        m_bParsed = 0;
        return 0;
    }
    if (text::EqualsNoCase(path, m_strWorkTemplate) && text::EqualsNoCase(m_pSpecification->m_strTemplateFile, path))
        return 1;
    m_strWorkTemplate = path;
    m_bParsed = 0;
    if (m_pParser)
        m_pSpecification->SetTemplateFile(path);
    return 1;
}

int CEngine::GetWorkTemplate(CString& path)
{
    if (!m_pSpecification) {
        m_strWorkTemplate.clear();
        m_bParsed = 0;
        return 0;
    }
    if (m_strWorkTemplate.empty())
        return 0;
    path = m_strWorkTemplate;
    if (!text::EqualsNoCase(m_pSpecification->m_strTemplateFile, m_strWorkTemplate))
        m_pSpecification->SetTemplateFile(m_strWorkTemplate);
    return 1;
}

CString MakeWorkTemplateName()
{
    CString folder;
    const unsigned length = sys::GetTempPath(static_cast<unsigned>(kMaxPath), folder);
    if (length == 0 || length >= kMaxPath)
        folder = CurrentFolderWithSeparator();
    CString candidate = folder + "VelmoraTemplate.xml";
    for (int n = 0; sys::FileExists(candidate); ++n)
        candidate = folder + text::Format("VelmoraTemplate_%d", n) + ".xml";
    return candidate;
}
