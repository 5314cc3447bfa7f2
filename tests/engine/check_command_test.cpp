// `velmora check DOC` run as a program on stored setups: one verdict line per check, exit status 0
// only when every check passes.
#include "tests/engine/CheckTestSupport.h"

#include "converter/AsciiSeriesWriter.h"
#include "converter/RbxSeriesWriter.h"
#include "resources/StringTable.h"
#include "templates/AsciiSpecification.h"
#include "tests/support/ShellCommand.h"

#include <gtest/gtest.h>

#include <filesystem>

using checktest::ScopedEnv;
using checktest::ScratchFolder;

namespace {

using Outcome = testsupport::ShellRun;

Outcome RunVelmora(const std::string& arguments)
{
    return testsupport::RunShell(std::string(VELMORA_BIN_DIR) + "/velmora " + arguments + " 2>/dev/null");
}

void WriteGauge(converter::SeriesWriter& writer, const std::string& path)
{
    converter::SeriesHeader header;
    header.items = {{"Level", "Water level", "m", "Instantaneous"}};
    ASSERT_TRUE(writer.Begin(path, header, "Gauge").ok());
    for (int step = 0; step < 2; ++step)
        ASSERT_TRUE(writer.Write({1609459200 + 600 * step, {0.5 * step}}).ok());
    ASSERT_TRUE(writer.Finish().ok());
}

struct StoredSetup {
    int type = 1;
    int format = 2;
    std::string file, folder;
    int option = 1;
    std::string templateName;
    int outputFormat = 1;
    std::string outputFile, outputFolder;
};

std::string Document(const StoredSetup& s)
{
    auto quoted = [](const std::string& text) { return "\"" + text + "\""; };
    return "wpx 1\ntarget \"OkaToolbox\"\n section \"Setup\"\n  Name = \"Gauge\"\n  section \"INPUT\"\n"
           "   Type = " + std::to_string(s.type) + "\n   File_format = " + std::to_string(s.format) +
           "\n   File_name = file " + quoted(s.file) + "\n   Folder_name = file " + quoted(s.folder) +
           "\n  end\n  section \"TEMPLATE\"\n   Template_option = " + std::to_string(s.option) +
           "\n   Template_name = file " + quoted(s.templateName) + "\n   Items =\n  end\n"
           "  section \"OUTPUT\"\n   File_format = " + std::to_string(s.outputFormat) +
           "\n   File_name = file " + quoted(s.outputFile) + "\n   Folder_name = file " + quoted(s.outputFolder) +
           "\n   File_title = \"Gauge\"\n  end\n end\nend\nwpx end\n";
}

class CheckCommand : public testing::Test {
protected:
    void SetUp() override
    {
        converter::AsciiSeriesWriter ascii;
        WriteGauge(ascii, gauge);
        converter::RbxSeriesWriter rbx;
        WriteGauge(rbx, gaugeRbx);
        ASSERT_EQ(CAsciiSpecification().Save(fitting), 1);
        CAsciiSpecification comma;
        comma.m_strDelimiter = "Comma";
        ASSERT_EQ(comma.Save(misfit), 1);
        scratch.MakeFolder("out");
        setup.file = gauge;
        setup.templateName = fitting;
        setup.outputFile = scratch.File("out/gauge.rbx0");
    }

    Outcome Check(const StoredSetup& s)
    {
        const std::string doc = scratch.Write("setup.wpx", Document(s));
        return RunVelmora("check " + doc);
    }

    ScratchFolder scratch;
    std::string gauge = scratch.File("gauge.txt");
    std::string gaugeRbx = scratch.File("gauge.rbx0");
    std::string fitting = scratch.File("gauge.xml");
    std::string misfit = scratch.File("comma.xml");
    StoredSetup setup;
};

bool HasLine(const std::string& output, const std::string& start)
{
    return output.find(start) == 0 || output.find("\n" + start) != std::string::npos;
}

} // namespace

TEST_F(CheckCommand, AFittingSingleFileSetupPassesEveryCheck)
{
    const Outcome outcome = Check(setup);
    EXPECT_EQ(outcome.status, 0) << outcome.out;
    for (const char* line : {"PASS input: ", "PASS template: ", "PASS preview: ", "PASS output: "})
        EXPECT_TRUE(HasLine(outcome.out, line)) << line << "\n" << outcome.out;
}

TEST_F(CheckCommand, ATemplateThatDoesNotFitFailsWithTheReason)
{
    setup.templateName = misfit;
    const Outcome outcome = Check(setup);
    EXPECT_EQ(outcome.status, 1);
    EXPECT_TRUE(HasLine(outcome.out, "PASS input: ")) << outcome.out;
    EXPECT_TRUE(HasLine(outcome.out, "FAIL template: " + gauge)) << outcome.out;
    EXPECT_TRUE(HasLine(outcome.out, "FAIL preview: not tried")) << outcome.out;
    EXPECT_TRUE(HasLine(outcome.out, "PASS output: ")) << outcome.out;
}

