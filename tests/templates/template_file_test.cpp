#include "TemplateTestSupport.h"

#include "templates/AsciiSpecification.h"
#include "templates/ExcelSpecification.h"
#include "templates/TemplateXml.h"

#include <gtest/gtest.h>

#include <string>
#include <vector>

using namespace testsupport;

namespace {

const char* const kAsciiOrder[] = {
    "xmlns:xsi", "DateCol", "DateFormat", "DateTimeCol", "DateTimeFormat", "DecimalSeparator", "DeleteValue",
    "DeleteValueRow", "Delimiter", "GlobalDate", "GlobalTime", "GlobalUnit", "GlobalUnitType", "GlobalValueType",
    "IgnoreBegginingOfLineDelimiters", "IgnoreConsecutiveDelimiters", "ItemDescriptionRow", "StartRow", "TimeCol",
    "TimeFormat", "UnitRow", "UnitTypeRow", "ValueTypeRow", "DateTimeOption", "UnitOption", "UnitTypeOption",
    "ValueTypeOption", "DeleteValueCheck", "DeleteValueRadio", "DefDelimiter", "SelItems", "ItemTitleOption"};

const char* const kExcelOrder[] = {
    "xmlns:xsi", "ExcelSheet", "DataTimeType", "DateTimeCol", "UseDTFormat", "DateTimeFormat", "GlobalDate",
    "TimeCol", "UseTFormat", "GlobalTime", "TimeFormat", "DateCol", "UseDFormat", "DateFormat", "UseUnitTypeRow",
    "GlobalUnitType", "UnitTypeRow", "UseUnitRow", "GlobalUnit", "UnitRow", "UseValueTypeRow", "GlobalValueType",
    "ValueTypeRow", "ItemDescriptionRow", "StartRow", "UseDelValNotEmpty", "UseDeleteValueRow", "DeleteValue",
    "DeleteValueRow", "UseUnitTypeOption", "UseUnitOption", "UseValueTypeOption", "UseItemTitleOption", "SelItems"};

// The attribute names of the root start tag, in file order.
std::vector<std::string> RootAttributeNames(const std::string& xml, const std::string& root)
{
    std::vector<std::string> names;
    size_t at = xml.find("<" + root + " ");
    size_t end = xml.find('>', at);
    if (at == std::string::npos || end == std::string::npos)
        return names;
    std::string tag = xml.substr(at, end - at);
    for (size_t eq = tag.find("=\""); eq != std::string::npos; eq = tag.find("=\"", eq + 2)) {
        size_t start = tag.find_last_of(" \t\n", eq) + 1;
        names.push_back(tag.substr(start, eq - start));
        eq = tag.find('"', eq + 2);
    }
    return names;
}

// The UTF-16 LE bytes of ASCII text turned back into text; fails on any byte that is not.
std::string AsciiFromUtf16Le(const std::string& bytes)
{
    std::string text;
    for (size_t i = 0; i + 1 < bytes.size(); i += 2) {
        if (bytes[i + 1] != '\0') {
            text += '?';
            continue;
        }
        text += bytes[i];
    }
    return text;
}

std::string AsciiDocument(const std::string& rootAttributes, const std::string& body = "")
{
    return "<?xml version='1.0'?>\n<ASCIITSBridgeSpecification " + rootAttributes +
           "><ASCIITSBridgeSpecificationExtension>" + body +
           "</ASCIITSBridgeSpecificationExtension></ASCIITSBridgeSpecification>";
}

std::string ExcelDocument(const std::string& rootAttributes, const std::string& body = "")
{
    return "<MSExcelTSBridgeSpecification " + rootAttributes + "><MSExcelTSBridgeSpecificationExtension>" + body +
           "</MSExcelTSBridgeSpecificationExtension></MSExcelTSBridgeSpecification>";
}

std::string Items(const char* list, const char* entry, const std::vector<std::string>& texts)
{
    std::string xml = std::string("<") + list + ">";
    for (const std::string& t : texts)
        xml += std::string("<") + entry + ">" + t + "</" + entry + ">";
    return xml + "</" + list + ">";
}

} // namespace

