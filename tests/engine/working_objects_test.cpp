// The setup record's working objects (SetInput, SetTemplate, SetItems, ResetSetup) and working files
// (preview file, working template, LoadTemplate, ParseInputFile, ReadItemNames, MakeWorkTemplateName).
#include "tests/engine/CheckTestSupport.h"
#include "tests/engine/EngineTestSupport.h"

#include "engine/Engine.h"
#include "parsers/AsciiFilePreviewParser.h"
#include "parsers/ExcelFilePreviewParser.h"
#include "parsers/FileException.h"
#include "parsers/RbxPreviewFileParser.h"
#include "platform/spreadsheet/Spreadsheet.h"
#include "templates/AsciiSpecification.h"
#include "templates/ExcelSpecification.h"

#include <gtest/gtest.h>

#include <filesystem>

using checktest::ScopedEnv;
using checktest::ScratchFolder;

namespace {

template <class T, class P>
bool Is(const P& pointer)
{
    return dynamic_cast<const T*>(pointer.get()) != nullptr;
}

// A parser that counts its parses and answers as told.
class CountingParser : public CFilePreviewParser {
public:
    enum class Outcome { Succeed, Fail, ThrowFileError, ThrowAutomationError };
    Outcome outcome = Outcome::Succeed;
    int parses = 0;
    CString lastPath;

    int Parse(const CString& path) override
    {
        ++parses;
        lastPath = path;
        switch (outcome) {
        case Outcome::Fail:
            return 0;
        case Outcome::ThrowFileError:
            throw CFileException(path, "permission denied");
        case Outcome::ThrowAutomationError:
            throw sheet::AutomationError("the workbook is damaged");
        default:
            return 1;
        }
    }
    int GetItemNames(CStringList& names) override
    {
        names.push_back("A");
        return 1;
    }
    int GetItemTypes(CStringList&) override { return 1; }
    int GetUnits(CStringList&) override { return 1; }
    int GetValueTypes(CStringList&) override { return 1; }
    int GetItemCount(int& count) override
    {
        count = 1;
        return 1;
    }
};

} // namespace

TEST(SetInput, CreatesTheObjectsOfEachFormatAndPointsTheParserAtTheTemplate)
{
    ScopedEnv absent("VELMORA_SPREADSHEET", "absent");
    CEngine engine;
    engine.SetInput(1, 2, "/d/a.txt", "");
    EXPECT_TRUE(Is<CAsciiSpecification>(engine.m_pSpecification));
    EXPECT_TRUE(Is<CAsciiFilePreviewParser>(engine.m_pParser));
    EXPECT_EQ(engine.m_pParser->m_pSpecification, engine.m_pSpecification.get());

    engine.m_pSpecification->m_DataDesc.m_nStartRow = 9; // a loaded value
    engine.SetInput(2, 3, "", "/d/books");
    EXPECT_TRUE(Is<CExcelSpecification>(engine.m_pSpecification));
    EXPECT_TRUE(Is<CExcelFilePreviewParser>(engine.m_pParser));
    EXPECT_EQ(engine.m_pSpecification->m_DataDesc.m_nStartRow, 3) << "a fresh Excel template holds the defaults";
    EXPECT_EQ(engine.m_pParser->m_pSpecification, engine.m_pSpecification.get());
    EXPECT_EQ(engine.m_nInputType, 2);
    EXPECT_EQ(engine.m_nInputFormat, 3);
    EXPECT_EQ(engine.m_strInputFolder, "/d/books");

    engine.SetInput(1, 1, "/d/a.rbx0", "");
    EXPECT_EQ(engine.m_pSpecification, nullptr);
    EXPECT_TRUE(Is<CRbxPreviewFileParser>(engine.m_pParser));
    EXPECT_EQ(engine.m_pParser->m_pSpecification, nullptr);

    engine.SetInput(1, 4, "/d/a.bin", "");
    EXPECT_EQ(engine.m_pSpecification, nullptr);
    EXPECT_EQ(engine.m_pParser, nullptr);
    EXPECT_EQ(engine.m_nInputFormat, 4);
}

