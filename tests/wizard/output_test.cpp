// The output page's decisions without a window: enabled fields, the default extension a name gets,
// the save dialog of each format, and what the output check stores or refuses.
#include "tests/wizard/WizardTestSupport.h"

#include "engine/Engine.h"
#include "resources/StringTable.h"
#include "wizard/OutputForm.h"

#include <gtest/gtest.h>

namespace {

using namespace wizardtest;

class Output : public testing::Test {
protected:
    ScratchFolder scratch;
    ui::ScriptedUserInterface screen;
    ui::ScopedUserInterface watching{screen};
    CEngine engine;
};

TEST_F(Output, NamesWithoutExtensionGetTheFormatsOwnAndAsciiRefusesCsv)
{
    struct Case {
        std::string name;
        int format;
        int excelVersion;
        std::string expected; // empty: refused
    };
    const Case cases[] = {
        {"result", 1, 16, "result.rbx0"},    {"result", 3, 16, "result.xlsx"},    {"result", 3, 12, "result.xlsx"},
        {"result", 3, 11, "result.xls"},     {"result", 2, 16, "result.txt"},     {"result.CSV", 2, 16, ""},
        {"result.csv", 2, 16, ""},           {"result.dat", 2, 16, "result.dat"}, {"result.txt", 1, 16, "result.txt"},
        {"out.d/result", 1, 16, "out.d/result.rbx0"}, {"", 2, 16, ""},
    };
    for (const Case& c : cases) {
        screen.boxes.clear();
        CString name = c.name;
        const bool refused = c.expected.empty() && !c.name.empty();
        EXPECT_EQ(AddDefaultExtension(name, c.format, c.excelVersion), refused ? 0 : 1) << c.name;
        if (refused) {
            ASSERT_EQ(screen.boxes.size(), 1u) << c.name;
            EXPECT_EQ(screen.boxes[0].text, res::LoadString(res::IDS_FILE_NAME_INVALID));
            EXPECT_EQ(screen.boxes[0].type, ui::MB_OK | ui::MB_ICONEXCLAMATION);
            EXPECT_EQ(name, c.name);
        } else {
            EXPECT_EQ(name, c.expected);
            EXPECT_TRUE(screen.boxes.empty());
        }
    }
}

TEST_F(Output, AFolderConversionNamesAFolderAndOnlyRbx0HasATitle)
{
    OutputState state;
    engine.m_nInputType = 2;
    engine.m_nOutputFormat = 2;
    engine.m_strOutputFile = "kept.txt";
    LoadOutput(state, engine);
    EXPECT_FALSE(state.fileEnabled);
    EXPECT_TRUE(state.folderEnabled);
    EXPECT_FALSE(state.titleEnabled);
    EXPECT_EQ(state.file, "kept.txt");
    ClickOutputFormat(state, 1);
    EXPECT_TRUE(state.titleEnabled);
    EXPECT_FALSE(state.fileEnabled) << "a format changes only the title";

    engine.m_nInputType = 1;
    engine.m_nOutputFormat = 7;
    state.format = 3;
    LoadOutput(state, engine);
    EXPECT_EQ(state.format, 3) << "a format outside 1..3 leaves the radios";
    EXPECT_TRUE(state.fileEnabled);
    EXPECT_FALSE(state.folderEnabled);
}

TEST_F(Output, EachFormatHasItsSaveDialog)
{
    EXPECT_EQ(OutputFileRequest(1, 16).filter, "Time Series Files (*.rbx0;*.rqt) |*.rbx0;*.rqt|All Files (*.*) |*.*||");
    EXPECT_EQ(OutputFileRequest(2, 16).initialName, "*.txt");
    EXPECT_EQ(OutputFileRequest(3, 16).defaultExtension, ".xlsx");
    EXPECT_EQ(OutputFileRequest(3, 11).filter, "Excel Files (*.xls) | *.xls| All Files (*.*) | *.*||");
    for (int format = 1; format <= 3; ++format) {
        EXPECT_FALSE(OutputFileRequest(format, 16).open);
        EXPECT_EQ(OutputFileRequest(format, 16).flags, 0x1006u);
    }
}

TEST_F(Output, BrowsingCompletesTheChosenNameAndTheFolderComesAsChosen)
{
    OutputState state;
    state.format = 3;
    screen.chosenPaths = {scratch.File("book"), scratch.Path()};
    BrowseOutputFile(state, 16);
    EXPECT_EQ(state.file, scratch.File("book.xlsx"));
    BrowseOutputFolder(state);
    EXPECT_EQ(state.folder, scratch.Path());
    ASSERT_EQ(screen.folderRequests.size(), 1u);
    EXPECT_EQ(screen.folderRequests[0].prompt, res::LoadString(res::IDS_SELECT_FOLDER));
    EXPECT_EQ(screen.folderRequests[0].flags, 0x55u);
}

TEST_F(Output, TheCheckStoresAnAcceptedOutputAndKeepsTheOldOneOnRefusal)
{
    engine.m_nInputType = 1;
    engine.m_strOutputFile = "old.rbx0";
    OutputState state;
    state.format = 2;
    state.file = scratch.File("result.CSV");
    EXPECT_EQ(ValidateOutput(state, &engine, 16), 0);
    EXPECT_EQ(screen.boxes.back().text, res::LoadString(res::IDS_FILE_NAME_INVALID));
    EXPECT_EQ(engine.m_strOutputFile, "old.rbx0");

    state.file = scratch.File("missing-folder/result");
    EXPECT_EQ(ValidateOutput(state, &engine, 16), 0);
    EXPECT_EQ(screen.boxes.back().text, res::LoadString(res::IDS_FILE_INVALID));
    EXPECT_EQ(engine.m_strOutputFile, "old.rbx0");

    state.file = scratch.File("result");
    state.title = "Gauge";
    EXPECT_EQ(ValidateOutput(state, &engine, 16), 1);
    EXPECT_EQ(engine.m_nOutputFormat, 2);
    EXPECT_EQ(engine.m_strOutputFile, scratch.File("result.txt"));
    EXPECT_EQ(engine.m_strOutputTitle, "Gauge");

    engine.m_nInputType = 2;
    state.folder = scratch.File("none");
    EXPECT_EQ(ValidateOutput(state, &engine, 16), 0);
    EXPECT_EQ(screen.boxes.back().text, res::LoadString(res::IDS_FOLDER_INVALID));
    state.folder = scratch.Path();
    state.file = "untouched";
    EXPECT_EQ(ValidateOutput(state, &engine, 16), 1);
    EXPECT_EQ(engine.m_strOutputFile, "untouched") << "a folder conversion leaves the file name as it is";
    EXPECT_EQ(ValidateOutput(state, nullptr, 16), 0);
}

} // namespace
