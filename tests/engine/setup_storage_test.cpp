#include "engine/Engine.h"
#include "tests/engine/EngineTestSupport.h"

#include <gtest/gtest.h>

namespace {

using namespace enginetest;

class SetupStorage : public testing::Test {
protected:
    void TearDown() override { DropModuleDocument(); }

    static std::string WrittenDocument()
    {
        return wpxFormat(ModuleWpxDocument());
    }
};

// A host document as WriteSetup lays it out, with stale bridge names that must be recomputed.
const std::string kStoredSetup = R"(wpx 1
target "OkaToolbox"
  section "Setup"
    Name = "My setup"
    section "INPUT"
      Type = 2
      File_format = 3
      Bridge = "stale"
      File_name = file ""
      Folder_name = file "/data/in"
    end
    section "TEMPLATE"
      Template_option = 1
      Template_name = file "/t/excel.xml"
      Items = 0, 4, 9
    end
    section "OUTPUT"
      File_format = 2
      Bridge = ""
      File_name = file ""
      Folder_name = file "/data/out"
      File_title = "Title with \"quotes\""
      Log_file = file "/var/log/velmora"
    end
  end
end
wpx end
)";

std::string WithBridges(std::string text, const std::string& input, const std::string& output)
{
    text.replace(text.find("Bridge = \"stale\""), 16, "Bridge = \"" + input + "\"");
    text.replace(text.find("Bridge = \"\""), 11, "Bridge = \"" + output + "\"");
    return text;
}

TEST_F(SetupStorage, FinishWithoutEditsReproducesEveryKeywordWithBridgesRecomputed)
{
    WPXHANDLE original = UseDocument(kStoredSetup);
    CEngine engine;
    ASSERT_EQ(ReadSetup(engine), 0);
    EXPECT_EQ(engine.m_strInputBridge, "stale") << "a stored bridge is read";
    ASSERT_EQ(WriteSetup(engine), 0);

    EXPECT_EQ(WrittenDocument(), WithBridges(kStoredSetup, "Excel Timeseries Bridge", "ASCII Timeseries Bridge (General)"));
    EXPECT_NE(ModuleWpxDocument(), original);
    EXPECT_EQ(wpxTargetByNum(original, 1), nullptr) << "the old document is closed";
    EXPECT_EQ(engine.m_strOutputBridge, "ASCII Timeseries Bridge (General)");
}

TEST_F(SetupStorage, ReadFillsEveryField)
{
    UseDocument(kStoredSetup);
    CEngine engine;
    ASSERT_EQ(ReadSetup(engine), 0);
    CString name, log;
    engine.GetSetupName(name);
    engine.GetLogFileDir(log);
    EXPECT_EQ(name, "My setup");
    EXPECT_EQ(engine.m_nInputType, 2);
    EXPECT_EQ(engine.m_nInputFormat, 3);
    EXPECT_EQ(engine.m_strInputFolder, "/data/in");
    EXPECT_EQ(engine.m_strTemplateName, "/t/excel.xml");
    EXPECT_EQ(engine.m_arrItems, (CUIntArray{0, 4, 9}));
    EXPECT_EQ(engine.m_nOutputFormat, 2);
    EXPECT_EQ(engine.m_strOutputFolder, "/data/out");
    EXPECT_EQ(engine.m_strOutputTitle, "Title with \"quotes\"");
    EXPECT_EQ(log, "/var/log/velmora");
    EXPECT_EQ(engine.m_pSpecification, nullptr) << "reading creates no working objects";
    EXPECT_EQ(engine.m_pParser, nullptr);
}

TEST_F(SetupStorage, EmptyItemListIsAKeywordWithoutParametersAndReadsBackEmpty)
{
    CEngine engine;
    ASSERT_EQ(WriteSetup(engine), 0);
    EXPECT_NE(WrittenDocument().find("      Items =\n"), std::string::npos) << WrittenDocument();
    WPXHANDLE templ = wpxSectionByNameNum(wpxSectionByNum(wpxTargetByNum(ModuleWpxDocument(), 1), 1), "TEMPLATE", 1);
    WPXHANDLE items = wpxKeywordByNameNum(templ, "Items", 1);
    ASSERT_NE(items, nullptr);
    EXPECT_EQ(wpxGetNoParams(items), 0);

    CEngine reader;
    reader.m_arrItems = {1, 2};
    ASSERT_EQ(ReadSetup(reader), 0);
    EXPECT_TRUE(reader.m_arrItems.empty());
}

struct OptionCase {
    int storedOption;
    const char* storedName;
    int expectedOption;
};

TEST_F(SetupStorage, ManualSetupNamingATemplateReopensAsTemplateToModify)
{
    const OptionCase cases[] = {{3, "/t/made.xml", 2}, {3, "", 3}, {2, "/t/x.xml", 2}, {1, "/t/x.xml", 1}, {2, "", 2}};
    for (const OptionCase& c : cases) {
        UseDocument(std::string("wpx 1\ntarget \"OkaToolbox\"\nsection \"Setup\"\nsection \"TEMPLATE\"\n") +
                    "Template_option = " + std::to_string(c.storedOption) + "\nTemplate_name = file \"" + c.storedName +
                    "\"\nend\nend\nend\nwpx end\n");
        CEngine engine;
        ASSERT_EQ(ReadSetup(engine), 0);
        EXPECT_EQ(engine.m_nTemplateOption, c.expectedOption) << c.storedOption << " " << c.storedName;
        DropModuleDocument();
    }
}

