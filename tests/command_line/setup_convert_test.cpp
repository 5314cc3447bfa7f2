// `velmora convert` and `velmora setup new` + `velmora run` from every input format to every output
// format, a file and a folder, the values read back; and the refusals of the wizard's checks with
// the wizard's messages.
#include "tests/command_line/CommandLineSupport.h"

#include "resources/StringTable.h"

#include <gtest/gtest.h>

namespace {

using testsupport::ShellQuote;
namespace fs = std::filesystem;

struct Conversion {
    std::string input;  // the input file's name
    std::string format; // the output format's name
    std::string output; // the output file's name
};

const Conversion kConversions[] = {
    {"g.csv", "rbx0", "g.rbx0"},   {"g.csv", "ascii", "g.txt"},     {"g.csv", "excel", "g.xlsx"},
    {"g.rbx0", "rbx0", "h.rbx0"},  {"g.rbx0", "ascii", "g.tab"},    {"g.rbx0", "excel", "g.xls"},
    {"g.xlsx", "rbx0", "g.rbx0"},  {"g.xlsx", "ascii", "g.txt"},    {"g.xlsx", "excel", "h.xlsx"},
    {"g.xls", "rbx0", "g.rbx0"},   {"g.xls", "ascii", "g.txt"},     {"g.xls", "excel", "h.xls"},
};

std::string Describe(const Conversion& c) { return c.input + " -> " + c.output; }

// The output a folder run makes of `input`: its name with the format's extension.
std::string FolderOutputName(const Conversion& c)
{
    const std::string stem = fs::path(c.input).stem().string();
    return stem + (c.format == "rbx0" ? ".rbx0" : c.format == "ascii" ? ".txt" : ".xlsx");
}

TEST(Convert, EveryInputFormatToEveryOutputFormatAFileAndAFolder)
{
    for (const Conversion& c : kConversions) {
        SCOPED_TRACE(Describe(c));
        testsupport::ScratchFolder scratch("velmora-cli");
        const std::string in = scratch.MakeFolder("in");
        cli::WriteInput(in + "/" + c.input);
        cli::WriteInput(in + "/second" + fs::path(c.input).extension().string());

        const testsupport::Outcome file = cli::Run("velmora", "convert " + ShellQuote(in + "/" + c.input) + " " + ShellQuote(scratch.File(c.output)));
        ASSERT_EQ(file.status, 0) << file.err;
        EXPECT_EQ(cli::LevelsOf(scratch.File(c.output)), cli::kLevels);
        EXPECT_NE(file.err.find("result: 1 converted, 0 skipped or failed"), std::string::npos) << file.err;

        const std::string out = scratch.MakeFolder("out");
        const testsupport::Outcome folder = cli::Run("velmora", "convert " + ShellQuote(in) + " " + ShellQuote(out) + " --to " + c.format +
                                                            " --threads 2");
        ASSERT_EQ(folder.status, 0) << folder.err;
        EXPECT_EQ(cli::LevelsOf(out + "/" + FolderOutputName(c)), cli::kLevels);
        EXPECT_EQ(cli::LevelsOf(out + "/second" + FolderOutputName(c).substr(1)), cli::kLevels);
        EXPECT_EQ(std::distance(fs::directory_iterator(out), fs::directory_iterator()), 2);
    }
}

TEST(SetupNew, EveryInputFormatToEveryOutputFormatAFileAndAFolderRunsAsTheWizardsDocument)
{
    for (const Conversion& c : kConversions) {
        SCOPED_TRACE(Describe(c));
        testsupport::ScratchFolder scratch("velmora-cli");
        const std::string in = scratch.MakeFolder("in");
        cli::WriteInput(in + "/" + c.input);
        const std::string doc = scratch.File("file.wpx");
        const testsupport::Outcome made = cli::Run("velmora", "setup new " + ShellQuote(doc) + " --input " + ShellQuote(in + "/" + c.input) +
                                                          " --output " + ShellQuote(scratch.File(c.output)) + " --title Gauge");
        ASSERT_EQ(made.status, 0) << made.err;
        // Names inside the document's folder are written relative to it, as after the wizard.
        const std::string text = testsupport::ReadFile(doc);
        EXPECT_NE(text.find("File_name = file \"in/" + c.input + "\""), std::string::npos) << text;
        EXPECT_EQ(c.input == "g.rbx0", !fs::exists(scratch.File("file-template.xml")));
        const testsupport::Outcome run = cli::Run("velmora", "run --silent " + ShellQuote(doc));
        ASSERT_EQ(run.status, 0) << run.err;
        EXPECT_EQ(cli::LevelsOf(scratch.File(c.output)), cli::kLevels);
        EXPECT_EQ(cli::Run("velmora", "check " + ShellQuote(doc)).status, 0);

        const std::string folderDoc = scratch.File("folder.wpx");
        const std::string out = scratch.MakeFolder("out");
        const testsupport::Outcome madeFolder = cli::Run("velmora", "setup new " + ShellQuote(folderDoc) + " --input " + ShellQuote(in) +
                                                                " --output " + ShellQuote(out) + " --output-format " + c.format);
        ASSERT_EQ(madeFolder.status, 0) << madeFolder.err;
        ASSERT_EQ(cli::Run("velmora", "run --silent " + ShellQuote(folderDoc)).status, 0);
        EXPECT_EQ(cli::LevelsOf(out + "/" + FolderOutputName(c)), cli::kLevels);
    }
}

TEST(SetupNew, ItemsAndANamedTemplateAreStoredAsTheWizardStoresThem)
{
    testsupport::ScratchFolder scratch("velmora-cli");
    cli::WriteCsv(scratch.File("g.csv"));
    ASSERT_EQ(cli::Run("velmora", "template guess " + ShellQuote(scratch.File("g.csv")) + " -o " + ShellQuote(scratch.File("t.xml"))).status, 0);
    const std::string doc = scratch.File("s.wpx");
    const testsupport::Outcome made = cli::Run("velmora", "setup new " + ShellQuote(doc) + " --input " + ShellQuote(scratch.File("g.csv")) +
                                                      " --template " + ShellQuote(scratch.File("t.xml")) + " --items 1 --output " +
                                                      ShellQuote(scratch.File("o.rbx0")));
    ASSERT_EQ(made.status, 0) << made.err;
    const std::string text = testsupport::ReadFile(doc);
    EXPECT_NE(text.find("Template_name = file \"t.xml\""), std::string::npos) << text;
    EXPECT_NE(text.find("Items = 1\n"), std::string::npos) << text;
    ASSERT_EQ(cli::Run("velmora", "run --silent " + ShellQuote(doc)).status, 0);
    converter::RbxSeriesReader reader;
    ASSERT_TRUE(reader.Open(scratch.File("o.rbx0")).ok());
    ASSERT_EQ(reader.Header().items.size(), 1u);
    EXPECT_EQ(reader.Header().items[0].name, "Rain");
}

struct Refusal {
    const char* what;
    std::string input, output;
    std::string outputFormat; // --to, --output-format
    std::string options;
    int status;
    std::string message;
};

TEST(SetupNewAndConvert, ChecksRefuseWithTheWizardsMessagesAndWriteNothing)
{
    testsupport::ScratchFolder scratch("velmora-cli");
    const std::string dir = scratch.MakeFolder("d");
    cli::WriteCsv(dir + "/g.csv");
    testsupport::WriteFile(dir + "/odd.txt", "this is\nno time series at all\n");
    const std::string mixed = scratch.MakeFolder("mixed");
    cli::WriteCsv(mixed + "/a.csv");
    cli::WriteRbx0(mixed + "/b.rbx0");
    const std::string empty = scratch.MakeFolder("empty");
    // A new template's layout (tab-delimited, data from line 3) does not fit the file.
    ASSERT_EQ(cli::Run("velmora", "template new --format ascii " + ShellQuote(scratch.File("new.xml"))).status, 0);
    const std::string in = dir + "/g.csv";
    const Refusal refusals[] = {
        {"missing input", scratch.File("none.csv"), scratch.File("o.rbx0"), "", "", 1, res::LoadString(res::IDS_FILE_INVALID)},
        {"text output named .csv", in, scratch.File("o.csv"), "", "", 1, res::LoadString(res::IDS_FILE_NAME_INVALID)},
        {"output in a missing folder", in, scratch.File("no/o.rbx0"), "", "", 1, res::LoadString(res::IDS_FILE_INVALID)},
        {"empty folder", empty, scratch.File("out"), "rbx0", "", 1, res::LoadString(res::IDS_FOLDER_INVALID)},
        {"template that does not fit", in, scratch.File("o.rbx0"), "", "--template " + ShellQuote(scratch.File("new.xml")), 1,
         res::LoadString(res::IDS_START_ROW_NO_DELIMITER)},
        {"no time series to guess from", dir + "/odd.txt", scratch.File("o.rbx0"), "", "", 1, "cannot be read as a time series"},
        {"item beyond the file", in, scratch.File("o.rbx0"), "", "--items 0,7", 2,
         "--items names item 7, but the input has 2 items (0 to 1)"},
        {"folder of two formats", mixed, scratch.File("out"), "rbx0", "", 2,
         "holds rbx0, ASCII files; name the one to convert with --format"},
        {"folder output without its format", dir, scratch.File("out"), "", "", 2, "is a folder; name its format with"},
        {"unknown output extension", in, scratch.File("o.dat"), "", "", 2, "names no output format"},
        {"unknown format name", in, scratch.File("o.rbx0"), "", "--format csv", 2, "takes rbx0, ascii or excel"},
        {"bad item list", in, scratch.File("o.rbx0"), "", "--items 1,,2", 2, "--items takes positions"},
    };
    for (const Refusal& refusal : refusals) {
        SCOPED_TRACE(refusal.what);
        const auto before = cli::Snapshot(scratch.Path());
        const std::string format = refusal.outputFormat.empty() ? "" : " " + refusal.outputFormat;
        const testsupport::Outcome converted =
            cli::Run("velmora", "convert " + ShellQuote(refusal.input) + " " + ShellQuote(refusal.output) + " " + refusal.options +
                                    (format.empty() ? "" : " --to" + format));
        EXPECT_EQ(converted.status, refusal.status) << converted.err;
        EXPECT_EQ(converted.err.rfind("velmora convert: ", 0), 0u) << converted.err;
        EXPECT_NE(converted.err.find(refusal.message), std::string::npos) << converted.err;

        const testsupport::Outcome made = cli::Run("velmora", "setup new " + ShellQuote(scratch.File("s.wpx")) + " --input " +
                                                          ShellQuote(refusal.input) + " --output " + ShellQuote(refusal.output) + " " +
                                                          refusal.options + (format.empty() ? "" : " --output-format" + format));
        EXPECT_EQ(made.status, refusal.status) << made.err;
        EXPECT_EQ(made.err.rfind("velmora setup: ", 0), 0u) << made.err;
        EXPECT_NE(made.err.find(refusal.message), std::string::npos) << made.err;
        EXPECT_EQ(cli::Snapshot(scratch.Path()), before) << "a refused setup wrote something";
    }
}

TEST(SetupNewAndConvert, UsageMistakesAreTold)
{
    EXPECT_EQ(cli::Run("velmora", "convert onlyone").status, 2);
    EXPECT_EQ(cli::Run("velmora", "convert a.csv b.rbx0 c.rbx0").status, 2);
    EXPECT_EQ(cli::Run("velmora", "convert a.csv b.rbx0 --threads 0").status, 2);
    EXPECT_EQ(cli::Run("velmora", "convert a.csv b.rbx0 --template t.xml --explain").status, 2);
    EXPECT_EQ(cli::Run("velmora", "setup old d.wpx").status, 2);
    EXPECT_EQ(cli::Run("velmora", "setup new d.wpx --input a.csv").status, 2);
    EXPECT_EQ(cli::Run("velmora", "setup new d.wpx --input a.csv --output b.rbx0 --guess --template t.xml").status, 2);
    const testsupport::Outcome help = cli::Run("velmora", "convert --help");
    EXPECT_EQ(help.status, 0);
    EXPECT_NE(help.out.find("Usage: velmora convert IN OUT"), std::string::npos);
}

TEST(Convert, ExplainShowsTheGuessBeforeTheRun)
{
    testsupport::ScratchFolder scratch("velmora-cli");
    cli::WriteCsv(scratch.File("g.csv"));
    const testsupport::Outcome outcome = cli::Run("velmora", "convert --explain " + ShellQuote(scratch.File("g.csv")) + " " + ShellQuote(scratch.File("g.rbx0")));
    ASSERT_EQ(outcome.status, 0) << outcome.err;
    EXPECT_NE(outcome.out.find("Delimiter = Semi Colon"), std::string::npos) << outcome.out;
    EXPECT_NE(outcome.out.find("because:"), std::string::npos) << outcome.out;
    // The guessed template lived in the temporary folder for the run only.
    const size_t named = outcome.err.find("; template ");
    ASSERT_NE(named, std::string::npos) << outcome.err;
    const std::string templatePath = outcome.err.substr(named + 11, outcome.err.find(';', named + 1) - named - 11);
    EXPECT_NE(templatePath.find("velmora-convert-"), std::string::npos) << templatePath;
    EXPECT_FALSE(fs::exists(templatePath));
}

} // namespace
