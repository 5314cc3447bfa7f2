// BridgeAccepts, FindMatchingFile, VerifyTemplate and VerifyOutput, with a recording bridge component
// in place of the real one so that what the engine asks it is visible.
#include "tests/engine/CheckTestSupport.h"

#include "engine/Engine.h"
#include "resources/StringTable.h"

#include <gtest/gtest.h>

#include <fstream>
#include <sys/stat.h>
#include <sys/wait.h>
#include <unistd.h>

using checktest::RecordingBridge;
using checktest::ScopedEnv;
using checktest::ScratchFolder;

namespace {

constexpr short kScanTrue = static_cast<short>(65535);

class WithRecordingBridge : public testing::Test {
protected:
    RecordingBridge recorder;
    bridge::ScopedComponentFactory factory{recorder.Factory()};
    ScratchFolder scratch;
    CEngine engine;
};

} // namespace

TEST_F(WithRecordingBridge, BridgeAcceptsPassesItsInputsInOrderAndWantsAllBitsSet)
{
    EXPECT_EQ(engine.BridgeAccepts("/d/rain.txt", "/t/rain.xml", 2, 0), 1);
    ASSERT_EQ(recorder.calls.size(), 1u);
    const checktest::BridgeCall& call = recorder.calls[0];
    EXPECT_EQ(call.order, (std::vector<std::string>{"name", "parameters", "file", "scan", "verdict"}));
    EXPECT_EQ(call.name, "ASCII Timeseries Bridge (General)");
    EXPECT_EQ(call.parameters, "TemplateFilePath=/t/rain.xml");
    EXPECT_EQ(call.file, "/d/rain.txt");
    EXPECT_EQ(call.folderScan, 0);

    for (unsigned short verdict : {0, 1, 0x7fff, 0xfffe}) {
        recorder.verdict = [verdict](const checktest::BridgeCall&) { return verdict; };
        EXPECT_EQ(engine.BridgeAccepts("/d/rain.txt", "/t/rain.xml", 2, 0), 0) << verdict;
    }
}

TEST_F(WithRecordingBridge, BridgeAcceptsNamesTheBridgeOfTheFormat)
{
    const char* expected[] = {"", "rbx Timeseries Bridge", "ASCII Timeseries Bridge (General)",
                              "Excel Timeseries Bridge", ""};
    for (int format = 0; format <= 4; ++format) {
        engine.BridgeAccepts("f", "t", format, kScanTrue);
        EXPECT_EQ(recorder.calls.back().name, expected[format]) << format;
        EXPECT_EQ(recorder.calls.back().folderScan, kScanTrue);
    }
}

TEST_F(WithRecordingBridge, BridgeAcceptsIsFalseWithoutFileTemplateBridgeObjectOrVerdict)
{
    EXPECT_EQ(engine.BridgeAccepts("", "/t.xml", 2, 0), 0);
    EXPECT_EQ(engine.BridgeAccepts("/f.txt", "", 2, 0), 0);
    EXPECT_TRUE(recorder.calls.empty()) << "no bridge object is asked for without file and template";

    recorder.noBridgeObject = true;
    EXPECT_EQ(engine.BridgeAccepts("/f.txt", "/t.xml", 2, 0), 0);
    recorder.noBridgeObject = false;

    recorder.throwOnVerdict = true;
    EXPECT_EQ(engine.BridgeAccepts("/f.txt", "/t.xml", 2, 0), 0);
}

TEST(BridgeAccepts, IsFalseWhenTheComponentCannotBeCreated)
{
    bridge::ScopedComponentFactory absent{bridge::ComponentFactory()};
    CEngine engine;
    EXPECT_EQ(engine.BridgeAccepts("/f.txt", "/t.xml", 2, 0), 0);
}

TEST_F(WithRecordingBridge, FindMatchingFileWithoutTemplateNeverConsultsTheBridge)
{
    scratch.Write("a.dat", "x");
    const std::string only = scratch.Write("b.txt", "x");
    CString match = "stale";
    EXPECT_EQ(engine.FindMatchingFile(scratch.Path(), match, 2, ""), 1);
    EXPECT_EQ(match, only);
    EXPECT_EQ(recorder.componentsCreated, 0);
}