TEST(SetInput, SameFormatKeepsLoadedValuesAndChangesOnlyThePaths)
{
    CEngine engine;
    engine.SetInput(1, 2, "/d/a.txt", "");
    engine.m_pSpecification->m_DataDesc.m_nStartRow = 9;
    engine.m_pParser->m_arrItems = {4};
    engine.SetInput(2, 2, "/d/b.txt", "/d/");
    EXPECT_EQ(engine.m_pSpecification->m_DataDesc.m_nStartRow, 9);
    EXPECT_EQ(engine.m_pParser->m_arrItems, (CUIntArray{4}));
    EXPECT_EQ(engine.m_pParser->m_pSpecification, engine.m_pSpecification.get());
    EXPECT_EQ(engine.m_strInputFile, "/d/b.txt");
    EXPECT_EQ(engine.m_strInputFolder, "/d/");
    EXPECT_EQ(engine.m_nInputType, 2);
}

TEST(SetInput, AfterAResetAnAsciiParserIsReplacedWhateverFormatComesNext)
{
    for (int next : {1, 2}) {
        CEngine engine;
        engine.SetInput(1, 2, "/d/a.txt", "");
        engine.m_pSpecification->m_DataDesc.m_nStartRow = 9;
        engine.ResetSetup();
        EXPECT_TRUE(Is<CAsciiFilePreviewParser>(engine.m_pParser)) << "a reset keeps the objects";
        engine.SetInput(2, next, "", "/d/");
        if (next == 1) {
            EXPECT_EQ(engine.m_pSpecification, nullptr);
            EXPECT_TRUE(Is<CRbxPreviewFileParser>(engine.m_pParser));
            EXPECT_EQ(engine.m_pParser->m_pSpecification, nullptr);
        } else {
            ASSERT_TRUE(Is<CAsciiSpecification>(engine.m_pSpecification));
            EXPECT_EQ(engine.m_pSpecification->m_DataDesc.m_nStartRow, 3) << "fresh template";
            EXPECT_EQ(engine.m_pParser->m_pSpecification, engine.m_pSpecification.get());
        }
    }
}

TEST(SetInput, AnRbxParserSurvivesAResetFollowedByRbx)
{
    CEngine engine;
    engine.SetInput(1, 1, "/d/a.rbx0", "");
    engine.m_pParser->m_arrItems = {2};
    engine.ResetSetup();
    engine.SetInput(2, 1, "", "/d/");
    EXPECT_EQ(engine.m_pParser->m_arrItems, (CUIntArray{2}));
}

TEST(SetTemplate, SamePathInOtherCaseKeepsTheLoadedFlag)
{
    CEngine engine;
    engine.SetInput(1, 2, "/d/a.txt", "");
    CSpecification& spec = *engine.m_pSpecification;
    spec.m_strTemplateFile = "/t/Rain.xml";
    spec.m_bLoaded = 1;
    engine.SetTemplate(2, "/T/RAIN.XML");
    EXPECT_EQ(spec.m_bLoaded, 1);
    EXPECT_EQ(spec.m_strTemplateFile, "/t/Rain.xml");
    EXPECT_EQ(engine.m_nTemplateOption, 2);
    EXPECT_EQ(engine.m_strTemplateName, "/T/RAIN.XML");

    engine.SetTemplate(1, "/t/snow.xml");
    EXPECT_EQ(spec.m_bLoaded, 0);
    EXPECT_EQ(spec.m_strTemplateFile, "/t/snow.xml");
}

TEST(SetItems, CopiesIntoRecordTemplateAndParserIncludingAnEmptyList)
{
    CEngine engine;
    engine.SetItems({5}); // no objects yet
    EXPECT_EQ(engine.m_arrItems, (CUIntArray{5}));
    engine.SetInput(1, 2, "/d/a.txt", "");
    engine.SetItems({2, 0, 7});
    EXPECT_EQ(engine.m_pSpecification->m_arrSelItems, (CUIntArray{2, 0, 7}));
    EXPECT_EQ(engine.m_pParser->m_arrItems, (CUIntArray{2, 0, 7}));
    engine.SetItems({});
    EXPECT_TRUE(engine.m_arrItems.empty());
    EXPECT_TRUE(engine.m_pSpecification->m_arrSelItems.empty());
    EXPECT_TRUE(engine.m_pParser->m_arrItems.empty());
}