TEST(TemplateFile, AsciiRoundTripKeepsEveryStoredValue)
{
    ScratchFolder folder;
    CAsciiSpecification saved;
    SetUnusualValues(saved);
    ASSERT_EQ(saved.Save(folder.File("a.xml")), 1) << saved.LastError();

    CAsciiSpecification loaded;
    ASSERT_EQ(loaded.Load(folder.File("a.xml")), 1) << loaded.LastError();
    // The file holds neither the sheet nor the use-format flags; those keep the loader's values.
    saved.m_DataDesc.m_nExcelSheet = 1;
    saved.m_TimeDesc.m_bUseDTFormat = saved.m_TimeDesc.m_bUseTFormat = saved.m_TimeDesc.m_bUseDFormat = 0;
    saved.m_strTemplateFile = folder.File("a.xml");
    EXPECT_EQ(Describe(loaded), Describe(saved));
    EXPECT_EQ(loaded.m_bLoaded, 0); // a new path was recorded
    ASSERT_EQ(loaded.Load(folder.File("a.xml")), 1);
    EXPECT_EQ(loaded.m_bLoaded, 1);
}

TEST(TemplateFile, ExcelRoundTripKeepsEveryStoredValue)
{
    ScratchFolder folder;
    CExcelSpecification saved;
    SetUnusualValues(saved);
    ASSERT_EQ(saved.Save(folder.File("e.xml")), 1) << saved.LastError();

    CExcelSpecification loaded;
    loaded.m_strDelimiter = "Comma";
    ASSERT_EQ(loaded.Load(folder.File("e.xml")), 1) << loaded.LastError();
    // Delimiter and decimal separator values are not in an Excel file.
    saved.m_bIgnoreConsecutiveDelimiters = saved.m_bIgnoreBegginingOfLineDelimiters = 0;
    saved.m_strDelimiter = "Comma";
    saved.m_strDefDelimiter = "";
    saved.m_strDecimalSeparator = "Dot";
    saved.m_strTemplateFile = folder.File("e.xml");
    EXPECT_EQ(Describe(loaded), Describe(saved));
}

TEST(TemplateFile, SavedAsciiFileBytes)
{
    ScratchFolder folder;
    CAsciiSpecification spec;
    spec.m_TimeDesc.m_nDateCol = 2;
    spec.m_arrSelItems = {1, 2, 3};
    spec.m_DataDesc.m_vecItemDefs = {{"A", "B", "C", "D"}};
    ASSERT_EQ(spec.Save(folder.File("a.xml")), 1);
    std::string bytes = ReadFile(folder.File("a.xml"));
    ASSERT_GE(bytes.size(), 4u);
    EXPECT_EQ(bytes.substr(0, 2), "\xFF\xFE");
    std::string xml = AsciiFromUtf16Le(bytes.substr(2));
    EXPECT_EQ(xml.find('?', 2), xml.find("?>")) << "a byte that is not UTF-16 of ASCII";
    EXPECT_EQ(xml.rfind("<?xml version='1.0'   encoding='UTF-16'?>", 0), 0u) << xml.substr(0, 60);
    EXPECT_EQ(RootAttributeNames(xml, "ASCIITSBridgeSpecification"),
              std::vector<std::string>(std::begin(kAsciiOrder), std::end(kAsciiOrder)));
    EXPECT_NE(xml.find("xmlns:xsi=\"http://www.w3.org/2001/XMLSchema-instance\""), std::string::npos);
    EXPECT_NE(xml.find(" DateCol=\"2&#10;\""), std::string::npos);
    EXPECT_NE(xml.find(" StartRow=\"3&#10;\""), std::string::npos);
    EXPECT_NE(xml.find(" DeleteValueRadio=\"1&#10;\""), std::string::npos);
    EXPECT_NE(xml.find(" ItemTitleOption=\"0\""), std::string::npos);
    EXPECT_NE(xml.find(" IgnoreConsecutiveDelimiters=\"false\""), std::string::npos);
    EXPECT_NE(xml.find(" SelItems=\"1,2,3\""), std::string::npos);
    size_t titles = xml.find("<ItemTitles>"), types = xml.find("<ItemTypes>"), units = xml.find("<ItemUnits>"),
           values = xml.find("<ValueTypes>");
    EXPECT_LT(xml.find("<ASCIITSBridgeSpecificationExtension>"), titles);
    EXPECT_LT(titles, types);
    EXPECT_LT(types, units);
    EXPECT_LT(units, values);
    EXPECT_NE(xml.find("<ItemUnit>C</ItemUnit>"), std::string::npos);
}