TEST_F(WithRecordingBridge, FindMatchingFileTakesTheFileTheBridgeAcceptsInAFolderScan)
{
    scratch.Write("a.txt", "x");
    const std::string fitting = scratch.Write("b.txt", "x");
    scratch.Write("c.txt", "x");
    scratch.Write("d.xls", "x");
    recorder.verdict = [&](const checktest::BridgeCall& call) {
        return call.file == fitting ? bridge::kVerdictTrue : bridge::kVerdictFalse;
    };
    CString match;
    EXPECT_EQ(engine.FindMatchingFile(scratch.Path() + "/", match, 2, "/t.xml"), 1);
    EXPECT_EQ(match, fitting);
    for (const auto& call : recorder.calls) {
        EXPECT_EQ(call.folderScan, kScanTrue);
        EXPECT_EQ(call.parameters, "TemplateFilePath=/t.xml");
        EXPECT_NE(call.file, scratch.File("d.xls")) << "files with a refused extension never reach the bridge";
    }

    recorder.verdict = [](const checktest::BridgeCall&) { return bridge::kVerdictFalse; };
    match = "stale";
    EXPECT_EQ(engine.FindMatchingFile(scratch.Path(), match, 2, "/t.xml"), 0);
    EXPECT_EQ(match, "");
}

TEST_F(WithRecordingBridge, FindMatchingFileSkipsHiddenUnexaminableAndFolderEntries)
{
    scratch.Write(".hidden.txt", "x");
    scratch.MakeFolder("folder.txt");
    ASSERT_EQ(::symlink((scratch.File("gone.txt")).c_str(), (scratch.File("dangling.txt")).c_str()), 0);
    CString match = "stale";
    EXPECT_EQ(engine.FindMatchingFile(scratch.Path(), match, 2, ""), 0);
    EXPECT_EQ(match, "");
    EXPECT_EQ(engine.FindMatchingFile(scratch.Path(), match, 2, "/t.xml"), 0);
    EXPECT_TRUE(recorder.calls.empty());
}

// Under an account that reads every file, the check runs in a child process with a plain user's rights.
TEST(FindMatchingFile, SkipsReadProtectedFiles)
{
    ScratchFolder scratch;
    ::chmod(scratch.Path().c_str(), 0755);
    const std::string locked = scratch.MakeFolder("locked");
    const std::string open = scratch.MakeFolder("open");
    ::chmod(locked.c_str(), 0755);
    ::chmod(open.c_str(), 0755);
    const std::string lockedFile = locked + "/a.txt";
    const std::string openFile = open + "/a.txt";
    std::ofstream(lockedFile) << "x";
    std::ofstream(openFile) << "x";
    ::chmod(lockedFile.c_str(), 0);
    ::chmod(openFile.c_str(), 0644);

    auto matches = [](const std::string& folder) {
        CEngine engine;
        CString match;
        return engine.FindMatchingFile(folder, match, 2, "");
    };
    if (::access(lockedFile.c_str(), R_OK) != 0) {
        EXPECT_EQ(matches(locked), 0);
        EXPECT_EQ(matches(open), 1);
        return;
    }
    const pid_t child = ::fork();
    ASSERT_NE(child, -1);
    if (child == 0) {
        const bool dropped = ::setgid(65534) == 0 && ::setuid(65534) == 0;
        ::_exit(!dropped ? 3 : (matches(locked) == 0 && matches(open) == 1) ? 0 : 1);
    }
    int status = 0;
    ::waitpid(child, &status, 0);
    ASSERT_TRUE(WIFEXITED(status));
    if (WEXITSTATUS(status) == 3)
        GTEST_SKIP() << "cannot take a plain user's rights here";
    EXPECT_EQ(WEXITSTATUS(status), 0) << "a read-protected file was taken, or a readable one was not";
}

TEST(FindMatchingFile, AFolderThatCannotBeListedHasNoMatch)
{
    CEngine engine;
    CString match = "stale";
    EXPECT_EQ(engine.FindMatchingFile("/no/such/folder", match, 2, ""), 0);
    EXPECT_EQ(match, "");
}

TEST_F(WithRecordingBridge, VerifyTemplateOptionThreeAlwaysPassesAndAboveThreeAlwaysFails)
{
    CString message;
    EXPECT_EQ(engine.VerifyTemplate(3, "", message), 1);
    EXPECT_EQ(engine.VerifyTemplate(3, "/no/such/template.xml", message), 1);
    EXPECT_EQ(engine.VerifyTemplate(4, scratch.Write("t.xml", "x"), message), 0);
    EXPECT_EQ(message, "");
    EXPECT_TRUE(recorder.calls.empty());
}

TEST_F(WithRecordingBridge, VerifyTemplateRefusesAnInvalidTemplatePath)
{
    CString message;
    EXPECT_EQ(engine.VerifyTemplate(1, "/no/such/folder/t.xml", message), 0);
    EXPECT_EQ(message, res::LoadString(res::IDS_FILE_INVALID));
    EXPECT_TRUE(recorder.calls.empty());
}