TEST(ResetSetup, RestoresDefaultsButKeepsItemsBridgesWorkTemplateAndObjects)
{
    CEngine engine;
    engine.SetInput(2, 2, "/d/a.txt", "/d/");
    engine.m_bConstraintsApplied = 1;
    engine.m_nTemplateOption = 3;
    engine.m_strTemplateName = "/t.xml";
    engine.m_nOutputFormat = 3;
    engine.m_strOutputFile = "/o.xlsx";
    engine.m_strOutputFolder = "/o/";
    engine.m_strOutputTitle = "Rain";
    engine.m_strPreviewFile = "/d/a.txt";
    engine.m_bParsed = 1;
    engine.m_arrItems = {1, 3};
    engine.m_strInputBridge = "in";
    engine.m_strOutputBridge = "out";
    engine.m_strWorkTemplate = "/tmp/VelmoraTemplate.xml";
    CSpecification* spec = engine.m_pSpecification.get();

    engine.ResetSetup();
    enginetest::ExpectFirstChoices(engine);
    for (const CString* field : {&engine.m_strInputFile, &engine.m_strInputFolder, &engine.m_strTemplateName,
                                 &engine.m_strOutputFile, &engine.m_strOutputFolder, &engine.m_strOutputTitle,
                                 &engine.m_strPreviewFile})
        EXPECT_EQ(*field, "");
    EXPECT_EQ(engine.m_arrItems, (CUIntArray{1, 3}));
    EXPECT_EQ(engine.m_strInputBridge, "in");
    EXPECT_EQ(engine.m_strOutputBridge, "out");
    EXPECT_EQ(engine.m_strWorkTemplate, "/tmp/VelmoraTemplate.xml");
    EXPECT_EQ(engine.m_pSpecification.get(), spec);
}

TEST(PreviewFile, BindsTheParserAndClearsTheParsedFlagOnlyOnAChange)
{
    CEngine engine;
    EXPECT_EQ(engine.SetPreviewFile("/d/a.txt"), 0) << "no parser";
    engine.m_strPreviewFile = "/d/old.txt";
    engine.m_bParsed = 1;
    EXPECT_EQ(engine.SetPreviewFile("/d/a.txt"), 0);
    EXPECT_EQ(engine.m_strPreviewFile, "");
    EXPECT_EQ(engine.m_bParsed, 0);

    engine.SetInput(1, 2, "/d/a.txt", "");
    EXPECT_EQ(engine.SetPreviewFile(""), 0);
    EXPECT_EQ(engine.SetPreviewFile("/d/a.txt"), 1);
    EXPECT_EQ(engine.m_pParser->m_strFile, "/d/a.txt");
    engine.m_bParsed = 1;
    EXPECT_EQ(engine.SetPreviewFile("/D/A.TXT"), 1);
    EXPECT_EQ(engine.m_bParsed, 1) << "the same file in other case is no change";
    EXPECT_EQ(engine.m_strPreviewFile, "/d/a.txt");

    engine.m_pParser->SetFile("/d/elsewhere.txt");
    EXPECT_EQ(engine.SetPreviewFile("/d/a.txt"), 1);
    EXPECT_EQ(engine.m_bParsed, 0) << "the parser was bound to another file";
    EXPECT_EQ(engine.m_pParser->m_strFile, "/d/a.txt");

    engine.m_pParser->SetFile("/d/elsewhere.txt");
    CString out;
    EXPECT_EQ(engine.GetPreviewFile(out), 1);
    EXPECT_EQ(out, "/d/a.txt");
    EXPECT_EQ(engine.m_pParser->m_strFile, "/d/a.txt") << "GetPreviewFile rebinds";

    engine.m_strPreviewFile.clear();
    EXPECT_EQ(engine.GetPreviewFile(out), 0);
    engine.m_pParser.reset();
    engine.m_strPreviewFile = "/d/a.txt";
    engine.m_bParsed = 1;
    EXPECT_EQ(engine.GetPreviewFile(out), 0);
    EXPECT_EQ(engine.m_strPreviewFile, "");
    EXPECT_EQ(engine.m_bParsed, 0);
}

