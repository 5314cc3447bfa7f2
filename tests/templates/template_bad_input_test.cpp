#include "TemplateTestSupport.h"

#include "templates/AsciiSpecification.h"
#include "templates/ExcelSpecification.h"
#include "templates/TemplateXml.h"

#include <gtest/gtest.h>

#include <filesystem>
#include <functional>
#include <string>

using namespace testsupport;

namespace {

std::string Repeat(const std::string& piece, size_t count)
{
    std::string out;
    out.reserve(piece.size() * count);
    for (size_t i = 0; i < count; ++i)
        out += piece;
    return out;
}

std::string Root(const std::string& attributes, const std::string& body = "")
{
    return "<ASCIITSBridgeSpecification " + attributes + "><ASCIITSBridgeSpecificationExtension>" + body +
           "</ASCIITSBridgeSpecificationExtension></ASCIITSBridgeSpecification>";
}

struct BadInput {
    const char* label;
    std::string bytes;
    const char* messagePart;
};

std::vector<BadInput> BadInputs()
{
    const std::string laughs = "<!DOCTYPE lolz [<!ENTITY lol \"lol\"><!ENTITY lol2 \"&lol;&lol;&lol;&lol;&lol;\">"
                               "<!ENTITY lol3 \"&lol2;&lol2;&lol2;&lol2;&lol2;\">]>";
    return {
        {"empty", "", "not a well-formed XML document"},
        {"blank", "  \n ", "not a well-formed XML document"},
        {"not XML", "StartRow=3\nDelimiter=Comma\n", "not a well-formed XML document"},
        {"truncated", "<ASCIITSBridgeSpecification StartRow='3'", "not a well-formed XML document"},
        {"mismatched end", "<a>\n<b></a>", "line 2"},
        {"wrong root", "<Template StartRow='3'/>", "no element ASCIITSBridgeSpecification"},
        {"the other kind", "<MSExcelTSBridgeSpecification StartRow='3'/>", "no element ASCIITSBridgeSpecification"},
        {"number is a word", Root("StartRow='three'"), "StartRow must be a whole number"},
        {"number is empty", Root("DateCol=''"), "DateCol must be a whole number"},
        {"number with junk", Root("TimeCol='3x'"), "TimeCol must be a whole number"},
        {"number too large", Root("StartRow='2147483648'"), "StartRow"},
        {"number absurd", Root("UnitRow='-99999999999999999999999999'"), "UnitRow"},
        {"number is a fraction", Root("ItemTitleOption='1.5'"), "ItemTitleOption"},
        {"good values before a bad one", Root("Delimiter='Comma' StartRow='9' DateTimeOption='x'"), "DateTimeOption"},
        {"huge attribute", Root("DeleteValue='" + std::string(tmplfile::kMaxValueBytes + 1, '9') + "'"), "DeleteValue"},
        {"huge item text",
         Root("", "<ItemUnits><ItemUnit>" + std::string(tmplfile::kMaxValueBytes + 1, 'm') + "</ItemUnit></ItemUnits>"),
         "ItemUnits"},
        {"too many items", Root("", "<ItemTitles>" + Repeat("<t/>", tmplfile::kMaxItemDefinitions + 1) + "</ItemTitles>"),
         "item definitions"},
        {"deep nesting", Repeat("<a>", 100000) + Root("") + Repeat("</a>", 100000), "nested deeper"},
        {"internal entity", "<!DOCTYPE t [<!ENTITY e 'Comma'>]>" + Root("Delimiter='&e;'"), "document type"},
        {"external entity", "<!DOCTYPE t [<!ENTITY e SYSTEM 'file:///etc/hostname'>]>" + Root("Delimiter='&e;'"),
         "document type"},
        {"external DTD", "<!DOCTYPE t SYSTEM 'http://127.0.0.1:9/t.dtd'>" + Root(""), "document type"},
        {"entity expansion", laughs + Root("DeleteValue='&lol3;'"), "document type"},
        {"deep DTD", "<!DOCTYPE t [" + Repeat("<![INCLUDE[", 50000) + Repeat("]]>", 50000) + "]>" + Root(""),
         ""},
        {"declaration at the end", Root("") + "<?xml version='1.0'?>", "not a well-formed XML document"},
        {"declaration inside", "<x><?xml version='1.0'?>" + Root("") + "</x>", "not a well-formed XML document"},
        {"odd UTF-16", std::string("\xFF\xFE<\0a\0/", 7), "odd number of bytes"},
        {"unpaired surrogate", std::string("\xFF\xFE<\0\x00\xD8", 6), "surrogate"},
        {"UTF-32", std::string("\xFF\xFE\0\0<\0\0\0", 8), "UTF-32"},
        {"NUL inside", std::string("<ASCIITSBridgeSpecification StartRow='3\0'/>", 43), ""},
    };
}

} // namespace