TEST(TemplateFile, SavedExcelFileBytes)
{
    ScratchFolder folder;
    CExcelSpecification spec;
    spec.m_TimeDesc.m_bUseTFormat = 5;        // flag of the nonzero form
    spec.m_DataDesc.m_nDeleteValueRadio = 5;  // flag of the equals-one form
    spec.m_DataDesc.m_nUnitTypeOption = 2;
    ASSERT_EQ(spec.Save(folder.File("e.xml")), 1);
    std::string xml = AsciiFromUtf16Le(ReadFile(folder.File("e.xml")).substr(2));
    EXPECT_EQ(xml.rfind("<?xml version='1.0'   encoding='UTF-16'?>", 0), 0u);
    EXPECT_EQ(RootAttributeNames(xml, "MSExcelTSBridgeSpecification"),
              std::vector<std::string>(std::begin(kExcelOrder), std::end(kExcelOrder)));
    EXPECT_EQ(xml.find("&#10;"), std::string::npos);
    for (const char* expected : {" StartRow=\"3\"", " ExcelSheet=\"1\"", " UseTFormat=\"true\"", " UseDTFormat=\"false\"",
                                 " UseDeleteValueRow=\"false\"", " UseUnitTypeRow=\"false\"", " UseUnitTypeOption=\"2\"",
                                 " UseUnitRow=\"true\"", " SelItems=\"\""})
        EXPECT_NE(xml.find(expected), std::string::npos) << expected;
    // Without item definitions the extension element is empty.
    EXPECT_NE(xml.find("<MSExcelTSBridgeSpecificationExtension />"), std::string::npos);

    CExcelSpecification loaded;
    ASSERT_EQ(loaded.Load(folder.File("e.xml")), 1);
    EXPECT_EQ(loaded.m_TimeDesc.m_bUseTFormat, 1);
    EXPECT_EQ(loaded.m_DataDesc.m_nDeleteValueRadio, 0);
    EXPECT_EQ(loaded.m_DataDesc.m_nUnitTypeOption, 2);
}

TEST(TemplateFile, SaveFallsBackToTheSaveFileAndReportsFailures)
{
    ScratchFolder folder;
    CAsciiSpecification spec;
    EXPECT_EQ(spec.Save(""), 0);
    EXPECT_FALSE(spec.LastError().empty());
    spec.m_strSaveFile = folder.File("chosen.xml");
    EXPECT_EQ(spec.Save(""), 1);
    EXPECT_FALSE(ReadFile(folder.File("chosen.xml")).empty());
    EXPECT_EQ(spec.Save(folder.File("missing/folder/t.xml")), 0);
    EXPECT_NE(spec.LastError().find("missing/folder/t.xml"), std::string::npos) << spec.LastError();
    EXPECT_EQ(spec.Save(folder.File("")), 0); // a folder, not a file
}