TEST(WorkTemplate, FollowsThePreviewFilePatternAgainstTheTemplateFile)
{
    CEngine engine;
    engine.m_strWorkTemplate = "/tmp/w.xml";
    engine.m_bParsed = 1;
    EXPECT_EQ(engine.SetWorkTemplate("/tmp/w.xml"), 0) << "no template object";
    EXPECT_EQ(engine.m_strWorkTemplate, "");
    EXPECT_EQ(engine.m_bParsed, 0);

    engine.SetInput(1, 2, "/d/a.txt", "");
    CSpecification& spec = *engine.m_pSpecification;
    spec.m_strTemplateFile = "/t/chosen.xml";
    spec.m_bLoaded = 1;
    EXPECT_EQ(engine.SetWorkTemplate("/tmp/w.xml"), 1);
    EXPECT_EQ(spec.m_strTemplateFile, "/tmp/w.xml");
    EXPECT_EQ(spec.m_bLoaded, 0);
    engine.m_bParsed = 1;
    EXPECT_EQ(engine.SetWorkTemplate("/TMP/W.xml"), 1);
    EXPECT_EQ(engine.m_bParsed, 1);

    spec.m_strTemplateFile = "/t/chosen.xml";
    CString out;
    EXPECT_EQ(engine.GetWorkTemplate(out), 1);
    EXPECT_EQ(out, "/tmp/w.xml");
    EXPECT_EQ(spec.m_strTemplateFile, "/tmp/w.xml");
}

TEST(ParseInputFile, ParsesOnceUntilThePreviewFileOrWorkTemplateChanges)
{
    CEngine engine;
    engine.m_pSpecification = std::make_unique<CAsciiSpecification>();
    auto owned = std::make_unique<CountingParser>();
    CountingParser& parser = *owned;
    engine.m_pParser = std::move(owned);

    engine.SetPreviewFile("/d/a.txt");
    EXPECT_EQ(engine.ParseInputFile("/d/a.txt"), 1);
    EXPECT_EQ(engine.ParseInputFile("/D/a.TXT"), 1);
    EXPECT_EQ(parser.parses, 1);

    engine.SetTemplate(1, "/t/another.xml");
    EXPECT_EQ(engine.ParseInputFile("/d/a.txt"), 1);
    EXPECT_EQ(parser.parses, 1) << "choosing another template name alone forces no new parse";

    engine.SetWorkTemplate("/tmp/w.xml");
    EXPECT_EQ(engine.ParseInputFile("/d/a.txt"), 1);
    EXPECT_EQ(parser.parses, 2);

    engine.SetPreviewFile("/d/b.txt");
    EXPECT_EQ(engine.ParseInputFile(""), 1);
    EXPECT_EQ(parser.parses, 3);
    EXPECT_EQ(parser.lastPath, "/d/b.txt") << "an empty path parses the preview file";
}

TEST(ParseInputFile, AnExceptionClearsTheParsedFlagAPlainFailureLeavesIt)
{
    using Outcome = CountingParser::Outcome;
    for (Outcome thrown : {Outcome::ThrowFileError, Outcome::ThrowAutomationError}) {
        CEngine engine;
        auto parser = std::make_unique<CountingParser>();
        parser->outcome = thrown;
        engine.m_pParser = std::move(parser);
        engine.m_strPreviewFile = "/d/a.txt";
        engine.m_bParsed = 1;
        EXPECT_EQ(engine.ParseInputFile("/d/b.txt"), 0);
        EXPECT_EQ(engine.m_bParsed, 0);
    }
    CEngine engine;
    auto parser = std::make_unique<CountingParser>();
    parser->outcome = Outcome::Fail;
    engine.m_pParser = std::move(parser);
    engine.m_strPreviewFile = "/d/a.txt";
    engine.m_bParsed = 1;
    EXPECT_EQ(engine.ParseInputFile("/d/b.txt"), 0);
    EXPECT_EQ(engine.m_bParsed, 1);

    engine.m_pParser.reset();
    EXPECT_EQ(engine.ParseInputFile("/d/a.txt"), 0) << "no parser";
}

