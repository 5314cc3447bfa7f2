// Choosing the input, the template and the items: the operations that create, replace and wire the
// setup record's working objects (the template object and the preview parser of the input format).
#include "engine/Engine.h"

#include "parsers/ParserFactory.h"
#include "platform/system/Text.h"

void CEngine::SetInput(int type, int format, const CString& file, const CString& folder)
{
    m_nInputType = type;
    const bool keepObjects = format == m_nInputFormat && IsParserOfFormat(m_pParser.get(), format);
    if (!keepObjects) {
        // The parser borrows the template, so it goes first.
        m_pParser.reset();
        m_pSpecification.reset();
        m_pSpecification = MakeSpecification(format);
        m_pParser = MakeParser(format); // the rbx0 parser prepares the rbx data-file library
    }
    m_nInputFormat = format;
    m_strInputFile = file;
    m_strInputFolder = folder;
    if (m_pParser)
        m_pParser->m_pSpecification = m_pSpecification.get();
}

void CEngine::SetTemplate(int option, const CString& name)
{
    m_nTemplateOption = option;
    m_strTemplateName = name;
    if (m_pSpecification && !text::EqualsNoCase(m_pSpecification->m_strTemplateFile, name)) {
        // Forces the next LoadTemplate to read the newly chosen file.
        m_pSpecification->m_strTemplateFile = name;
        m_pSpecification->m_bLoaded = 0;
    }
}

void CEngine::SetItems(const CUIntArray& items)
{
    m_arrItems = items;
    if (m_pSpecification)
        m_pSpecification->m_arrSelItems = items;
    if (m_pParser)
        m_pParser->m_arrItems = items;
}

void CEngine::ResetSetup()
{
    m_bConstraintsApplied = 0;
    m_nInputType = 1;
    m_nInputFormat = 1;
    m_nTemplateOption = 1;
    m_nOutputFormat = 1;
    m_bParsed = 0;
    m_strInputFile.clear();
    m_strInputFolder.clear();
    m_strTemplateName.clear();
    m_strOutputFile.clear();
    m_strOutputFolder.clear();
    m_strOutputTitle.clear();
    m_strPreviewFile.clear();
}