TEST_F(WithRecordingBridge, VerifyTemplateOfASingleFileAsksTheBridgeAndBindsThePreviewFile)
{
    const std::string data = scratch.Write("rain.txt", "x");
    const std::string templ = scratch.Write("rain.xml", "x");
    engine.SetInput(1, 2, data, "");
    CString message;
    recorder.verdict = [](const checktest::BridgeCall&) { return bridge::kVerdictFalse; };
    EXPECT_EQ(engine.VerifyTemplate(1, templ, message), 0);
    EXPECT_EQ(message, "") << "a single file the bridge rejects gives no message";
    EXPECT_EQ(engine.m_strPreviewFile, "");

    recorder.verdict = [](const checktest::BridgeCall&) { return bridge::kVerdictTrue; };
    EXPECT_EQ(engine.VerifyTemplate(2, templ, message), 1);
    EXPECT_EQ(recorder.calls.back().folderScan, 0);
    EXPECT_EQ(recorder.calls.back().file, data);
    EXPECT_EQ(engine.m_strPreviewFile, data);
    EXPECT_EQ(engine.m_pParser->m_strFile, data);
}

TEST_F(WithRecordingBridge, VerifyTemplateOfAFolderReportsNoMatchOrBindsTheMatch)
{
    const std::string folder = scratch.MakeFolder("in");
    const std::string templ = scratch.Write("rain.xml", "x");
    const std::string data = folder + "/rain.csv";
    std::ofstream(data) << "x";
    engine.SetInput(2, 2, "", folder);
    CString message;
    recorder.verdict = [](const checktest::BridgeCall&) { return bridge::kVerdictFalse; };
    EXPECT_EQ(engine.VerifyTemplate(1, templ, message), 0);
    EXPECT_EQ(message, res::LoadString(res::IDS_TEMPLATE_NO_MATCH));

    recorder.verdict = [](const checktest::BridgeCall&) { return bridge::kVerdictTrue; };
    message.clear();
    EXPECT_EQ(engine.VerifyTemplate(1, templ, message), 1);
    EXPECT_EQ(engine.m_strPreviewFile, data);
    EXPECT_EQ(message, "");

    engine.m_nInputType = 7;
    EXPECT_EQ(engine.VerifyTemplate(1, templ, message), 0);
}

struct OutputCase {
    int inputType;
    int format;
    const char* file;   // relative to the scratch folder; "" for none
    const char* folder; // relative to the scratch folder; "" for none
    int expected;
    int messageId; // 0: no message
};

class VerifyOutputTable : public testing::TestWithParam<OutputCase> {};

TEST_P(VerifyOutputTable, JudgesFileOrFolderByTheInputType)
{
    ScopedEnv version("VELMORA_SPREADSHEET_VERSION", "16.0");
    ScratchFolder scratch;
    scratch.MakeFolder("out");
    const OutputCase& c = GetParam();
    auto under = [&](const char* name) { return *name ? scratch.File(name) : std::string(); };
    CEngine engine;
    engine.m_nInputType = c.inputType;
    CString message;
    EXPECT_EQ(engine.VerifyOutput(c.format, under(c.file), under(c.folder), "title", message), c.expected);
    EXPECT_EQ(message, c.messageId ? res::LoadString(c.messageId) : CString());
}

INSTANTIATE_TEST_SUITE_P(
    Table, VerifyOutputTable,
    testing::Values(OutputCase{1, 0, "out/a.txt", "", 0, 0}, OutputCase{1, 4, "out/a.txt", "", 0, 0},
                    OutputCase{1, 2, "out/a.txt", "", 1, 0}, OutputCase{1, 1, "out/a.rbx0", "", 1, 0},
                    OutputCase{1, 3, "out/a.xlsx", "", 1, 0}, OutputCase{1, 1, "out/a.txt", "", 0, res::IDS_FILE_INVALID},
                    OutputCase{1, 2, "missing/a.txt", "", 0, res::IDS_FILE_INVALID},
                    OutputCase{1, 2, "", "out", 0, res::IDS_FILE_INVALID}, OutputCase{2, 2, "", "out", 1, 0},
                    OutputCase{2, 2, "out/a.txt", "missing", 0, res::IDS_FOLDER_INVALID}));

TEST(VerifyOutput, ExcelOutputNeedsASuitableSpreadsheet)
{
    ScratchFolder scratch;
    ScopedEnv version("VELMORA_SPREADSHEET_VERSION", "11.0");
    CEngine engine;
    CString message;
    EXPECT_EQ(engine.VerifyOutput(3, scratch.File("a.xls"), "", "", message), 1);
    EXPECT_EQ(engine.VerifyOutput(3, scratch.File("a.xlsx"), "", "", message), 0);
    EXPECT_EQ(message, res::LoadString(res::IDS_FILE_INVALID));
}
