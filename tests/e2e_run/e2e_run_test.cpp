// velmora run / summary through the built host program, plug-in and a recording engine program.
#include "platform/wpx/Wpx.h"
#include "tests/support/Files.h"
#include "tests/support/ScratchFile.h"
#include "tests/support/ScratchFolder.h"
#include "tests/support/ShellCommand.h"

#include <gtest/gtest.h>

#include <cstdlib>
#include <cstring>
#include <dlfcn.h>
#include <filesystem>
#include <fstream>
#include <optional>
#include <sstream>
#include <sys/wait.h>
#include <unistd.h>

namespace {

namespace fs = std::filesystem;

const std::string kBin = VELMORA_BIN_DIR;

using testsupport::ReadFile;
using testsupport::WriteFile;

struct Outcome {
    int status = -1;
    std::string out;
    std::string err;
};

class E2eRun : public testing::Test {
protected:
    void SetUp() override
    {
        for (const char* folder : {"tmp", "record", "docs"})
            m_scratch.MakeFolder(folder);
        m_env = {{"VELMORA_ENGINE", RECORDING_ENGINE},
                 {"VELMORA_TEST_RECORD", Path("record")},
                 {"TMPDIR", Path("tmp")},
                 {"VELMORA_TEST_EXIT", "0"}};
    }
    std::string Path(const std::string& name) const { return m_scratch.File(name); }

    // Runs the host program with the test's environment; arguments are passed through the shell
    // quoted, so they must not hold single quotes.
    Outcome Host(const std::string& arguments)
    {
        std::string command;
        for (const auto& [name, value] : m_env)
            command += name + "='" + value + "' ";
        command += "'" + kBin + "/velmora' " + arguments + " >'" + Path("out.txt") + "' 2>'" + Path("err.txt") + "'";
        Outcome outcome;
        outcome.status = testsupport::ShellStatus(command);
        outcome.out = ReadFile(Path("out.txt"));
        outcome.err = ReadFile(Path("err.txt"));
        return outcome;
    }

    bool EngineStarted() const { return fs::exists(Path("record/args.txt")); }