TEST(TemplateBadInput, EveryBadDocumentFailsAndLeavesTheModelAlone)
{
    for (const BadInput& input : BadInputs()) {
        CAsciiSpecification spec;
        SetUnusualValues(spec);
        spec.m_strTemplateFile = "before.xml";
        spec.m_bLoaded = 1;
        const std::string before = Describe(spec);
        EXPECT_EQ(spec.LoadFromMemory(input.bytes, "bad.xml"), 0) << input.label;
        EXPECT_EQ(Describe(spec), before) << input.label;
        EXPECT_EQ(spec.LastError().rfind("bad.xml: ", 0), 0u) << input.label << ": " << spec.LastError();
        EXPECT_NE(spec.LastError().find(input.messagePart), std::string::npos) << input.label << ": " << spec.LastError();
    }
}

TEST(TemplateBadInput, ExcelLoaderRefusesTheSameWay)
{
    CExcelSpecification spec;
    SetUnusualValues(spec);
    const std::string before = Describe(spec);
    const char* documents[] = {
        "<ASCIITSBridgeSpecification StartRow='3'/>",
        "<MSExcelTSBridgeSpecification ExcelSheet='two'/>",
        "<MSExcelTSBridgeSpecification UseUnitTypeRow='true' UseUnitTypeOption='x'/>",
        "<!DOCTYPE m [<!ENTITY e 'true'>]><MSExcelTSBridgeSpecification UseDTFormat='&e;'/>",
    };
    for (const char* document : documents) {
        EXPECT_EQ(spec.LoadFromMemory(document, "bad.xml"), 0) << document;
        EXPECT_EQ(Describe(spec), before) << document;
        EXPECT_FALSE(spec.LastError().empty());
    }
}

TEST(TemplateBadInput, ExtremeButValidNumbersAreAccepted)
{
    CAsciiSpecification spec;
    ASSERT_EQ(spec.LoadFromMemory(Root("StartRow='-2147483648' DateCol='\t+2147483647\n' TimeCol='007'"), "a"), 1)
        << spec.LastError();
    EXPECT_EQ(spec.m_DataDesc.m_nStartRow, -2147483647 - 1);
    EXPECT_EQ(spec.m_TimeDesc.m_nDateCol, 2147483647);
    EXPECT_EQ(spec.m_TimeDesc.m_nTimeCol, 7);
}

TEST(TemplateBadInput, FilesThatCannotBeRead)
{
    ScratchFolder folder;
    WriteFile(folder.File("empty.xml"), "");
    std::string big(tmplfile::kMaxFileBytes + 1, ' ');
    big.replace(0, 29, "<ASCIITSBridgeSpecification/>");
    WriteFile(folder.File("big.xml"), big);
    struct Case {
        std::string path;
        const char* messagePart;
    } cases[] = {
        {folder.File("missing.xml"), "cannot be opened"},
        {folder.File("empty.xml"), "not a well-formed XML document"},
        {folder.File("big.xml"), "larger than"},
        {folder.File(""), "it is a folder"},
    };
    for (const Case& c : cases) {
        CAsciiSpecification spec;
        spec.m_DataDesc.m_nStartRow = 12;
        EXPECT_EQ(spec.Load(c.path), 0) << c.path;
        EXPECT_EQ(spec.m_DataDesc.m_nStartRow, 12);
        EXPECT_EQ(spec.m_strTemplateFile, "");
        EXPECT_NE(spec.LastError().find(c.path), std::string::npos) << spec.LastError();
        EXPECT_NE(spec.LastError().find(c.messagePart), std::string::npos) << c.path << ": " << spec.LastError();
    }
}