TEST(TemplateFile, LoadingEmptiesItemDefinitionsAndKeepsAbsentValues)
{
    CAsciiSpecification spec;
    spec.m_DataDesc.m_vecItemDefs = {{"old", "", "", ""}};
    spec.m_DataDesc.m_nStartRow = 42;
    spec.m_DataDesc.m_nExcelSheet = 9;
    ASSERT_EQ(spec.LoadFromMemory(AsciiDocument("ItemDescriptionRow='5&#10;' Delimiter='Comma'"), "t.xml"), 1)
        << spec.LastError();
    EXPECT_TRUE(spec.m_DataDesc.m_vecItemDefs.empty());
    EXPECT_EQ(spec.m_DataDesc.m_nStartRow, 42);
    EXPECT_EQ(spec.m_DataDesc.m_nExcelSheet, 9);
    EXPECT_EQ(spec.m_DataDesc.m_nItemDescriptionRow, 5);
    EXPECT_EQ(spec.m_strDelimiter, "Comma");
    EXPECT_EQ(spec.m_strTemplateFile, "t.xml");
}

TEST(TemplateFile, FlagSpellings)
{
    struct Case {
        const char* text;
        int ascii;
        int excel;
    } cases[] = {{"true", 1, 1}, {"TRUE", 1, 0}, {"True", 1, 0}, {"yes", 0, 0},
                 {"1", 0, 0},    {" true", 0, 0}, {"", 0, 0}};
    for (const Case& c : cases) {
        CAsciiSpecification ascii;
        ascii.m_bIgnoreConsecutiveDelimiters = 7;
        ASSERT_EQ(ascii.LoadFromMemory(AsciiDocument(std::string("IgnoreConsecutiveDelimiters='") + c.text + "'"), "a"),
                  1);
        EXPECT_EQ(ascii.m_bIgnoreConsecutiveDelimiters, c.ascii) << c.text;

        CExcelSpecification excel;
        excel.m_TimeDesc.m_bUseDTFormat = 7;
        ASSERT_EQ(excel.LoadFromMemory(ExcelDocument(std::string("UseDTFormat='") + c.text + "'"), "e"), 1);
        EXPECT_EQ(excel.m_TimeDesc.m_bUseDTFormat, c.excel) << c.text;
    }
}

TEST(TemplateFile, ExcelOptionsAreReadInTwoPasses)
{
    struct Case {
        const char* attributes;
        int itemType, unit, valueType, titleOption;
    } cases[] = {
        {"UseUnitTypeRow='true' UseUnitRow='false'", 1, 0, 9, 9},
        {"UseUnitTypeOption='2' UseUnitTypeRow='true' UseValueTypeRow='true'", 2, 9, 1, 9},
        {"UseUnitOption='0' UseUnitRow='true' UseItemTitleOption='1'", 9, 0, 9, 1},
        {"UseValueTypeRow='TRUE'", 9, 9, 0, 9},
    };
    for (const Case& c : cases) {
        CExcelSpecification spec;
        spec.m_DataDesc.m_nUnitTypeOption = spec.m_DataDesc.m_nUnitOption = spec.m_DataDesc.m_nValueTypeOption =
            spec.m_DataDesc.m_nItemTitleOption = 9;
        ASSERT_EQ(spec.LoadFromMemory(ExcelDocument(c.attributes), "e"), 1) << spec.LastError();
        EXPECT_EQ(spec.m_DataDesc.m_nUnitTypeOption, c.itemType) << c.attributes;
        EXPECT_EQ(spec.m_DataDesc.m_nUnitOption, c.unit) << c.attributes;
        EXPECT_EQ(spec.m_DataDesc.m_nValueTypeOption, c.valueType) << c.attributes;
        EXPECT_EQ(spec.m_DataDesc.m_nItemTitleOption, c.titleOption) << c.attributes;
    }
    CExcelSpecification spec;
    ASSERT_EQ(spec.LoadFromMemory(ExcelDocument("UseDelValNotEmpty='true' UseDeleteValueRow='false'"), "e"), 1);
    EXPECT_EQ(spec.m_DataDesc.m_nDeleteValueCheck, 1);
    EXPECT_EQ(spec.m_DataDesc.m_nDeleteValueRadio, 0);
}

