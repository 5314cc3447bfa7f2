#include "parsers/ParserFactory.h"

#include "parsers/AsciiFilePreviewParser.h"
#include "parsers/ExcelFilePreviewParser.h"
#include "parsers/RbxPreviewFileParser.h"
#include "platform/system/Text.h"
#include "templates/AsciiSpecification.h"
#include "templates/ExcelSpecification.h"

#include <exception>

int FormatFromName(const CString& name)
{
    if (text::EqualsNoCase(name, "rbx0"))
        return kFormatRbx0;
    if (text::EqualsNoCase(name, "ascii"))
        return kFormatAscii;
    if (text::EqualsNoCase(name, "excel"))
        return kFormatExcel;
    return 0;
}

std::unique_ptr<CSpecification> MakeSpecification(int format)
{
    switch (format) {
    case kFormatAscii:
        return std::make_unique<CAsciiSpecification>();
    case kFormatExcel:
        return std::make_unique<CExcelSpecification>();
    default:
        return nullptr;
    }
}

std::unique_ptr<CFilePreviewParser> MakeParser(int format)
{
    switch (format) {
    case kFormatRbx0:
        return std::make_unique<CRbxPreviewFileParser>();
    case kFormatAscii:
        return std::make_unique<CAsciiFilePreviewParser>();
    case kFormatExcel:
        return std::make_unique<CExcelFilePreviewParser>();
    default:
        return nullptr;
    }
}

bool IsParserOfFormat(const CFilePreviewParser* parser, int format)
{
    switch (format) {
    case kFormatRbx0:
        return dynamic_cast<const CRbxPreviewFileParser*>(parser) != nullptr;
    case kFormatAscii:
        return dynamic_cast<const CAsciiFilePreviewParser*>(parser) != nullptr;
    case kFormatExcel:
        return dynamic_cast<const CExcelFilePreviewParser*>(parser) != nullptr;
    default:
        return false;
    }
}

int ParseGuarded(CFilePreviewParser& parser, const CString& path, CString* error)
{
    try {
        return parser.Parse(path);
    } catch (const std::exception& exception) {
        if (error)
            *error = exception.what();
    } catch (...) {
        if (error)
            *error = "the parser stopped with an unknown error";
    }
    return 0;
}
