#include "TemplateTestSupport.h"

#include "templates/AsciiSpecification.h"
#include "templates/ExcelSpecification.h"
#include "templates/TemplateFileLayout.h"
#include "templates/TemplateReport.h"

#include <gtest/gtest.h>

#include <sstream>

using namespace testsupport;

namespace {

// A template whose every value is fixed, so its listing can be compared as a whole.
template <class Spec>
Spec Fixed()
{
    Spec spec;
    spec.m_TimeDesc.m_strGlobalDate = "2020-01-02";
    spec.m_TimeDesc.m_strGlobalTime = "03:04:05";
    return spec;
}

std::string Json(CSpecification& spec, const tmplfile::FileLayout& layout)
{
    std::ostringstream out;
    tmplfile::WriteTemplateJson(spec, layout, out);
    return out.str();
}

} // namespace

TEST(TemplateReport, JsonOfADefaultTemplateNamesEveryValueOnce)
{
    CAsciiSpecification spec = Fixed<CAsciiSpecification>();
    EXPECT_EQ(Json(spec, tmplfile::AsciiFileLayout()),
              "{\"kind\":\"ascii\",\"values\":{\"DateCol\":1,\"DateFormat\":\"YYYY/MM/DD\",\"DateTimeCol\":1,"
              "\"DateTimeFormat\":\"YYYY/MM/DD HH:mm:ss\",\"DecimalSeparator\":\"Dot\",\"DeleteValue\":\"-1e-10\","
              "\"DeleteValueRow\":1,\"Delimiter\":\"Tab\",\"GlobalDate\":\"2020-01-02\",\"GlobalTime\":\"03:04:05\","
              "\"GlobalUnit\":\"Undefined\",\"GlobalUnitType\":\"Undefined\",\"GlobalValueType\":\"Instantaneous\","
              "\"IgnoreBegginingOfLineDelimiters\":0,\"IgnoreConsecutiveDelimiters\":0,\"ItemDescriptionRow\":2,"
              "\"StartRow\":3,\"TimeCol\":1,\"TimeFormat\":\"HH:mm:ss\",\"UnitRow\":1,\"UnitTypeRow\":1,"
              "\"ValueTypeRow\":1,\"DateTimeOption\":0,\"UnitOption\":1,\"UnitTypeOption\":1,\"ValueTypeOption\":1,"
              "\"DeleteValueCheck\":0,\"DeleteValueRadio\":1,\"DefDelimiter\":\"\",\"SelItems\":[],"
              "\"ItemTitleOption\":0,\"ExcelSheet\":1,\"UseDTFormat\":0,\"UseTFormat\":0,\"UseDFormat\":0},"
              "\"items\":[]}\n");
}

TEST(TemplateReport, JsonEscapesTextsAndListsItems)
{
    CExcelSpecification spec = Fixed<CExcelSpecification>();
    spec.m_strDefDelimiter = "\t";
    spec.m_DataDesc.m_strGlobalUnit = "m\xC2\xB3 \"q\" \\ \x01";
    spec.m_DataDesc.m_strDeleteValue = "bad \xFF\xC0\xAF \xED\xA0\x80 end"; // not UTF-8
    spec.m_TimeDesc.m_bUseTFormat = 5;
    spec.m_arrSelItems = {4, 0};
    spec.m_DataDesc.m_vecItemDefs = {{"A", "Flow", "m3/s", "Accumulated"}, {"", "", "", ""}};
    std::string json = Json(spec, tmplfile::ExcelFileLayout());
    EXPECT_EQ(json.rfind("{\"kind\":\"excel\",", 0), 0u);
    for (const char* part : {"\"DefDelimiter\":\"\\t\"", "\"GlobalUnit\":\"m\xC2\xB3 \\\"q\\\" \\\\ \\u0001\"",
                             // Windows-1252, as every text that is not UTF-8
                             "\"DeleteValue\":\"bad \xC3\xBF\xC3\x80\xC2\xAF \xC3\xAD\xC2\xA0\xE2\x82\xAC end\"",
                             "\"UseTFormat\":5", "\"SelItems\":[4,0]",
                             "\"items\":[{\"title\":\"A\",\"type\":\"Flow\",\"unit\":\"m3/s\",\"valueType\":"
                             "\"Accumulated\"},{\"title\":\"\",\"type\":\"\",\"unit\":\"\",\"valueType\":\"\"}]}"})
        EXPECT_NE(json.find(part), std::string::npos) << part << "\n" << json;
}

