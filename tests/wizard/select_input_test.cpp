// The select-input page's decisions without a window: the controls each click leaves, what Next
// accepts and refuses (with which message), and what it stores in the setup record.
#include "tests/wizard/FormTestSupport.h"

#include "engine/Engine.h"
#include "platform/system/FileSystem.h"
#include "platform/ui/UserInterface.h"
#include "resources/StringTable.h"
#include "wizard/SelectInputForm.h"

#include <gtest/gtest.h>

namespace {

using namespace wizardtest;

class SelectInput : public FormTest {
protected:
    static SelectInputState Single(int format, const std::string& file) { return InputChoice(format, true, file); }
    static SelectInputState Folder(int format, const std::string& folder) { return InputChoice(format, false, folder); }
};

TEST_F(SelectInput, Rbx0ExtensionIsAPatternFromTheRecordAndSingleFileButBareFromTheStartAndItsRadio)
{
    EXPECT_EQ(InitialSelectInput().browse.extension, "rbx0");
    SelectInputState state = InitialSelectInput();
    LoadSelectInput(state, engine);
    EXPECT_EQ(state.browse.extension, "*.rbx0");
    ClickFormat(state, 1);
    EXPECT_EQ(state.browse.extension, "rbx0");
    ClickSingleFile(state, &engine);
    EXPECT_EQ(state.browse.extension, "*.rbx0");
    EXPECT_EQ(state.browse.mode, 1);
    ClickFormat(state, 2);
    EXPECT_EQ(state.browse.extension, "*.txt");
    EXPECT_EQ(state.browse.mode, 2);
    ClickFormat(state, 3);
    EXPECT_EQ(state.browse.extension, "");
    EXPECT_EQ(state.browse.filter, "Excel Files (*.xls;*.xlsx) |*.xls;*.xlsx|All Files (*.*)|*.*||");
}

TEST_F(SelectInput, TheTypeRadiosResetTheRecordAndTheFormatRadiosLeaveIt)
{
    auto fill = [this] {
        engine.m_nInputType = 2;
        engine.m_nInputFormat = 3;
        engine.m_strInputFolder = inputs.excelFolder;
        engine.m_nOutputFormat = 2;
        engine.m_strOutputFile = "out.txt";
        engine.m_arrItems = {0, 2};
    };
    fill();
    SelectInputState state = InitialSelectInput();
    state.file = "typed.txt";
    ClickFormat(state, 2);
    EXPECT_EQ(engine.m_nInputFormat, 3);
    EXPECT_EQ(engine.m_strOutputFile, "out.txt");

    ClickFolder(state, &engine);
    EXPECT_EQ(engine.m_nInputType, 1);
    EXPECT_EQ(engine.m_nInputFormat, 1);
    EXPECT_EQ(engine.m_strInputFolder, "");
    EXPECT_EQ(engine.m_strOutputFile, "");
    EXPECT_EQ(engine.m_arrItems, (CUIntArray{0, 2})) << "a reset keeps the items";
    EXPECT_FALSE(state.fileEnabled);
    EXPECT_TRUE(state.folderEnabled);
    EXPECT_EQ(state.file, "");

    fill();
    state.folder = "typed/";
    ClickSingleFile(state, &engine);
    EXPECT_EQ(engine.m_nInputFormat, 1);
    EXPECT_TRUE(state.fileEnabled);
    EXPECT_FALSE(state.folderEnabled);
    EXPECT_EQ(state.folder, "");
}

TEST_F(SelectInput, AFormatRadioInFolderModeKeepsTheFolderText)
{
    SelectInputState state = Folder(2, inputs.asciiFolder);
    ClickFormat(state, 3);
    EXPECT_EQ(state.folder, inputs.asciiFolder);
    EXPECT_TRUE(state.folderEnabled);
    EXPECT_FALSE(state.fileEnabled);
}

TEST_F(SelectInput, RefusedFilesAndFoldersShowTheirMessageAndStoreNothing)
{
    const std::string dat = scratch.Write("gauge.dat", "2021/01/01 00:00:00\t1\n");
    const std::string zeroByte = scratch.Write("binary", std::string("abc\0def", 7));
    const std::string hiddenOnly = scratch.MakeFolder("hidden");
    scratch.Write("hidden/.a.txt", "x\n");
    const std::string fileInvalid = res::LoadString(res::IDS_FILE_INVALID);
    const std::string folderInvalid = res::LoadString(res::IDS_FOLDER_INVALID);
    struct Case {
        const char* what;
        SelectInputState state;
        std::string message;
    };
    const ScopedEnv excelAbsent("VELMORA_SPREADSHEET", std::string("absent"));
    const Case cases[] = {
        {"ASCII .dat", Single(2, dat), fileInvalid},
        {"ASCII without extension holding a zero byte", Single(2, zeroByte), fileInvalid},
        {"missing rbx0 file", Single(1, scratch.File("none.rbx0")), fileInvalid},
        {"rbx0 named .txt", Single(1, inputs.asciiFile), fileInvalid},
        {"Excel with Excel absent", Single(3, inputs.excelFile), res::LoadString(res::IDS_EXCEL_MISSING)},
        {"missing folder", Folder(2, scratch.File("none/")), folderInvalid},
        {"folder of hidden files", Folder(2, hiddenOnly + "/"), folderInvalid},
        {"folder without rbx0 files", Folder(1, inputs.asciiFolder), folderInvalid},
    };
    for (const Case& c : cases) {
        screen.boxes.clear();
        EXPECT_FALSE(AcceptSelectInput(c.state, &engine)) << c.what;
        EXPECT_EQ(Messages(), std::vector<std::string>{c.message}) << c.what;
        ASSERT_FALSE(screen.boxes.empty());
        EXPECT_EQ(screen.boxes[0].type, ui::MB_OK | ui::MB_ICONEXCLAMATION);
        EXPECT_EQ(engine.m_pParser, nullptr) << c.what << ": nothing is stored";
    }
}

TEST_F(SelectInput, ATextFileWithoutExtensionIsAcceptedAsAscii)
{
    const std::string bare = scratch.File("gauge");
    std::filesystem::copy_file(inputs.asciiFile, bare);
    EXPECT_TRUE(AcceptSelectInput(Single(2, bare), &engine));
    EXPECT_TRUE(screen.boxes.empty());
    EXPECT_EQ(engine.m_strPreviewFile, bare);
}

TEST_F(SelectInput, ASingleAsciiFileMakesTheWorkingObjectsAndAWorkingTemplateInTheTemporaryFolder)
{
    ASSERT_TRUE(AcceptSelectInput(Single(2, inputs.asciiFile), &engine));
    EXPECT_EQ(engine.m_nInputType, 1);
    EXPECT_EQ(engine.m_nInputFormat, 2);
    EXPECT_EQ(engine.m_strInputFile, inputs.asciiFile);
    ASSERT_NE(engine.m_pSpecification, nullptr);
    ASSERT_NE(engine.m_pParser, nullptr);
    EXPECT_EQ(engine.m_strPreviewFile, inputs.asciiFile);
    EXPECT_EQ(engine.m_pParser->m_strFile, inputs.asciiFile);
    EXPECT_EQ(engine.m_strWorkTemplate, inputs.temp + "VelmoraTemplate.xml");
    EXPECT_EQ(engine.m_bParsed, 0) << "ASCII waits for its template";
}

TEST_F(SelectInput, AnRbx0FolderParsesItsFirstFileAndHasNoWorkingTemplate)
{
    ASSERT_TRUE(AcceptSelectInput(Folder(1, inputs.rbxFolder), &engine));
    EXPECT_EQ(engine.m_nInputType, 2);
    EXPECT_EQ(engine.m_strInputFolder, inputs.rbxFolder);
    EXPECT_EQ(engine.m_strInputFile, "");
    EXPECT_EQ(engine.m_pSpecification, nullptr);
    EXPECT_EQ(sys::FolderOf(engine.m_strPreviewFile) + "/", inputs.rbxFolder);
    ASSERT_NE(engine.m_pParser, nullptr);
    EXPECT_EQ(engine.m_pParser->m_vecRows.size(), 4u) << "the first file is parsed at once";
    EXPECT_EQ(engine.m_strWorkTemplate, "");
}

TEST_F(SelectInput, TheRbx0SelectorIsNarrowedOnlyForASingleRbx0File)
{
    SelectorOpening(Single(2, inputs.asciiFile), &engine, nullptr);
    EXPECT_EQ(engine.m_bConstraintsApplied, 0);
    SelectorOpening(Folder(1, inputs.rbxFolder), &engine, nullptr);
    EXPECT_EQ(engine.m_bConstraintsApplied, 0);
    SelectorOpening(Single(1, inputs.rbxFile), &engine, nullptr);
    EXPECT_EQ(engine.m_bConstraintsApplied, 1);
}

} // namespace
