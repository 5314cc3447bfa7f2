#include "parsers/ParserFactory.h"

#include "parsers/AsciiFilePreviewParser.h"
#include "parsers/ExcelFilePreviewParser.h"
#include "parsers/RbxPreviewFileParser.h"
#include "platform/system/FileFormat.h"
#include "templates/AsciiSpecification.h"
#include "templates/ExcelSpecification.h"

#include <exception>

std::unique_ptr<CSpecification> MakeSpecification(int format)
{
    switch (static_cast<sys::FileFormat>(format)) {
    case sys::FileFormat::Ascii:
        return std::make_unique<CAsciiSpecification>();
    case sys::FileFormat::Excel:
        return std::make_unique<CExcelSpecification>();
    default:
        return nullptr;
    }
}

std::unique_ptr<CFilePreviewParser> MakeParser(int format)
{
    switch (static_cast<sys::FileFormat>(format)) {
    case sys::FileFormat::Rbx0:
        return std::make_unique<CRbxPreviewFileParser>();
    case sys::FileFormat::Ascii:
        return std::make_unique<CAsciiFilePreviewParser>();
    case sys::FileFormat::Excel:
        return std::make_unique<CExcelFilePreviewParser>();
    default:
        return nullptr;
    }
}

bool IsParserOfFormat(const CFilePreviewParser* parser, int format)
{
    switch (static_cast<sys::FileFormat>(format)) {
    case sys::FileFormat::Rbx0:
        return dynamic_cast<const CRbxPreviewFileParser*>(parser) != nullptr;
    case sys::FileFormat::Ascii:
        return dynamic_cast<const CAsciiFilePreviewParser*>(parser) != nullptr;
    case sys::FileFormat::Excel:
        return dynamic_cast<const CExcelFilePreviewParser*>(parser) != nullptr;
    default:
        return false;
    }
}

int ParseGuarded(CFilePreviewParser& parser, const CString& path, bool* threw)
{
    const CString file = path.empty() ? parser.m_strFile : path;
    parser.m_strFailure.clear();
    int result = 0;
    bool thrown = true;
    try {
        result = parser.Parse(path);
        thrown = false;
    } catch (const std::exception& exception) {
        parser.m_strFailure = exception.what();
    } catch (...) {
        parser.m_strFailure = file + ": the parser stopped with an unknown error";
    }
    if (threw)
        *threw = thrown;
    if (result)
        parser.m_strFailure.clear();
    else if (parser.m_strFailure.empty())
        parser.m_strFailure = file + ": the file cannot be read";
    return result;
}
