#include "platform/harbor/HarborEngine.h"
#include "tests/engine/EngineTestSupport.h"

#include <gtest/gtest.h>

#include <sys/stat.h>

namespace {

using namespace enginetest;

TEST(IsValidFileName, AcceptsNamesInExistingFoldersOnly)
{
    ScratchFolder scratch;
    const std::pair<std::string, int> cases[] = {
        {scratch.File("new.txt"), 1},
        {scratch.File("no-folder/new.txt"), 0},
        {scratch.File(""), 0},          // ends in "/"
        {scratch.File("."), 0},
        {scratch.File(".."), 0},
        {"", 0},
        {"relative-in-current-folder.txt", 1},
        {std::string("nul\0inside", 10), 0},
        {"/" + std::string(4096, 'x'), 0},
    };
    for (const auto& [name, valid] : cases)
        EXPECT_EQ(CHarborEngine::IsValidFileName(name), valid) << name.substr(0, 80);
}

TEST(HarborVerify, JudgesTheLogLocation)
{
    ScratchFolder scratch;
    const std::pair<std::string, int> cases[] = {
        {"", 0}, {scratch.Path(), 0}, {scratch.File("run.log"), 0}, {scratch.File("missing/run.log"), 1}};
    for (const auto& [log, expected] : cases) {
        CHarborEngine engine;
        engine.SetLogFileDir(log);
        CString message;
        EXPECT_EQ(engine._Verify(message), expected) << log;
        EXPECT_EQ(message.empty(), expected == 0) << message;
        EXPECT_EQ(engine.RunTool(0), expected) << "the framework's own run only verifies";
    }
}

TEST(HarborEngineProgram, DropsExeAndSearchesPathWhenNothingIsBesideTheModule)
{
    ScratchFolder scratch;
    mkdir(scratch.File("bin").c_str(), 0755);
    std::string program = scratch.File("bin/VelmoraProbeEngine");
    WriteFile(program, "#!/bin/sh\nexit 0\n");
    chmod(program.c_str(), 0755);
    WriteFile(scratch.File("bin/NotExecutable"), "");

    ScopedEnv noOverride("VELMORA_ENGINE", std::nullopt);
    ScopedEnv path("PATH", "/nonexistent:" + scratch.File("bin"));
    EXPECT_EQ(CHarborEngine::FindEngineProgram("VelmoraProbeEngine.exe"), program);
    EXPECT_EQ(CHarborEngine::FindEngineProgram("VelmoraProbeEngine.EXE"), program);
    EXPECT_EQ(CHarborEngine::FindEngineProgram("VelmoraProbeEngine"), program);
    EXPECT_EQ(CHarborEngine::FindEngineProgram("NotExecutable"), "");
    EXPECT_EQ(CHarborEngine::FindEngineProgram(".exe"), "");
    EXPECT_EQ(CHarborEngine::FindEngineProgram(program), program) << "a path is taken as it is";

    ScopedEnv chosen("VELMORA_ENGINE", "/chosen/engine");
    EXPECT_EQ(CHarborEngine::FindEngineProgram("VelmoraProbeEngine.exe"), "/chosen/engine");
}

TEST(HarborEngineProgram, RunEngineWaitsAndReturnsTheExitStatus)
{
    ScratchFolder scratch;
    std::string engine = WriteRecordingEngine(scratch);
    ScopedEnv chosen("VELMORA_ENGINE", engine);
    EXPECT_EQ(CHarborEngine::RunEngine("Velmora.exe", "file with blank.wpx", 1), 0);
    EXPECT_EQ(ReadFile(scratch.File("args.txt")), "file with blank.wpx\n1\n");
    {
        ScopedEnv exitCode("ENGINE_TEST_EXIT", "5");
        EXPECT_EQ(CHarborEngine::RunEngine("Velmora.exe", "x", 1), 5);
    }

    std::string killer = scratch.File("killed.sh");
    WriteFile(killer, "#!/bin/sh\nkill -TERM $$\nexit 0\n");
    chmod(killer.c_str(), 0755);
    ScopedEnv killed("VELMORA_ENGINE", killer);
    EXPECT_NE(CHarborEngine::RunEngine("Velmora.exe", "x", 1), 0) << "death by a signal is a failure";

    ScopedEnv missing("VELMORA_ENGINE", scratch.File("absent"));
    EXPECT_NE(CHarborEngine::RunEngine("Velmora.exe", "x", 1), 0);
}

} // namespace