struct TemplateNameCase {
    int option;
    bool templateObject;
    const char* expected;
};

TEST_F(SetupStorage, StoredTemplateNameFollowsOptionAndTemplateObject)
{
    const TemplateNameCase cases[] = {
        {1, true, "/chosen.xml"}, {2, true, "/saved.xml"}, {3, true, "/saved.xml"},
        {1, false, "/chosen.xml"}, {2, false, "/chosen.xml"}, {3, false, "/chosen.xml"},
    };
    for (const TemplateNameCase& c : cases) {
        CEngine engine;
        engine.m_nTemplateOption = c.option;
        engine.m_strTemplateName = "/chosen.xml";
        if (c.templateObject) {
            engine.m_pSpecification = std::make_unique<TestSpecification>();
            engine.m_pSpecification->m_strSaveFile = "/saved.xml";
        }
        ASSERT_EQ(WriteSetup(engine), 0);
        WPXHANDLE setup = wpxSectionByNum(wpxTargetByNum(ModuleWpxDocument(), 1), 1);
        CString stored;
        wpxGetParamFilename(wpxSectionByNameNum(setup, "TEMPLATE", 1), "Template_name", &stored, 1, 1);
        EXPECT_EQ(stored, c.expected) << "option " << c.option << " object " << c.templateObject;
    }
}

TEST_F(SetupStorage, FormatOutsideOneToThreeWritesAnEmptyBridge)
{
    const std::pair<int, const char*> cases[] = {
        {0, ""}, {1, "rbx Timeseries Bridge"}, {2, "ASCII Timeseries Bridge (General)"}, {3, "Excel Timeseries Bridge"},
        {4, ""}, {-1, ""}};
    for (const auto& [format, bridge] : cases) {
        CEngine engine;
        engine.m_nInputFormat = format;
        engine.m_nOutputFormat = format;
        engine.m_strOutputBridge = "left over";
        ASSERT_EQ(WriteSetup(engine), 0);
        WPXHANDLE setup = wpxSectionByNum(wpxTargetByNum(ModuleWpxDocument(), 1), 1);
        CString input = "x", output = "x";
        wpxGetParam(wpxSectionByNameNum(setup, "INPUT", 1), "Bridge", &input, 1, 1);
        wpxGetParam(wpxSectionByNameNum(setup, "OUTPUT", 1), "Bridge", &output, 1, 1);
        EXPECT_EQ(input, bridge) << format;
        EXPECT_EQ(output, bridge) << format;
        EXPECT_EQ(engine.m_strOutputBridge, bridge);
    }
}

TEST_F(SetupStorage, NoDocumentKeepsEveryDefault)
{
    SetModuleWpxHandle(0);
    CEngine engine;
    EXPECT_EQ(ReadSetup(engine), 1);
    CString name = "x", log = "x";
    engine.GetSetupName(name);
    engine.GetLogFileDir(log);
    enginetest::ExpectFirstChoices(engine);
    for (const CString* text : {&engine.m_strInputFile, &engine.m_strInputBridge, &engine.m_strInputFolder,
                                &engine.m_strTemplateName, &engine.m_strOutputBridge, &engine.m_strOutputFile,
                                &engine.m_strOutputFolder, &engine.m_strOutputTitle, &engine.m_strPreviewFile,
                                &engine.m_strWorkTemplate, &name, &log})
        EXPECT_EQ(*text, "");
    EXPECT_TRUE(engine.m_arrItems.empty());
}

TEST_F(SetupStorage, DocumentWithoutFirstSectionReportsMinusOne)
{
    for (const char* text : {"wpx 1\nwpx end\n", "wpx 1\ntarget \"OkaToolbox\"\n  Name = \"x\"\nend\nwpx end\n"}) {
        UseDocument(text);
        CEngine engine;
        EXPECT_EQ(ReadSetup(engine), -1) << text;
        CString name;
        engine.GetSetupName(name);
        EXPECT_EQ(name, "");
        DropModuleDocument();
    }
}

TEST_F(SetupStorage, MissingKeywordsAndSectionsLeaveFieldsAlone)
{
    UseDocument("wpx 1\ntarget \"OkaToolbox\"\nsection \"Setup\"\nsection \"INPUT\"\nType = 2\nFile_format = \"3\"\n"
                "end\nend\nend\nwpx end\n");
    CEngine engine;
    engine.m_nInputFormat = 2;
    engine.m_strOutputTitle = "kept";
    engine.m_nOutputFormat = 3;
    engine.SetLogFileDir("/kept");
    ASSERT_EQ(ReadSetup(engine), 0);
    CString log;
    engine.GetLogFileDir(log);
    EXPECT_EQ(engine.m_nInputType, 2);
    EXPECT_EQ(engine.m_nInputFormat, 2) << "a text where an int belongs is not taken";
    EXPECT_EQ(engine.m_strOutputTitle, "kept");
    EXPECT_EQ(engine.m_nOutputFormat, 3);
    EXPECT_EQ(log, "/kept");
}

} // namespace
