// The define-template page's decisions without a window: what activation shows for a stored
// setup, what the radios change, and what Next and Preview check, say and store.
#include "tests/wizard/FormTestSupport.h"

#include "engine/Engine.h"
#include "platform/system/FileSystem.h"
#include "resources/StringTable.h"
#include "wizard/DefineTemplateForm.h"
#include "wizard/SelectInputForm.h"

#include <gtest/gtest.h>

namespace {

using namespace wizardtest;

class DefineTemplate : public FormTest {
protected:
    DefineTemplateState Shown()
    {
        DefineTemplateState state;
        LoadDefineTemplate(state, engine);
        return state;
    }
    DefineTemplateState Choice(int option, const std::string& path)
    {
        DefineTemplateState state = Shown();
        if (option == 3)
            ClickManual(state);
        else
            ClickExistingTemplate(state, option);
        state.path = path;
        return state;
    }
    // An ASCII template that splits at commas, which the tab-separated input does not have.
    std::string MisfitAsciiTemplate()
    {
        CAsciiSpecification comma;
        comma.m_strDelimiter = "Comma";
        const std::string path = scratch.File("comma.xml");
        EXPECT_EQ(comma.Save(path), 1);
        return path;
    }
};

TEST_F(DefineTemplate, AStoredOptionShowsAdjustedButTheFieldFollowsTheRecord)
{
    struct Case {
        int option;
        std::string name;
        int type;
        int shown;
        bool pathEnabled;
        bool preview;
    };
    const Case cases[] = {
        {1, "t.xml", 1, 1, true, true},  {2, "", 1, 3, true, false},   {2, "t.xml", 1, 2, true, true},
        {3, "t.xml", 1, 2, false, true}, {3, "", 1, 3, false, false},  {3, "", 2, 3, true, false},
        {1, "t.xml", 2, 1, true, true},
    };
    for (const Case& c : cases) {
        engine.m_nTemplateOption = c.option;
        engine.m_strTemplateName = c.name;
        engine.m_nInputType = c.type;
        const DefineTemplateState state = Shown();
        SCOPED_TRACE(testing::Message() << "option " << c.option << " name '" << c.name << "' type " << c.type);
        EXPECT_EQ(state.checkedOption, c.shown);
        EXPECT_EQ(state.storedOption, c.shown);
        EXPECT_EQ(state.path, c.name);
        EXPECT_EQ(state.radiosVisible, c.type == 1);
        EXPECT_EQ(state.pathEnabled, c.pathEnabled);
        EXPECT_EQ(state.previewVisible, c.preview);
        EXPECT_EQ(state.previewEnabled, c.preview);
        EXPECT_EQ(engine.m_nTemplateOption, c.option) << "activation changes nothing in the record";
    }
}

TEST_F(DefineTemplate, TheLinesSayWhatIsConvertedAndRbx0KeepsTheDialogsOwn)
{
    using namespace res;
    struct Case {
        int format, type;
        std::array<int, 3> ids;
    };
    const Case cases[] = {
        {2, 1, {IDS_SINGLE_ASCII, IDS_SPECIFY_FORMAT, IDS_FOLLOWING_OPTIONS}},
        {2, 2, {IDS_FOLDER_ASCII, IDS_FOLDER_NEEDS_TEMPLATE, IDS_CREATE_TEMPLATE_HINT}},
        {3, 1, {IDS_SINGLE_EXCEL, IDS_SPECIFY_FORMAT, IDS_FOLLOWING_OPTIONS}},
        {3, 2, {IDS_FOLDER_EXCEL, IDS_FOLDER_NEEDS_TEMPLATE, IDS_CREATE_TEMPLATE_HINT}},
    };
    for (const Case& c : cases) {
        engine.m_nInputFormat = c.format;
        engine.m_nInputType = c.type;
        const DefineTemplateState state = Shown();
        for (size_t i = 0; i < 3; ++i)
            EXPECT_EQ(state.lines[i], LoadString(c.ids[i])) << "format " << c.format << " type " << c.type;
    }
    engine.m_nInputFormat = 1;
    EXPECT_EQ(Shown().lines, DefineTemplateState{}.lines);
    EXPECT_EQ(DefineTemplateState{}.lines[0], "You have chosen to convert a single ascii file.");
}

TEST_F(DefineTemplate, ManualEmptiesThePathAndAnExistingTemplateRadioLeavesItEmpty)
{
    DefineTemplateState state = Choice(1, inputs.asciiTemplate);
    ClickManual(state);
    EXPECT_EQ(state.path, "");
    EXPECT_FALSE(state.pathEnabled);
    EXPECT_FALSE(state.previewVisible);
    ClickExistingTemplate(state, 2);
    EXPECT_EQ(state.path, "");
    EXPECT_TRUE(state.pathEnabled);
    EXPECT_TRUE(state.previewVisible);
    EXPECT_TRUE(state.previewEnabled);
}

TEST_F(DefineTemplate, TheBrowseDialogSavesOnlyWhenThePagesOptionIsManual)
{
    DefineTemplateState state;
    state.storedOption = 1;
    ui::FileDialogRequest request = TemplateFileRequest(state);
    EXPECT_TRUE(request.open);
    EXPECT_EQ(request.defaultExtension, "xml");
    EXPECT_EQ(request.initialName, "*.xml");
    EXPECT_EQ(request.flags, 0x1006u);
    EXPECT_EQ(request.filter, "XML Files (*.xml)|*.xml|All Files (*.*)|*.*||");
    state.storedOption = 3;
    state.checkedOption = 1; // a radio clicked since does not count
    EXPECT_FALSE(TemplateFileRequest(state).open);
}

TEST_F(DefineTemplate, NoTemplateFileStopsOptionOneBeforeAnythingIsStored)
{
    ChooseInput(2, true, inputs.asciiFile);
    EXPECT_FALSE(AcceptDefineTemplate(Choice(1, scratch.File("missing.xml")), &engine));
    EXPECT_EQ(Messages(), std::vector<std::string>{res::LoadString(res::IDS_NO_TEMPLATE_SELECTED)});
    EXPECT_EQ(engine.m_strTemplateName, "");
}

TEST_F(DefineTemplate, OptionTwoWithoutItsFileIsStoredButTheUserStays)
{
    ChooseInput(2, true, inputs.asciiFile);
    const std::string missing = scratch.File("missing.xml");
    EXPECT_FALSE(AcceptDefineTemplate(Choice(2, missing), &engine));
    EXPECT_EQ(Messages(), std::vector<std::string>{res::LoadString(res::IDS_NO_TEMPLATE_SELECTED)});
    EXPECT_EQ(engine.m_nTemplateOption, 2);
    EXPECT_EQ(engine.m_strTemplateName, missing);
}

TEST_F(DefineTemplate, ManualNeverChecksAFile)
{
    ChooseInput(3, true, inputs.excelFile);
    EXPECT_TRUE(AcceptDefineTemplate(Choice(3, ""), &engine));
    EXPECT_TRUE(screen.boxes.empty());
    EXPECT_EQ(engine.m_nTemplateOption, 3);
    EXPECT_EQ(engine.m_strTemplateName, "");
}

TEST_F(DefineTemplate, AnUnchangedTemplateIsCheckedParsedAndStored)
{
    ChooseInput(2, true, inputs.asciiFile);
    EXPECT_TRUE(AcceptDefineTemplate(Choice(1, inputs.asciiTemplate), &engine));
    EXPECT_TRUE(screen.boxes.empty());
    EXPECT_EQ(engine.m_nTemplateOption, 1);
    EXPECT_EQ(engine.m_strTemplateName, inputs.asciiTemplate);
    EXPECT_EQ(engine.m_bParsed, 1);
    EXPECT_EQ(engine.m_pParser->m_vecRows.size(), 3u + 4u) << "types, units, value types, four steps";
}

TEST_F(DefineTemplate, ASingleFileTheTemplateDoesNotFitKeepsTheUserWithoutAMessage)
{
    const std::string misfit = MisfitAsciiTemplate();
    ChooseInput(2, true, inputs.asciiFile);
    EXPECT_FALSE(AcceptDefineTemplate(Choice(1, misfit), &engine));
    EXPECT_TRUE(screen.boxes.empty()) << screen.boxes[0].text;
    EXPECT_EQ(engine.m_strTemplateName, "") << "nothing is stored";
}

TEST_F(DefineTemplate, AFolderWithoutAFittingFileSays2283)
{
    ChooseInput(3, false, inputs.excelFolder);
    EXPECT_FALSE(AcceptDefineTemplate(Choice(1, inputs.asciiTemplate), &engine));
    EXPECT_EQ(Messages(), std::vector<std::string>{res::LoadString(res::IDS_TEMPLATE_NO_MATCH)});
    EXPECT_TRUE(AcceptDefineTemplate(Choice(1, inputs.excelTemplate), &engine));
    EXPECT_EQ(sys::FolderOf(engine.m_strPreviewFile) + "/", inputs.excelFolder);
}

TEST_F(DefineTemplate, PreviewShowsTheFileThroughTheTemplateAndRemovesTheWorkingCopy)
{
    ChooseInput(2, true, inputs.asciiFile);
    EXPECT_EQ(PreviewDefineTemplate(Choice(1, inputs.asciiTemplate), &engine), 1);
    ASSERT_EQ(screen.previews.size(), 1u);
    EXPECT_EQ(screen.previews[0].resultRows.size(), 3u + 4u);
    EXPECT_FALSE(screen.previews[0].inputLines.empty());
    EXPECT_FALSE(sys::FileExists(engine.m_strWorkTemplate));
    EXPECT_EQ(engine.m_strTemplateName, inputs.asciiTemplate);
}

TEST_F(DefineTemplate, PreviewWithAMisfitTemplateStillShowsTheFileAsItStands)
{
    const std::string misfit = MisfitAsciiTemplate();
    ChooseInput(2, true, inputs.asciiFile);
    EXPECT_EQ(PreviewDefineTemplate(Choice(1, misfit), &engine), 1);
    ASSERT_EQ(screen.previews.size(), 1u);
    EXPECT_FALSE(screen.previews[0].inputLines.empty());
}

} // namespace