TEST(TemplateFile, ItemListsOfUnequalLength)
{
    CAsciiSpecification spec;
    std::string body = Items("ItemTitles", "ItemTitle", {"t1", "t2", "t3"}) + Items("ItemTypes", "ItemType", {"y1", "y2"}) +
                       Items("ValueTypes", "ValueType", {"v1"});
    ASSERT_EQ(spec.LoadFromMemory(AsciiDocument("", body), "a"), 1) << spec.LastError();
    const auto& items = spec.m_DataDesc.m_vecItemDefs;
    ASSERT_EQ(items.size(), 3u);
    EXPECT_EQ(items[0].m_strTitle, "t1");
    EXPECT_EQ(items[1].m_strType, "y2");
    EXPECT_EQ(items[2].m_strType, "");
    EXPECT_EQ(items[0].m_strValueType, "v1");
    EXPECT_EQ(items[1].m_strValueType, "");
    for (const CItemDefinition& item : items)
        EXPECT_EQ(item.m_strUnit, ""); // no units list at all

    // The longest list sets the count, whichever it is; names of the entries play no part.
    body = Items("ItemTitles", "ItemTitle", {"t1"}) + Items("ItemUnits", "Whatever", {"u1", "u2", "u3", "u4"});
    ASSERT_EQ(spec.LoadFromMemory(AsciiDocument("", body), "a"), 1);
    ASSERT_EQ(items.size(), 4u);
    EXPECT_EQ(items[3].m_strUnit, "u4");
    EXPECT_EQ(items[3].m_strTitle, "");
}

TEST(TemplateFile, ListEntriesThatAreNotElementsGiveEmptyTexts)
{
    CExcelSpecification spec;
    std::string body = "<ItemTitles><ItemTitle>a</ItemTitle><!-- gap --><ItemTitle><b>x</b>y</ItemTitle>"
                       "text<ItemTitle><![CDATA[<c>]]></ItemTitle></ItemTitles>";
    ASSERT_EQ(spec.LoadFromMemory(ExcelDocument("", body), "e"), 1) << spec.LastError();
    const auto& items = spec.m_DataDesc.m_vecItemDefs;
    ASSERT_EQ(items.size(), 5u);
    EXPECT_EQ(items[0].m_strTitle, "a");
    EXPECT_EQ(items[1].m_strTitle, "");
    EXPECT_EQ(items[2].m_strTitle, "xy");
    EXPECT_EQ(items[3].m_strTitle, "");
    EXPECT_EQ(items[4].m_strTitle, "<c>");
}

TEST(TemplateFile, RootAndListsAreFoundAnywhere)
{
    std::string xml = "<outer><!-- a wrapper --><ASCIITSBridgeSpecification StartRow=' 7 '/>"
                      "<elsewhere><deeper><ASCIITSBridgeSpecificationExtension><x>" +
                      Items("ItemTitles", "ItemTitle", {"far"}) +
                      "</x></ASCIITSBridgeSpecificationExtension></deeper></elsewhere>"
                      "<ItemTypes><ItemType>not under the extension</ItemType></ItemTypes></outer>";
    CAsciiSpecification spec;
    ASSERT_EQ(spec.LoadFromMemory(xml, "a"), 1) << spec.LastError();
    EXPECT_EQ(spec.m_DataDesc.m_nStartRow, 7);
    ASSERT_EQ(spec.m_DataDesc.m_vecItemDefs.size(), 1u);
    EXPECT_EQ(spec.m_DataDesc.m_vecItemDefs[0].m_strTitle, "far");
    EXPECT_EQ(spec.m_DataDesc.m_vecItemDefs[0].m_strType, "");
}

TEST(TemplateFile, UnknownAttributesAreIgnored)
{
    CAsciiSpecification spec;
    ASSERT_EQ(spec.LoadFromMemory(AsciiDocument("Colour='blue' StartRow='4' ExcelSheet='x'"), "a"), 1)
        << spec.LastError();
    EXPECT_EQ(spec.m_DataDesc.m_nStartRow, 4);
    EXPECT_EQ(spec.m_DataDesc.m_nExcelSheet, 1);
}

