// The save-template page's decisions without a window: the name it proposes, the checks of a name,
// the questions before a file is replaced, and the save.
#include "tests/wizard/FormTestSupport.h"

#include "resources/StringTable.h"
#include "wizard/SaveTemplateForm.h"

#include <filesystem>
#include <fstream>

namespace {

using namespace wizardtest;

class SaveTemplate : public FormTest {
protected:
    static std::string ReadFileBytes(const std::string& path)
    {
        std::ifstream in(path, std::ios::binary);
        return std::string(std::istreambuf_iterator<char>(in), {});
    }
    // The one message shown since the last call, or "".
    std::string Said()
    {
        std::string text = screen.boxes.empty() ? "" : screen.boxes.back().text;
        EXPECT_LE(screen.boxes.size(), 1u);
        screen.boxes.clear();
        return text;
    }
};

TEST_F(SaveTemplate, TheProposalFollowsTheOptionAndTheInput)
{
    struct Case {
        int option;
        int type;
        std::string file;
        std::string folder;
        std::string expected;
    };
    const Case cases[] = {
        {3, 1, "/data/run1.txt", "", "/data/template.xml"},
        {3, 1, "run1.txt", "", "/template.xml"}, // no folder part: the folder is empty
        {3, 2, "", "/data/in//", "/data/in/template.xml"},
        {3, 3, "", "", inputs.temp + "template.xml"},
        {2, 1, "/data/run1.txt", "", "/t/a.xml"},
        {1, 1, "/data/run1.txt", "", "/t/a.xml"},
        {4, 1, "/data/run1.txt", "", ""},
    };
    for (const Case& c : cases) {
        engine.m_nTemplateOption = c.option;
        engine.m_nInputType = c.type;
        engine.m_strInputFile = c.file;
        engine.m_strInputFolder = c.folder;
        engine.m_strTemplateName = "/t/a.xml";
        EXPECT_EQ(ProposeTemplateName(engine), c.expected) << c.option << " " << c.type;
    }
}

TEST_F(SaveTemplate, ANameAcceptedOnceIsShownAgainInsteadOfAProposal)
{
    DescribeByHand(2, inputs.asciiFile);
    EXPECT_EQ(LoadTemplateName(engine, "typed.xml"), scratch.File("template.xml")) << "the template has no name yet";
    ASSERT_TRUE(AcceptTemplateName(scratch.File("mine.xml"), &engine));
    EXPECT_EQ(LoadTemplateName(engine, ""), scratch.File("mine.xml"));
    EXPECT_EQ(engine.StoredTemplateName(), scratch.File("mine.xml")) << "the setup refers to it";
}

TEST_F(SaveTemplate, ANameMustBeAValidFileEndingInXmlInAnyCase)
{
    const std::string invalid = res::LoadString(res::IDS_TEMPLATE_NAME_INVALID);
    struct Case {
        std::string name;
        bool accepted;
    };
    const Case cases[] = {{scratch.File("b.XML"), true}, {scratch.File("b.xml"), true},   {scratch.File("b.txt"), false},
                          {scratch.File("b"), false},     {scratch.File("b.xml.bak"), false}, {scratch.File("none/b.xml"), false},
                          {"", false},                {scratch.File(""), false}};
    for (const Case& c : cases) {
        EXPECT_EQ(ValidateTemplateName(c.name, nullptr), c.accepted ? 1 : 0) << c.name;
        EXPECT_EQ(Said(), c.accepted ? "" : invalid) << c.name;
    }
    EXPECT_EQ(ValidateTemplateName(scratch.File("b.txt"), &engine), 0);
    ASSERT_EQ(screen.boxes.size(), 1u);
    EXPECT_EQ(screen.boxes[0].type, ui::MB_OK | ui::MB_ICONEXCLAMATION);
    EXPECT_EQ(screen.boxes[0].caption, "");
}

TEST_F(SaveTemplate, TheTemplateStartedFromIsReplacedOnlyAfterYes)
{
    ChooseInput(2, true, inputs.asciiFile);
    DefineTemplateState choice;
    LoadDefineTemplate(choice, engine);
    ClickExistingTemplate(choice, 2);
    choice.path = inputs.asciiTemplate;
    ASSERT_TRUE(AcceptDefineTemplate(choice, &engine));
    engine.m_pSpecification->m_strDelimiter = "Comma";
    const std::string before = ReadFileBytes(inputs.asciiTemplate);

    screen.answers = {ui::IDNO};
    EXPECT_FALSE(AcceptTemplateName(inputs.asciiTemplate, &engine));
    ASSERT_EQ(screen.boxes.size(), 1u);
    EXPECT_EQ(screen.boxes[0].text, res::LoadString(res::IDS_OVERWRITE_INPUT_TEMPLATE));
    EXPECT_EQ(screen.boxes[0].caption, "Save template file");
    EXPECT_EQ(screen.boxes[0].type, ui::MB_YESNO);
    EXPECT_EQ(ReadFileBytes(inputs.asciiTemplate), before);

    screen.answers = {ui::IDYES};
    EXPECT_TRUE(AcceptTemplateName(inputs.asciiTemplate, &engine));
    CAsciiSpecification saved;
    ASSERT_EQ(saved.Load(inputs.asciiTemplate), 1);
    EXPECT_EQ(saved.m_strDelimiter, "Comma");

    // Modifying, another existing file is replaced without a question.
    const std::string other = scratch.Write("other.xml", "old");
    screen.boxes.clear();
    EXPECT_TRUE(AcceptTemplateName(other, &engine));
    EXPECT_TRUE(screen.boxes.empty());
    EXPECT_EQ(saved.Load(other), 1);
}

TEST_F(SaveTemplate, AHandMadeTemplateAsksBeforeReplacingAFileAndNoKeepsThePage)
{
    DescribeByHand(2, inputs.asciiFile);
    const std::string existing = scratch.Write("template.xml", "old");
    screen.answers = {ui::IDNO};
    EXPECT_FALSE(AcceptTemplateName(existing, &engine));
    ASSERT_EQ(screen.boxes.size(), 1u);
    EXPECT_EQ(screen.boxes[0].text, res::LoadString(res::IDS_FILE_EXISTS_REPLACE));
    EXPECT_EQ(screen.boxes[0].caption, "Save template file");
    EXPECT_EQ(ReadFileBytes(existing), "old");
    EXPECT_EQ(engine.m_pSpecification->m_strSaveFile, "") << "nothing stored";

    screen.boxes.clear();
    EXPECT_TRUE(AcceptTemplateName(scratch.File("fresh.xml"), &engine)) << "a new file needs no question";
    EXPECT_TRUE(screen.boxes.empty());
    EXPECT_TRUE(std::filesystem::exists(scratch.File("fresh.xml")));
}

} // namespace
