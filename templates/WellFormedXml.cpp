#include "templates/WellFormedXml.h"

#include "platform/system/Text.h"

#include <expat.h>

#include <memory>
#include <new>

namespace tmplfile {
namespace {

struct ParserFree {
    void operator()(XML_Parser parser) const { XML_ParserFree(parser); }
};

struct Check {
    XML_Parser parser = nullptr;
    bool sawDoctype = false;
};

// A DTD could declare entities; no template has one, so the first sign of it ends the parse.
void XMLCALL RefuseDoctype(void* data, const XML_Char*, const XML_Char*, const XML_Char*, int)
{
    auto* check = static_cast<Check*>(data);
    check->sawDoctype = true;
    XML_StopParser(check->parser, XML_FALSE);
}

} // namespace

sys::Status CheckWellFormedXml(std::string_view utf8)
{
    // Naming the encoding here overrides the declaration's: the bytes are UTF-8 by now.
    std::unique_ptr<XML_ParserStruct, ParserFree> parser(XML_ParserCreate("UTF-8"));
    if (!parser)
        throw std::bad_alloc();
    Check check{parser.get()};
    XML_SetUserData(parser.get(), &check);
    XML_SetStartDoctypeDeclHandler(parser.get(), &RefuseDoctype);
    XML_SetParamEntityParsing(parser.get(), XML_PARAM_ENTITY_PARSING_NEVER);
    if (XML_Parse(parser.get(), utf8.data(), static_cast<int>(utf8.size()), XML_TRUE) == XML_STATUS_OK)
        return sys::Status::Ok();
    if (check.sawDoctype)
        return sys::Status::Fail({}, 0, "a document type declaration is not accepted in a template file");
    return sys::Status::Fail({}, 0,
                             text::Format("not a well-formed XML document (%s at line %lu, column %lu)",
                                          XML_ErrorString(XML_GetErrorCode(parser.get())),
                                          static_cast<unsigned long>(XML_GetCurrentLineNumber(parser.get())),
                                          static_cast<unsigned long>(XML_GetCurrentColumnNumber(parser.get()) + 1)));
}

} // namespace tmplfile
