#include "engine/Engine.h"
#include "engine/TemporarySetupFile.h"
#include "platform/ui/UserInterface.h"
#include "tests/engine/EngineTestSupport.h"

#include <gtest/gtest.h>

#include <climits>
#include <csignal>
#include <sys/stat.h>
#include <sys/wait.h>
#include <unistd.h>

namespace {

using namespace enginetest;

TEST(EngineFileName, BlanksBecomeUnderscoresAndWpxIsAppended)
{
    std::string e150;
    for (int i = 0; i < 150; ++i)
        e150 += "\xC3\xA9"; // é, two bytes
    const std::pair<std::string, std::string> cases[] = {
        {"My setup 2", "My_setup_2.wpx"},
        {"a b", "a_b.wpx"},
        {"ab", "ab.wpx"},
        {"", ".wpx"},
        {"  two  ", "__two__.wpx"},
        {"a:b (c)", "a:b_(c).wpx"},
        // Nothing that leads out of the temporary folder, hides the file or ends its name early.
        {"a/b", "a_b.wpx"},
        {"a\\b", "a_b.wpx"},
        {std::string("../victim/notes.txt") + '\0', "___victim_notes.txt_.wpx"},
        {"..", "__.wpx"},
        {".hidden.x", "_hidden.x.wpx"},
        {"tab\there\nand\x7f", "tab_here_and_.wpx"},
        {"r\xC3\xA9sum\xC3\xA9", "r\xC3\xA9sum\xC3\xA9.wpx"},
        // Long names are cut at 200 bytes, never inside a character.
        {std::string(300, 'x'), std::string(200, 'x') + ".wpx"},
        {"a" + e150, "a" + e150.substr(0, 198) + ".wpx"},
    };
    for (const auto& [name, file] : cases) {
        CEngine engine;
        engine.SetSetupName(name);
        EXPECT_EQ(engine.EngineFileName(), file) << "'" << name << "'";
    }
}

TEST(TemporarySetupFile, IsPrivateAndRemovedOnlyWhenStillItsOwn)
{
    ScratchFolder folder;
    const std::string path = folder.File("Setup.wpx");
    {
        TemporarySetupFile file(folder.Path() + "/", "Setup.wpx", "content\n");
        ASSERT_TRUE(file.Created()) << file.status().problem().message;
        EXPECT_EQ(file.Path(), path);
        EXPECT_EQ(ReadFile(path), "content\n");
        struct stat st {};
        ASSERT_EQ(::stat(path.c_str(), &st), 0);
        EXPECT_EQ(st.st_mode & 0777, 0600u);
    }
    EXPECT_EQ(::access(path.c_str(), F_OK), -1) << "removed when it goes";

    {
        TemporarySetupFile file(folder.Path() + "/", "Setup.wpx", "mine\n");
        ASSERT_TRUE(file.Created());
        // Something else takes the name meanwhile: it is not this object's to remove.
        WriteFile(folder.File("other"), "someone else's\n");
        ASSERT_EQ(::rename(folder.File("other").c_str(), path.c_str()), 0);
    }
    EXPECT_EQ(ReadFile(path), "someone else's\n");

    TemporarySetupFile missing(folder.File("no-such-folder/"), "Setup.wpx", "x");
    EXPECT_FALSE(missing.Created());
    EXPECT_NE(missing.status().problem().message.find(folder.File("no-such-folder/Setup.wpx") + ": No such file or directory"),
              std::string::npos)
        << missing.status().problem().message;
}

// Stopped by a signal the host may catch, a process removes its temporary setup file and then
// meets the signal as it would have without one: its own handler, or the default action.
TEST(TemporarySetupFile, IsRemovedWhenTheProcessIsStoppedBySignal)
{
    ScratchFolder folder;
    const std::string path = folder.File("Setup.wpx");
    static volatile sig_atomic_t s_hostSaw = 0;
    for (const bool hostHandler : {false, true}) {
        SCOPED_TRACE(hostHandler ? "the host handles the signal" : "the default action");
        const pid_t child = ::fork();
        if (child == 0) {
            if (hostHandler)
                std::signal(SIGINT, [](int) { s_hostSaw = 1; });
            else
                std::signal(SIGINT, SIG_DFL); // the test may run where interrupts are ignored
            TemporarySetupFile file(folder.Path() + "/", "Setup.wpx", "x");
            ::raise(SIGINT);
            ::_exit(file.Created() && s_hostSaw == 1 && ::access(path.c_str(), F_OK) != 0 ? 7 : 8);
        }
        int status = 0;
        ASSERT_EQ(::waitpid(child, &status, 0), child);
        if (hostHandler) {
            EXPECT_TRUE(WIFEXITED(status) && WEXITSTATUS(status) == 7) << status;
        } else {
            EXPECT_TRUE(WIFSIGNALED(status) && WTERMSIG(status) == SIGINT) << status;
        }
        EXPECT_EQ(::access(path.c_str(), F_OK), -1);
    }
}

// Runs with a recording engine program in a private temporary folder.
class EngineRun : public testing::Test {
protected:
    EngineRun()
        : m_engineEnv("VELMORA_ENGINE", WriteRecordingEngine(m_scratch)), m_tmpEnv("TMPDIR", m_scratch.Path()),
          m_ui(m_scripted)
    {
    }