    testsupport::ScratchFolder m_scratch{"e2e_run"};
    std::vector<std::pair<std::string, std::string>> m_env;
};

std::string SetupDocument(int inputType)
{
    return "wpx 1\n"
           "target \"OkaToolbox\"\n"
           "  section \"Setup\"\n"
           "    Name = \"My setup\"\n"
           "    section \"INPUT\"\n"
           "      Type = " + std::to_string(inputType) + "\n"
           "      File_format = 2\n"
           "      Bridge = \"ASCII Timeseries Bridge (General)\"\n"
           "      File_name = file \"data/in.csv\"\n"
           "      Folder_name = file \"\"\n"
           "    end\n"
           "    section \"TEMPLATE\"\n"
           "      Template_option = 1\n"
           "      Template_name = file \"templates/in.xml\"\n"
           "      Items = 0, 2\n"
           "    end\n"
           "    section \"OUTPUT\"\n"
           "      File_format = 1\n"
           "      Bridge = \"rbx Timeseries Bridge\"\n"
           "      File_name = file \"/abs/out.rbx0\"\n"
           "      Folder_name = file \"\"\n"
           "      File_title = \"Flows\"\n"
           "      Log_file = file \"\"\n"
           "    end\n"
           "  end\n"
           "end\n"
           "wpx end\n";
}

TEST_F(E2eRun, RunHandsTheEngineTheSetupInATemporaryFile)
{
    WriteFile(Path("docs/setup.wpx"), SetupDocument(1));
    Outcome outcome = Host("run '" + Path("docs/setup.wpx") + "'");
    EXPECT_EQ(outcome.status, 0) << outcome.err;
    EXPECT_EQ(outcome.err, "Run Engine: Status: OK\n");

    std::string temporary = Path("tmp") + "/My_setup.wpx";
    EXPECT_EQ(ReadFile(Path("record/args.txt")), temporary + "\n1\n");
    EXPECT_FALSE(fs::exists(temporary)) << "the temporary file is gone after the run";

    WPXHANDLE copy = nullptr;
    std::string error;
    ASSERT_EQ(wpxRead(Path("record/setup-copy.wpx"), &copy, &error), 1) << error;
    WPXHANDLE target = wpxTargetByNum(copy, 1);
    EXPECT_EQ(wpxGetName(target), "VELMORA");
    EXPECT_EQ(wpxGetName(wpxSectionByNum(target, 1)), "INPUT");
    EXPECT_EQ(wpxGetName(wpxSectionByNum(target, 2)), "TEMPLATE");
    EXPECT_EQ(wpxGetName(wpxSectionByNum(target, 3)), "OUTPUT");
    EXPECT_EQ(wpxSectionByNum(target, 4), nullptr);
    CString input, templ;
    wpxGetParamFilename(wpxSectionByNameNum(target, "INPUT", 1), "File_name", &input, 1, 1);
    wpxGetParamFilename(wpxSectionByNameNum(target, "TEMPLATE", 1), "Template_name", &templ, 1, 1);
    EXPECT_EQ(input, Path("docs/data/in.csv")) << "relative names are anchored at the host document";
    EXPECT_EQ(templ, Path("docs/templates/in.xml"));
    EXPECT_EQ(wpxGetNoParams(wpxKeywordByNameNum(wpxSectionByNameNum(target, "TEMPLATE", 1), "Items", 1)), 2);
    wpxClose(&copy);
}

struct ResultCase {
    const char* name;
    const char* engineExit;
    int inputType;
    bool silent;
    int hostStatus;
    const char* printed;
};

class E2eRunResult : public E2eRun, public testing::WithParamInterface<ResultCase> {};

TEST_P(E2eRunResult, ExitStatusAndMessageFollowTheEngine)
{
    const ResultCase& c = GetParam();
    m_env.back().second = c.engineExit;
    WriteFile(Path("docs/setup.wpx"), SetupDocument(c.inputType));
    Outcome outcome = Host("run '" + Path("docs/setup.wpx") + "'" + (c.silent ? " --silent" : ""));
    EXPECT_EQ(outcome.status, c.hostStatus);
    EXPECT_EQ(outcome.err, c.printed);
    EXPECT_TRUE(EngineStarted());
}

INSTANTIATE_TEST_SUITE_P(
    Cases, E2eRunResult,
    testing::Values(
        ResultCase{"SingleOk", "0", 1, false, 0, "Run Engine: Status: OK\n"},
        ResultCase{"SingleFails", "4", 1, false, 1, "Run Engine: Error running engine.\n"},
        ResultCase{"FolderFails", "1", 2, false, 1,
                   "Run Engine: Conversion complete. Some files are skipped because they do not match the template.\n"},
        ResultCase{"SilentOk", "0", 1, true, 0, ""}, ResultCase{"SilentFails", "9", 2, true, 1, ""}),
    [](const testing::TestParamInfo<ResultCase>& param) { return param.param.name; });

TEST_F(E2eRun, WithoutOverrideTheEngineProgramBesideThePluginRuns)
{
    m_env.erase(m_env.begin()); // no VELMORA_ENGINE
    m_env.emplace_back("PATH", "/nonexistent");
    WriteFile(Path("docs/setup.wpx"), SetupDocument(1));
    Outcome outcome = Host("run '" + Path("docs/setup.wpx") + "'");
    // The input file does not exist, so the real engine program fails; it names the file it was given.
    EXPECT_EQ(outcome.status, 1);
    EXPECT_NE(outcome.err.find(Path("docs/data/in.csv")), std::string::npos) << outcome.err;
    EXPECT_NE(outcome.err.find("Run Engine: Error running engine.\n"), std::string::npos) << outcome.err;
    EXPECT_FALSE(EngineStarted()) << "the recording stand-in was not used";
}

TEST_F(E2eRun, ShippedExampleConvertsWithTheRealEngineProgram)
{
    // A copy, so the conversion writes nothing into the source tree.
    fs::copy(std::string(VELMORA_SOURCE_DIR) + "/examples", Path("examples"), fs::copy_options::recursive);
    m_env.erase(m_env.begin()); // no VELMORA_ENGINE
    Outcome outcome = Host("run '" + Path("examples/ascii-to-rbx0.wpx") + "'");
    EXPECT_EQ(outcome.status, 0) << outcome.err;
    EXPECT_NE(outcome.err.find("Run Engine: Status: OK\n"), std::string::npos) << outcome.err;
    EXPECT_GT(fs::file_size(Path("examples/river_gauge.converted.rbx0")), 0u);
    EXPECT_TRUE(fs::is_empty(Path("tmp"))) << "the temporary setup file is gone";
}

TEST_F(E2eRun, DamagedOrMissingDocumentIsNamedWithItsLine)
{
    WriteFile(Path("docs/bad.wpx"), "wpx 1\ntarget \"OkaToolbox\"\n  Name = \"unclosed\n");
    Outcome damaged = Host("run '" + Path("docs/bad.wpx") + "'");
    EXPECT_EQ(damaged.status, 1);
    EXPECT_NE(damaged.err.find(Path("docs/bad.wpx") + ":3: "), std::string::npos) << damaged.err;
    EXPECT_NE(damaged.err.find("expected a closing quote"), std::string::npos) << damaged.err;

    Outcome missing = Host("run '" + Path("docs/absent.wpx") + "'");
    EXPECT_EQ(missing.status, 1);
    EXPECT_NE(missing.err.find(Path("docs/absent.wpx")), std::string::npos) << missing.err;
    EXPECT_FALSE(EngineStarted());
}

TEST_F(E2eRun, UsageErrorsAndHelp)
{
    const std::pair<const char*, int> cases[] = {
        {"run", 2}, {"run a.wpx b.wpx", 2}, {"run --loud a.wpx", 2}, {"run --help", 0},
        {"summary", 2}, {"summary --help", 0}, {"summary a b", 2},
    };
    for (const auto& [arguments, status] : cases) {
        Outcome outcome = Host(arguments);
        EXPECT_EQ(outcome.status, status) << arguments << "\n" << outcome.err;
        if (status == 0) {
            EXPECT_NE(outcome.out.find("Usage: velmora"), std::string::npos) << arguments;
        }
    }
}

TEST_F(E2eRun, MissingPluginIsReported)
{
    m_env.emplace_back("VELMORA_PLUGIN", Path("nowhere/libvelmora.so"));
    WriteFile(Path("docs/setup.wpx"), SetupDocument(1));
    Outcome outcome = Host("run '" + Path("docs/setup.wpx") + "'");
    EXPECT_EQ(outcome.status, 1);
    EXPECT_NE(outcome.err.find("cannot load the plug-in"), std::string::npos) << outcome.err;
}

TEST_F(E2eRun, SummaryPrintsTheStoredSetup)
{
    WriteFile(Path("docs/setup.wpx"), SetupDocument(1));
    Outcome outcome = Host("summary '" + Path("docs/setup.wpx") + "'");
    EXPECT_EQ(outcome.status, 0) << outcome.err;
    EXPECT_EQ(outcome.out, "Selected Tool\r\n\tVelmora\r\n\r\nInput Data\r\n\tType: 1\r\n\tFile_format: 2\r\n"
                           "\tBridge: ASCII Timeseries Bridge (General)\r\n\tFile_name: " +
                               Path("docs/data/in.csv") +
                               "\r\n\tFolder_name: \r\n\r\nTEMPLATE\r\n\tTemplate_option: 1\r\n\tTemplate_name: " +
                               Path("docs/templates/in.xml") +
                               "\r\n\tItems: 0,2\r\n\r\nOUTPUT\r\n\tFile_format: 1\r\n"
                               "\tBridge: rbx Timeseries Bridge\r\n\tFile_name: /abs/out.rbx0\r\n\tFolder_name: \r\n"
                               "\tFile_title: Flows\r\n\tLog_file: \r\n");

    WriteFile(Path("docs/empty.wpx"), "wpx 1\nwpx end\n");
    Outcome empty = Host("summary '" + Path("docs/empty.wpx") + "'");
    EXPECT_EQ(empty.status, 1);
    EXPECT_NE(empty.err.find("no setup"), std::string::npos) << empty.err;
}

// The plug-in's exports, called as a host calls them.
class PluginExports : public testing::Test {
protected:
    void SetUp() override
    {
        // As the host does: the plug-in brings Qt, which cannot be unloaded cleanly.
        m_library = dlopen((kBin + "/libvelmora.so").c_str(), RTLD_NOW | RTLD_LOCAL | RTLD_NODELETE);
        ASSERT_NE(m_library, nullptr) << dlerror();
    }
    void TearDown() override
    {
        if (m_library)
            dlclose(m_library);
    }
    template <typename Function>
    Function Export(const char* name)
    {
        auto function = reinterpret_cast<Function>(dlsym(m_library, name));
        EXPECT_NE(function, nullptr) << name;
        return function;
    }
    void* m_library = nullptr;
};

TEST_F(PluginExports, HandleIsKeptAsGivenAndMyFuncAnswersMinusOne)
{
    auto setHandle = Export<void (*)(int)>("SetWpxHandle");
    auto getHandle = Export<int (*)()>("GetWpxHandle");
    auto myFunc = Export<int (*)()>("MyFunc");
    ASSERT_TRUE(setHandle && getHandle && myFunc);
    EXPECT_EQ(getHandle(), 0);
    for (int handle : {7, -5, 0x7fffffff, 0}) {
        setHandle(handle);
        EXPECT_EQ(getHandle(), handle);
        EXPECT_EQ(myFunc(), -1);
    }
    EXPECT_EQ(dlsym(m_library, "ReadSetup"), nullptr) << "only the entry points are exported";
    EXPECT_NE(dlsym(m_library, "ShowSetupGUI"), nullptr);
    EXPECT_EQ(dlsym(m_library, "ShowSetupWizard"), nullptr);
}

TEST_F(PluginExports, LoadWpxDocumentReportsIntoABoundedBuffer)
{
    auto load = Export<int (*)(const char*, char*, int)>("LoadWpxDocument");
    auto close = Export<int (*)(int)>("CloseWpxDocument");
    ASSERT_TRUE(load && close);
    char small[8];
    std::memset(small, 'x', sizeof small);
    EXPECT_EQ(load("/nonexistent/setup.wpx", small, sizeof small), 0);
    EXPECT_EQ(std::string(small), "/nonexi");

    const testsupport::ScratchFile document("e2e_doc", ".wpx", "wpx 1\nwpx end\n");
    int handle = load(document.Path().c_str(), nullptr, 0);
    EXPECT_GT(handle, 0);
    EXPECT_EQ(close(handle), 1);
    EXPECT_EQ(close(handle), 0);
}

} // namespace