TEST(LoadTemplate, LoadsOnceRecordsTheNameAndRefreshesTheWorkingCopy)
{
    ScratchFolder scratch;
    CAsciiSpecification stored;
    stored.m_DataDesc.m_nStartRow = 7;
    const std::string path = scratch.File("rain.xml");
    ASSERT_EQ(stored.Save(path), 1);

    CEngine engine;
    EXPECT_EQ(engine.LoadTemplate(path), 0) << "no template object";
    engine.SetInput(1, 2, "/d/a.txt", "");
    engine.m_strWorkTemplate = scratch.File("work.xml");
    engine.SetTemplate(1, path);
    engine.m_strTemplateName.clear();
    EXPECT_EQ(engine.LoadTemplate(path), 1);
    EXPECT_EQ(engine.m_pSpecification->m_DataDesc.m_nStartRow, 7);
    EXPECT_EQ(engine.m_strTemplateName, path);
    EXPECT_EQ(engine.m_pSpecification->m_bLoaded, 1);

    CAsciiSpecification copy;
    ASSERT_EQ(copy.Load(scratch.File("work.xml")), 1) << "the working copy was written";
    EXPECT_EQ(copy.m_DataDesc.m_nStartRow, 7);

    engine.m_pSpecification->m_DataDesc.m_nStartRow = 8; // edited on a page
    EXPECT_EQ(engine.LoadTemplate(path), 1);
    EXPECT_EQ(engine.m_pSpecification->m_DataDesc.m_nStartRow, 8) << "an already loaded file is not read again";

    EXPECT_EQ(engine.LoadTemplate(scratch.File("missing.xml")), 0);
    EXPECT_EQ(engine.m_strTemplateName, path);
}

TEST(MakeWorkTemplateName, TakesTheFirstFreeNameInTheTemporaryFolder)
{
    ScratchFolder scratch;
    ScopedEnv tmp("TMPDIR", scratch.Path());
    const std::string first = MakeWorkTemplateName();
    EXPECT_EQ(first, scratch.File("VelmoraTemplate.xml"));
    scratch.Write("VelmoraTemplate.xml", "");
    EXPECT_EQ(MakeWorkTemplateName(), scratch.File("VelmoraTemplate_0.xml"));
    scratch.Write("VelmoraTemplate_0.xml", "");
    scratch.Write("VelmoraTemplate_1.xml", "");
    EXPECT_EQ(MakeWorkTemplateName(), scratch.File("VelmoraTemplate_2.xml"));
}

TEST(MakeWorkTemplateName, FallsBackToTheCurrentFolderWhenTheTemporaryOneDoesNotFit)
{
    ScopedEnv tmp("TMPDIR", "/" + std::string(300, 'x'));
    const std::string name = MakeWorkTemplateName();
    const std::string cwd = std::filesystem::current_path().string();
    EXPECT_EQ(name.rfind(cwd, 0), 0u) << name;
    EXPECT_NE(name.find("VelmoraTemplate"), std::string::npos);
}

TEST(ReadItemNames, OpensTheWorkbookForExcelAndRefusesAnotherParser)
{
    ScopedEnv absent("VELMORA_SPREADSHEET", "absent");
    CEngine engine;
    CStringList names{"stale"};
    EXPECT_EQ(engine.ReadItemNames("/d/a.xlsx", names), 0);
    EXPECT_TRUE(names.empty());

    engine.SetInput(1, 3, "/d/a.xlsx", "");
    EXPECT_EQ(engine.ReadItemNames("/d/a.xlsx", names), 0) << "the workbook cannot be opened";

    engine.m_pParser = std::make_unique<CountingParser>();
    EXPECT_EQ(engine.ReadItemNames("/d/a.xlsx", names), 0) << "Excel input needs the Excel parser";
    engine.m_nInputFormat = 2;
    EXPECT_EQ(engine.ReadItemNames("/d/a.txt", names), 1);
    EXPECT_EQ(names, (CStringList{"A"}));
    EXPECT_EQ(engine.m_pParser->m_strFile, "/d/a.txt");
}