TEST(TemplateFile, AcceptedEncodings)
{
    const std::string xml = AsciiDocument("StartRow='8'");
    const std::string decl = "<?xml version='1.0'   encoding='UTF-16'?>";
    struct Case {
        const char* label;
        std::string bytes;
    } cases[] = {
        {"UTF-8", xml},
        {"UTF-8 with byte-order mark", "\xEF\xBB\xBF" + xml},
        {"UTF-16 LE with mark", Utf16(xml, false, true)},
        {"UTF-16 BE with mark", Utf16(xml, true, true)},
        {"UTF-16 LE without mark", Utf16(xml, false, false)},
        {"UTF-16 BE without mark", Utf16(xml, true, false)},
    };
    for (const Case& c : cases) {
        CAsciiSpecification spec;
        ASSERT_EQ(spec.LoadFromMemory(c.bytes, "enc.xml"), 1) << c.label << ": " << spec.LastError();
        EXPECT_EQ(spec.m_DataDesc.m_nStartRow, 8) << c.label;
    }
    // A UTF-8 file that declares UTF-16 is read as the UTF-8 it is.
    CAsciiSpecification spec;
    ASSERT_EQ(spec.LoadFromMemory(decl + xml.substr(xml.find('\n')), "decl.xml"), 1) << spec.LastError();
    EXPECT_EQ(spec.m_DataDesc.m_nStartRow, 8);

    // Text beyond ASCII survives UTF-16 both ways, including characters outside the basic plane.
    std::string utf16be = std::string("\xFE\xFF") + Utf16("<ASCIITSBridgeSpecification GlobalUnit='", true, false) +
                          std::string("\x00\xB5\xD8\x3D\xDE\x00", 6) + Utf16("'/>", true, false);
    ASSERT_EQ(spec.LoadFromMemory(utf16be, "be.xml"), 1) << spec.LastError();
    EXPECT_EQ(spec.m_DataDesc.m_strGlobalUnit, "\xC2\xB5\xF0\x9F\x98\x80");
}

TEST(TemplateFile, TextThatIsNotUtf8IsReadAsWindows1252)
{
    ScratchFolder folder;
    CAsciiSpecification spec;
    spec.m_DataDesc.m_strGlobalUnit = "m\xB3/s \x80";           // Windows-1252 from an 8-bit input file
    spec.m_strDefDelimiter = "::\xA3\xED\xED\xED\xA3";             // stray bytes, one looking like a surrogate
    spec.m_DataDesc.m_vecItemDefs = {{"\xC0\xAF", "", "", ""}}; // an overlong form
    ASSERT_EQ(spec.Save(folder.File("latin.xml")), 1);
    CAsciiSpecification loaded;
    ASSERT_EQ(loaded.Load(folder.File("latin.xml")), 1) << loaded.LastError();
    EXPECT_EQ(loaded.m_DataDesc.m_strGlobalUnit, "m\xC2\xB3/s \xE2\x82\xAC");
    EXPECT_EQ(loaded.m_strDefDelimiter, "::\xC2\xA3\xC3\xAD\xC3\xAD\xC3\xAD\xC2\xA3");
    EXPECT_EQ(loaded.m_DataDesc.m_vecItemDefs.at(0).m_strTitle, "\xC3\x80\xC2\xAF");

    // A file with one byte that is not UTF-8 is a Windows-1252 file as a whole.
    ASSERT_EQ(loaded.LoadFromMemory("<ASCIITSBridgeSpecification GlobalUnit='\xB5g \xC2\xB5g'/>", "l.xml"), 1);
    EXPECT_EQ(loaded.m_DataDesc.m_strGlobalUnit, "\xC2\xB5g \xC3\x82\xC2\xB5g");
}
