#include "engine/Engine.h"

#include <algorithm>

CEngine::~CEngine()
{
    // The parser borrows the template object, so it goes first.
    m_pParser.reset();
    m_pSpecification.reset();
}

void CEngine::GetBridgeName(int format, CString& name)
{
    name.clear();
    switch (format) {
    case 1: name = "rbx Timeseries Bridge"; break;
    case 2: name = "ASCII Timeseries Bridge (General)"; break;
    case 3: name = "Excel Timeseries Bridge"; break;
    default: break;
    }
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
    std::replace(name.begin(), name.end(), ' ', '_');
    return name + ".wpx";
}