TEST_F(CheckCommand, AFolderPassesWhenOneOfItsFilesFits)
{
    const std::string folder = scratch.MakeFolder("in");
    std::filesystem::copy_file(gauge, folder + "/gauge.txt");
    setup.type = 2;
    setup.file.clear();
    setup.folder = folder;
    setup.outputFolder = scratch.File("out");
    EXPECT_EQ(Check(setup).status, 0);

    setup.templateName = misfit;
    const Outcome outcome = Check(setup);
    EXPECT_EQ(outcome.status, 1);
    EXPECT_TRUE(HasLine(outcome.out, "FAIL template: " + res::LoadString(res::IDS_TEMPLATE_NO_MATCH) + " (\"" +
                                            misfit + "\")"))
        << outcome.out;

    setup.outputFolder = scratch.File("missing");
    EXPECT_TRUE(HasLine(Check(setup).out,
                        "FAIL output: " + res::LoadString(res::IDS_FOLDER_INVALID) + " (\"" + setup.outputFolder + "\")"));
}

// Every failing output or template check names what it is about after the wizard's own text.
TEST_F(CheckCommand, FailingOutputAndTemplateChecksNameTheirFile)
{
    const std::string notFolder = scratch.Write("plain.txt", "x");
    const struct {
        const char* what;
        std::string outputFile;
        std::string templateName;
        std::string line;
    } cases[] = {
        {"an output of another format", scratch.File("out/gauge.txt"), fitting,
         "FAIL output: " + res::LoadString(res::IDS_FILE_INVALID) + " (\"" + scratch.File("out/gauge.txt") + "\")"},
        {"an output in a missing folder", scratch.File("none/gauge.rbx0"), fitting,
         "FAIL output: " + res::LoadString(res::IDS_FILE_INVALID) + " (\"" + scratch.File("none/gauge.rbx0") + "\")"},
        {"an output in a folder that is a file", notFolder + "/gauge.rbx0", fitting,
         "FAIL output: " + res::LoadString(res::IDS_FILE_INVALID) + " (\"" + notFolder + "/gauge.rbx0\")"},
        {"a template in a missing folder", scratch.File("out/gauge.rbx0"), scratch.File("none/t.xml"),
         "FAIL template: the template \"" + scratch.File("none/t.xml") + "\" does not load"},
    };
    for (const auto& c : cases) {
        SCOPED_TRACE(c.what);
        StoredSetup s = setup;
        s.outputFile = c.outputFile;
        s.templateName = c.templateName;
        const Outcome outcome = Check(s);
        EXPECT_EQ(outcome.status, 1);
        EXPECT_TRUE(HasLine(outcome.out, c.line)) << outcome.out;
    }
}

TEST_F(CheckCommand, InputProblemsUseTheWizardsTexts)
{
    StoredSetup missing = setup;
    missing.file = scratch.File("missing.txt");
    Outcome outcome = Check(missing);
    EXPECT_EQ(outcome.status, 1);
    EXPECT_TRUE(HasLine(outcome.out, "FAIL input: " + res::LoadString(res::IDS_FILE_INVALID))) << outcome.out;
    EXPECT_TRUE(HasLine(outcome.out, "FAIL template: not tried")) << outcome.out;

    ScopedEnv absent("VELMORA_SPREADSHEET", "absent");
    StoredSetup excel = setup;
    excel.format = 3;
    excel.file = scratch.Write("book.xlsx", "x");
    outcome = Check(excel);
    EXPECT_TRUE(HasLine(outcome.out, "FAIL input: " + res::LoadString(res::IDS_EXCEL_MISSING))) << outcome.out;
}

TEST_F(CheckCommand, RbxInputHasNoTemplateCheckAndManualTemplatesAreNotHeldAgainstTheFile)
{
    StoredSetup rbx = setup;
    rbx.format = 1;
    rbx.file = gaugeRbx;
    rbx.templateName.clear();
    Outcome outcome = Check(rbx);
    EXPECT_EQ(outcome.status, 0) << outcome.out;
    EXPECT_EQ(outcome.out.find("template:"), std::string::npos) << outcome.out;

    StoredSetup manual = setup;
    manual.option = 3;
    manual.templateName.clear();
    outcome = Check(manual);
    EXPECT_EQ(outcome.status, 0) << outcome.out;
    EXPECT_TRUE(HasLine(outcome.out, "PASS template: ")) << outcome.out;
}

TEST_F(CheckCommand, ReadsTheEngineFileLayoutToo)
{
    std::string doc = Document(setup);
    const size_t setupStart = doc.find(" section \"Setup\"");
    doc.erase(setupStart, doc.find("  section \"INPUT\"") - setupStart);
    doc.erase(doc.rfind(" end\nend"), 5);
    doc.replace(doc.find("OkaToolbox"), 10, "VELMORA");
    const Outcome outcome = RunVelmora("check " + scratch.Write("engine.wpx", doc));
    EXPECT_EQ(outcome.status, 0) << doc << outcome.out;
    EXPECT_TRUE(HasLine(outcome.out, "PASS template: ")) << outcome.out;
}

TEST_F(CheckCommand, UsageAndUnreadableDocuments)
{
    EXPECT_EQ(RunVelmora("check").status, 2);
    EXPECT_EQ(RunVelmora("check a b").status, 2);
    EXPECT_EQ(RunVelmora("check --frobnicate").status, 2);
    EXPECT_EQ(RunVelmora("check --help").status, 0);
    EXPECT_EQ(RunVelmora("check " + scratch.File("missing.wpx")).status, 1);
    const std::string empty = scratch.Write("empty.wpx", "wpx 1\nwpx end\n");
    EXPECT_EQ(RunVelmora("check " + empty).status, 1);
}
