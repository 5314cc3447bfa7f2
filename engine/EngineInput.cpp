// Choosing the input, the template and the items: the operations that create, replace and wire the
// setup record's working objects (the template object and the preview parser of the input format).
#include "engine/Engine.h"

#include "parsers/AsciiFilePreviewParser.h"
#include "parsers/ExcelFilePreviewParser.h"
#include "parsers/RbxPreviewFileParser.h"
#include "platform/system/Text.h"
#include "templates/AsciiSpecification.h"
#include "templates/ExcelSpecification.h"

namespace {

// True when `parser` is of the class that reads `format`.
bool ParserServesFormat(const CFilePreviewParser* parser, int format)
{
    switch (format) {
    case 1:
        return dynamic_cast<const CRbxPreviewFileParser*>(parser) != nullptr;
    case 2:
        return dynamic_cast<const CAsciiFilePreviewParser*>(parser) != nullptr;
    case 3:
        return dynamic_cast<const CExcelFilePreviewParser*>(parser) != nullptr;
    default:
        return false;
    }
}

std::unique_ptr<CSpecification> NewSpecification(int format)
{
    switch (format) {
    case 2:
        return std::make_unique<CAsciiSpecification>();
    case 3:
        return std::make_unique<CExcelSpecification>();
    default:
        return nullptr; // rbx0 files describe themselves
    }
}

std::unique_ptr<CFilePreviewParser> NewParser(int format)
{
    switch (format) {
    case 1:
        return std::make_unique<CRbxPreviewFileParser>(); // prepares the rbx data-file library
    case 2:
        return std::make_unique<CAsciiFilePreviewParser>();
    case 3:
        return std::make_unique<CExcelFilePreviewParser>();
    default:
        return nullptr;
    }
}

} // namespace

void CEngine::SetInput(int type, int format, const CString& file, const CString& folder)
{
    m_nInputType = type;
    const bool keepObjects = format == m_nInputFormat && ParserServesFormat(m_pParser.get(), format);
    if (!keepObjects) {
        // The parser borrows the template, so it goes first.
        m_pParser.reset();
        m_pSpecification.reset();
        m_pSpecification = NewSpecification(format);
        m_pParser = NewParser(format);
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