TEST(TemplateReport, TextListingShowsHiddenCharacters)
{
    CAsciiSpecification spec = Fixed<CAsciiSpecification>();
    spec.m_strDefDelimiter = "\t";
    spec.m_arrSelItems = {2, 1};
    spec.m_DataDesc.m_vecItemDefs = {{"Level", "Length", "m", "Instantaneous"}};
    std::ostringstream out;
    tmplfile::WriteTemplateText(spec, tmplfile::AsciiFileLayout(), out);
    std::string text = out.str();
    for (const char* line : {"Kind: ascii\n", "DefDelimiter: \"\\t\"\n", "SelItems: 2,1\n", "StartRow: 3\n",
                             "ExcelSheet: 1\n", "Items: 1\n",
                             "  1: title \"Level\", type \"Length\", unit \"m\", value type \"Instantaneous\"\n"})
        EXPECT_NE(text.find(line), std::string::npos) << line << "\n" << text;
}

TEST(TemplateReport, OpensTheKindTheRootNames)
{
    ScratchFolder folder;
    CExcelSpecification excel;
    excel.m_DataDesc.m_nExcelSheet = 3;
    ASSERT_EQ(excel.Save(folder.File("e.xml")), 1);
    CAsciiSpecification ascii;
    ascii.m_strDelimiter = "Comma";
    ASSERT_EQ(ascii.Save(folder.File("a.xml")), 1);
    WriteFile(folder.File("nested.xml"), "<wrap><x/><MSExcelTSBridgeSpecification ExcelSheet='6'/>"
                                          "<ASCIITSBridgeSpecification/></wrap>");
    struct Case {
        const char* file;
        const char* kind;
        int sheet;
        const char* delimiter;
    } cases[] = {{"e.xml", "excel", 3, "Tab"}, {"a.xml", "ascii", 1, "Comma"}, {"nested.xml", "excel", 6, "Tab"}};
    for (const Case& c : cases) {
        tmplfile::OpenedTemplate opened;
        const sys::Status status = tmplfile::OpenTemplateFile(folder.File(c.file), opened);
        ASSERT_TRUE(opened.spec) << status.problem().Describe();
        EXPECT_STREQ(opened.layout->kind, c.kind);
        EXPECT_EQ(opened.spec->m_DataDesc.m_nExcelSheet, c.sheet);
        EXPECT_EQ(opened.spec->m_strDelimiter, c.delimiter);
        EXPECT_EQ(opened.spec->m_strTemplateFile, folder.File(c.file));
    }
}

TEST(TemplateReport, FilesThatAreNoTemplatesGiveAReason)
{
    ScratchFolder folder;
    WriteFile(folder.File("other.xml"), "<Setup/>");
    WriteFile(folder.File("broken.xml"), "<MSExcelTSBridgeSpecification ExcelSheet='x'/>");
    struct Case {
        const char* file;
        const char* reason;
    } cases[] = {{"missing.xml", "cannot be opened"},
                 {"other.xml", "not a template file"},
                 {"broken.xml", "ExcelSheet must be a whole number"}};
    for (const Case& c : cases) {
        tmplfile::OpenedTemplate opened;
        const CString error = tmplfile::OpenTemplateFile(folder.File(c.file), opened).problem().Describe();
        EXPECT_FALSE(opened.spec) << c.file;
        EXPECT_NE(error.find(c.reason), std::string::npos) << error;
        EXPECT_NE(error.find(c.file), std::string::npos) << error;
    }
    EXPECT_FALSE(tmplfile::NewTemplate("csv").spec);
    EXPECT_FALSE(tmplfile::NewTemplate("ASCII").spec);
}