    bool EngineStarted() const { return !ReadFile(m_scratch.File("args.txt")).empty(); }

    ScratchFolder m_scratch;
    ScopedEnv m_engineEnv;
    ScopedEnv m_tmpEnv;
    ui::ScriptedUserInterface m_scripted;
    ui::ScopedUserInterface m_ui;
};

TEST_F(EngineRun, HandsTheEngineATemporaryVelmoraFileAndDeletesIt)
{
    CEngine engine;
    engine.SetSetupName("My setup");
    engine.m_nInputFormat = 2;
    engine.m_strInputFile = "/in/data.csv";
    engine.m_strTemplateName = "/t/a.xml";
    engine.m_arrItems = {1, 3};
    engine.m_nOutputFormat = 3;
    engine.m_strOutputFile = "/out/data.xlsx";

    EXPECT_EQ(engine.RunTool(1), 0);

    std::string path = m_scratch.File("My_setup.wpx");
    EXPECT_EQ(ReadFile(m_scratch.File("args.txt")), path + "\n1\n");
    EXPECT_EQ(access(path.c_str(), F_OK), -1) << "the temporary file is deleted after the run";

    WPXHANDLE copy = nullptr;
    std::string error;
    ASSERT_EQ(wpxRead(m_scratch.File("setup-copy.wpx"), &copy, &error), 1) << error;
    WPXHANDLE target = wpxTargetByNum(copy, 1);
    EXPECT_EQ(wpxGetName(target), "VELMORA");
    EXPECT_EQ(wpxTargetByNum(copy, 2), nullptr);
    const char* sections[] = {"INPUT", "TEMPLATE", "OUTPUT"};
    for (int n = 1; n <= 3; ++n)
        EXPECT_EQ(wpxGetName(wpxSectionByNum(target, n)), sections[n - 1]);
    EXPECT_EQ(wpxSectionByNum(target, 4), nullptr) << "no Setup section in the engine's file";
    EXPECT_EQ(wpxKeywordByNameNum(target, "Name", 1), nullptr);
    CString text;
    wpxGetParam(wpxSectionByNameNum(target, "INPUT", 1), "Bridge", &text, 1, 1);
    EXPECT_EQ(text, "ASCII Timeseries Bridge (General)");
    wpxGetParamFilename(wpxSectionByNameNum(target, "OUTPUT", 1), "File_name", &text, 1, 1);
    EXPECT_EQ(text, "/out/data.xlsx");
    EXPECT_EQ(wpxGetNoParams(wpxKeywordByNameNum(wpxSectionByNameNum(target, "TEMPLATE", 1), "Items", 1)), 2);
    wpxClose(&copy);
}

struct OutcomeCase {
    const char* name;
    int engineExit;
    int inputType;
    const char* expectedText;
};

class EngineRunOutcome : public EngineRun, public testing::WithParamInterface<OutcomeCase> {};

TEST_P(EngineRunOutcome, ShowsOnePlainBoxCaptionedRunEngine)
{
    const OutcomeCase& c = GetParam();
    ScopedEnv exitCode("ENGINE_TEST_EXIT", std::to_string(c.engineExit));
    CEngine engine;
    engine.m_nInputType = c.inputType;
    EXPECT_EQ(engine.RunTool(0), c.engineExit);
    ASSERT_EQ(m_scripted.boxes.size(), 1u);
    EXPECT_EQ(m_scripted.boxes[0].text, c.expectedText);
    EXPECT_EQ(m_scripted.boxes[0].caption, "Run Engine");
    EXPECT_EQ(m_scripted.boxes[0].type, ui::MB_OK);
}

TEST_P(EngineRunOutcome, SilentShowsNothingButReturnsTheSameResult)
{
    const OutcomeCase& c = GetParam();
    ScopedEnv exitCode("ENGINE_TEST_EXIT", std::to_string(c.engineExit));
    CEngine engine;
    engine.m_nInputType = c.inputType;
    EXPECT_EQ(engine.RunTool(1), c.engineExit);
    EXPECT_TRUE(m_scripted.boxes.empty());
}

INSTANTIATE_TEST_SUITE_P(
    Cases, EngineRunOutcome,
    testing::Values(OutcomeCase{"SingleOk", 0, 1, "Status: OK"}, OutcomeCase{"FolderOk", 0, 2, "Status: OK"},
                    OutcomeCase{"SingleFails", 3, 1, "Error running engine."},
                    OutcomeCase{"FolderFails", 1, 2,
                                "Conversion complete. Some files are skipped because they do not match the template."},
                    OutcomeCase{"OtherTypeFails", 2, 0,
                                "Conversion complete. Some files are skipped because they do not match the template."}),
    [](const testing::TestParamInfo<OutcomeCase>& param) { return param.param.name; });

TEST_F(EngineRun, FailedVerificationLaunchesNothing)
{
    CEngine engine;
    engine.SetLogFileDir(m_scratch.File("no-such-folder/log.txt"));
    int result = engine.RunTool(1);
    EXPECT_NE(result, 0);
    EXPECT_FALSE(EngineStarted());
    EXPECT_TRUE(m_scripted.boxes.empty());

    EXPECT_EQ(engine.RunTool(0), result);
    ASSERT_EQ(m_scripted.boxes.size(), 1u);
    EXPECT_EQ(m_scripted.boxes[0].text, "Error running engine.");
}

TEST_F(EngineRun, ANameAlreadyTakenIsLeftAloneAndANumberedOneUsed)
{
    WriteFile(m_scratch.File("target.txt"), "not a setup\n");
    ASSERT_EQ(::symlink(m_scratch.File("target.txt").c_str(), m_scratch.File("Taken.wpx").c_str()), 0);
    WriteFile(m_scratch.File("Taken-1.wpx"), "another run's setup\n");
    CEngine engine;
    engine.SetSetupName("Taken");
    EXPECT_EQ(engine.RunTool(1), 0);
    EXPECT_EQ(ReadFile(m_scratch.File("args.txt")), m_scratch.File("Taken-2.wpx") + "\n1\n");
    EXPECT_NE(ReadFile(m_scratch.File("setup-copy.wpx")).find("target \"VELMORA\""), std::string::npos);
    EXPECT_EQ(ReadFile(m_scratch.File("target.txt")), "not a setup\n");
    EXPECT_EQ(ReadFile(m_scratch.File("Taken-1.wpx")), "another run's setup\n");
    EXPECT_EQ(::access(m_scratch.File("Taken-2.wpx").c_str(), F_OK), -1);
}

TEST_F(EngineRun, NoEngineStartsWhenTheSetupFileCannotBeWritten)
{
    ScopedEnv missingTmp("TMPDIR", m_scratch.File("no-such-folder"));
    CEngine engine;
    EXPECT_NE(engine.RunTool(1), 0);
    EXPECT_FALSE(EngineStarted());
}

TEST_F(EngineRun, MissingEngineProgramIsAFailure)
{
    ScopedEnv engineEnv("VELMORA_ENGINE", m_scratch.File("not-there"));
    CEngine engine;
    engine.SetSetupName("gone");
    EXPECT_NE(engine.RunTool(1), 0);
    EXPECT_EQ(access(m_scratch.File("gone.wpx").c_str(), F_OK), -1);
}

TEST_F(EngineRun, TemporaryFolderTooLongForTheBufferFallsBackToTheCurrentFolder)
{
    ScopedEnv longTmp("TMPDIR", "/" + std::string(300, 'x'));
    char previous[PATH_MAX];
    ASSERT_NE(getcwd(previous, sizeof previous), nullptr);
    ASSERT_EQ(chdir(m_scratch.Path().c_str()), 0);
    CEngine engine;
    engine.SetSetupName("here");
    int result = engine.RunTool(1);
    ASSERT_EQ(chdir(previous), 0);
    EXPECT_EQ(result, 0);
    EXPECT_EQ(ReadFile(m_scratch.File("args.txt")), "here.wpx\n1\n");
    EXPECT_EQ(access(m_scratch.File("here.wpx").c_str(), F_OK), -1);
}

} // namespace
