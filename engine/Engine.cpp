#include "engine/Engine.h"

#include "platform/system/FileFormat.h"
#include "platform/system/Text.h"

namespace {

// Room for the extension and a number within the 255 bytes a file name may have.
constexpr size_t kMaxEngineNameBytes = 200;

} // namespace

CEngine::~CEngine()
{
    // The parser borrows the template object, so it goes first.
    m_pParser.reset();
    m_pSpecification.reset();
}

void CEngine::GetBridgeName(int format, CString& name)
{
    const sys::FileFormatInfo* info = sys::FindFormat(format);
    name = info ? info->bridgeName : "";
}

CString CEngine::StoredTemplateName() const
{
    if (m_nTemplateOption == 1 || !m_pSpecification)
        return m_strTemplateName;
    return m_pSpecification->m_strSaveFile;
}

CString CEngine::EngineFileName() const
{
    CString name;
    GetSetupName(name);
    for (char& c : name) {
        const unsigned char byte = static_cast<unsigned char>(c);
        // Blanks as the toolbox always wrote them; separators and control characters so that the
        // name stays one file name inside the temporary folder.
        if (c == ' ' || c == '/' || c == '\\' || byte < 0x20 || byte == 0x7F)
            c = '_';
    }
    // A name of dots would mean the folder or its parent, and a leading dot hides the file.
    for (size_t i = 0; i < name.size() && name[i] == '.'; ++i)
        name[i] = '_';
    return text::CutUtf8(name, kMaxEngineNameBytes) + ".wpx";
}
