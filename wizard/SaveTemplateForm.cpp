#include "wizard/SaveTemplateForm.h"

#include "engine/Engine.h"
#include "platform/system/FileSystem.h"
#include "platform/system/Text.h"
#include "resources/StringTable.h"

namespace {

const char* const kTemplateFileName = "/template.xml";

constexpr unsigned kMaxPath = 260;

bool Asked(int stringId)
{
    return ui::MessageBox(res::LoadString(stringId), kSaveTemplateCaption, ui::MB_YESNO) == ui::IDYES;
}

CString WithoutTrailingSeparators(CString folder)
{
    while (!folder.empty() && folder.back() == '/')
        folder.pop_back();
    return folder;
}

} // namespace

CString ProposeTemplateName(const CEngine& engine)
{
    switch (engine.m_nTemplateOption) {
    case 1:
    case 2:
        return engine.m_strTemplateName;
    case 3:
        break;
    default:
        return CString();
    }
    CString folder;
    if (engine.m_nInputType == 1) {
        const size_t slash = engine.m_strInputFile.rfind('/');
        folder = slash == CString::npos ? CString() : engine.m_strInputFile.substr(0, slash);
    } else if (engine.m_nInputType == 2) {
        folder = WithoutTrailingSeparators(engine.m_strInputFolder);
    } else {
        sys::GetTempPath(kMaxPath, folder);
        folder = WithoutTrailingSeparators(folder);
    }
    return folder + kTemplateFileName;
}

CString LoadTemplateName(const CEngine& engine, const CString& current)
{
    CString name = current;
    if (engine.m_pSpecification)
        name = engine.m_pSpecification->m_strSaveFile;
    return name.empty() ? ProposeTemplateName(engine) : name;
}

ui::FileDialogRequest TemplateSaveRequest()
{
    ui::FileDialogRequest request;
    request.open = false;
    request.defaultExtension = "xml";
    request.initialName = "*.xml";
    request.filter = "XML Files (*.xml)|*.xml|All Files (*.*)|*.*||";
    request.flags = ui::OFN_OVERWRITEPROMPT | ui::OFN_HIDEREADONLY | ui::OFN_FILEMUSTEXIST;
    return request;
}

int ValidateTemplateName(const CString& name, const CEngine* engine)
{
    if (!CHarborEngine::IsValidFileName(name) || !text::EqualsNoCase(sys::FileExtension(name), ".xml")) {
        ui::ShowStringMessage(res::IDS_TEMPLATE_NAME_INVALID);
        return 0;
    }
    if (!engine)
        return 1;
    if (text::EqualsNoCase(name, engine->m_strTemplateName))
        return Asked(res::IDS_OVERWRITE_INPUT_TEMPLATE) ? 1 : 0;
    if (engine->m_nTemplateOption == 3 && sys::FileExists(name))
        return Asked(res::IDS_FILE_EXISTS_REPLACE) ? 1 : 0;
    return 1;
}

bool AcceptTemplateName(const CString& name, CEngine* engine)
{
    if (!ValidateTemplateName(name, engine))
        return false;
    if (engine && engine->m_pSpecification) {
        engine->m_pSpecification->m_strSaveFile = name;
        engine->m_pSpecification->Save(name);
    }
    return true;
}