// Documents a conforming XML parser refuses: each fails with the line and column of its fault and
// leaves the template as it was, in UTF-8 and in UTF-16 alike.
TEST(TemplateBadInput, DocumentsThatAreNotWellFormedDoNotLoad)
{
    const std::string declaration = "<?xml version='1.0'   encoding='UTF-16'?>\n";
    const struct {
        const char* label;
        std::string document;
        const char* position;
    } cases[] = {
        {"a repeated attribute", declaration + "<ASCIITSBridgeSpecification StartRow='3'\n StartRow='4'/>",
         "line 3, column 2"},
        {"a second root", declaration + Root("") + "\n<ASCIITSBridgeSpecification/>", "line 3, column 1"},
        {"text before the root", declaration + "Delimiter\n" + Root(""), "line 2, column 1"},
        {"text after the root", declaration + Root("") + "\nStartRow=3", "line 3, column 9"},
        // An entity in an attribute is reported at the start of its element.
        {"an undefined entity", declaration + Root("DeleteValue='&nbsp;'"), "line 2, column 1"},
        {"a bare ampersand", declaration + Root("GlobalUnit='m & s'"), "line 2, column 44"},
        {"< in an attribute value", declaration + Root("GlobalUnit='a<b'"), "line 2, column 42"},
        {"a control character", declaration + Root("GlobalUnit='a\x01'"), "line 2, column 42"},
        {"a character reference to a control character", declaration + Root("GlobalUnit='a&#1;'"),
         "line 2, column 42"},
        {"blanks before the declaration", " \n" + declaration + Root(""), "line 2, column 1"},
        {"an unclosed element", declaration + "<ASCIITSBridgeSpecification>\n<ASCIITSBridgeSpecificationExtension>\n"
                                              "</ASCIITSBridgeSpecification>",
         "line 4, column 3"},
    };
    for (const auto& c : cases) {
        for (const bool utf16 : {false, true}) {
            CAsciiSpecification spec;
            SetUnusualValues(spec);
            const std::string before = Describe(spec);
            const std::string bytes = utf16 ? Utf16(c.document, false, true) : c.document;
            EXPECT_EQ(spec.LoadFromMemory(bytes, "bad.xml"), 0) << c.label;
            EXPECT_EQ(Describe(spec), before) << c.label;
            EXPECT_EQ(spec.LastError().rfind("bad.xml: not a well-formed XML document (", 0), 0u)
                << c.label << ": " << spec.LastError();
            EXPECT_NE(spec.LastError().find(c.position), std::string::npos) << c.label << ": " << spec.LastError();
        }
    }
    // The same documents made right load in both encodings.
    for (const bool utf16 : {false, true}) {
        const std::string good = declaration + Root("GlobalUnit='m &amp; s &lt;1&gt;' DeleteValue='&#160;'");
        CAsciiSpecification spec;
        ASSERT_EQ(spec.LoadFromMemory(utf16 ? Utf16(good, false, true) : good, "good.xml"), 1) << spec.LastError();
        EXPECT_EQ(spec.m_DataDesc.m_strGlobalUnit, "m & s <1>");
        EXPECT_EQ(spec.m_DataDesc.m_strDeleteValue, "\xC2\xA0");
    }
}

TEST(TemplateBadInput, TextsXmlCannotCarryAreNotSaved)
{
    ScratchFolder folder;
    const struct {
        std::function<void(CAsciiSpecification&)> set;
        const char* messagePart;
    } cases[] = {
        {[](CAsciiSpecification& s) { s.m_strDefDelimiter = "\x1F"; }, "DefDelimiter holds the character U+001F"},
        {[](CAsciiSpecification& s) { s.m_DataDesc.m_vecItemDefs = {{"ok", "", "", ""}, {"a\x01", "", "", ""}}; },
         "item definition 2 holds the character U+0001"},
        {[](CAsciiSpecification& s) { s.m_DataDesc.m_strGlobalUnit = "\xEF\xBF\xBF"; }, "U+FFFF"},
    };
    for (const auto& c : cases) {
        CAsciiSpecification spec;
        c.set(spec);
        EXPECT_EQ(spec.Save(folder.File("t.xml")), 0) << c.messagePart;
        EXPECT_NE(spec.LastError().find(c.messagePart), std::string::npos) << spec.LastError();
        EXPECT_FALSE(std::filesystem::exists(folder.File("t.xml")));
    }
    // Tabs, line feeds and carriage returns are characters XML carries; they survive a round trip.
    CAsciiSpecification spec;
    spec.m_strDefDelimiter = "\t";
    spec.m_DataDesc.m_strDeleteValue = "a\r\nb";
    ASSERT_EQ(spec.Save(folder.File("t.xml")), 1) << spec.LastError();
    CAsciiSpecification loaded;
    ASSERT_EQ(loaded.Load(folder.File("t.xml")), 1) << loaded.LastError();
    EXPECT_EQ(loaded.m_strDefDelimiter, "\t");
    EXPECT_EQ(loaded.m_DataDesc.m_strDeleteValue, "a\r\nb");
}
