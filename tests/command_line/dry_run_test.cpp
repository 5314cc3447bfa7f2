// The dry run (`Velmora SETUP --dry-run`, `velmora check DOC --all`) on a folder of good files and
// files holding each kind of fault: exactly those faults with their positions, and nothing written.
// Shares (`--shard K/N`): N runs convert every file of a folder exactly once.
#include "tests/command_line/CommandLineSupport.h"
#include "tests/e2e_convert/RunSupport.h"

#include "templates/AsciiSpecification.h"

#include <gtest/gtest.h>

#include <set>

namespace {

using testsupport::ShellQuote;
namespace fs = std::filesystem;

const std::string kHead = "Rainfall[mm]:Accumulated\tWater Level[m]:Instantaneous\nTime\tRain\tLevel\n";

// Each file's rows (Rain, Level) after the two header lines, so data line k is file line k + 2.
const std::map<std::string, std::string> kFiles = {
    {"a_good.txt", "2020/01/01 00:00:00\t0.1\t1\n2020/01/01 00:15:00\t0.2\t1\n2020/01/01 00:30:00\t0.3\t1\n"},
    {"b_value.txt", "2020/01/01 00:00:00\t0.1\t1\n2020/01/01 00:15:00\t0.2\tx\n2020/01/01 00:30:00\t0.3\t1\n"
                    "2020/01/01 00:45:00\t0.3\t1.2.3\n"},
    {"c_gap.txt", "2020/01/01 00:00:00\t0.1\t1\n2020/01/01 00:15:00\t0.2\t1\n2020/01/01 01:00:00\t0.3\t1\n"
                  "2020/01/01 01:15:00\t0.4\t1\n"},
    {"d_repeat.txt", "2020/01/01 00:00:00\t0.1\t1\n2020/01/01 00:15:00\t0.2\t1\n2020/01/01 00:15:00\t0.3\t1\n"
                     "2020/01/01 00:30:00\t0.4\t1\n"},
    {"e_back.txt", "2020/01/01 00:00:00\t0.1\t1\n2020/01/01 00:30:00\t0.2\t1\n2020/01/01 00:15:00\t0.3\t1\n"
                   "2020/01/01 00:45:00\t0.4\t1\n"},
    {"f_accumulated.txt", "2020/01/01 00:00:00\t0.1\t1\n2020/01/01 00:15:00\t0.5\t1\n2020/01/01 00:30:00\t0.2\t1\n"
                          "2020/01/01 00:45:00\t0.4\t1\n"},
};

// What the dry run says of each file, "@" standing for the input folder.
const char* const kReport =
    "ok @/a_good.txt: 3 rows, 2020/01/01 00:00:00 to 2020/01/01 00:30:00, every 15 minutes\n"
    "FAIL @/b_value.txt: 2 rows, 2020/01/01 00:00:00 to 2020/01/01 00:30:00; 2 rows do not read\n"
    "  @/b_value.txt:4:3: rejected: the value 'x' of item 'Level' is not a number\n"
    "  @/b_value.txt:6:3: rejected: the value '1.2.3' of item 'Level' is not a number\n"
    "ok @/c_gap.txt: 4 rows, 2020/01/01 00:00:00 to 2020/01/01 01:15:00, every 15 minutes\n"
    "  @/c_gap.txt:5: 2 missing steps between 2020/01/01 00:15:00 and 2020/01/01 01:00:00\n"
    "FAIL @/d_repeat.txt: 4 rows, 2020/01/01 00:00:00 to 2020/01/01 00:30:00, every 15 minutes; an rbx0 file needs "
    "rising time stamps, and 1 does not rise\n"
    "  @/d_repeat.txt:5: the stamp 2020/01/01 00:15:00 repeats that of line 4\n"
    "FAIL @/e_back.txt: 4 rows, 2020/01/01 00:00:00 to 2020/01/01 00:45:00, every 30 minutes; an rbx0 file needs "
    "rising time stamps, and 1 does not rise\n"
    "  @/e_back.txt:5: the stamp 2020/01/01 00:15:00 comes before 2020/01/01 00:30:00 of line 4\n"
    "ok @/f_accumulated.txt: 4 rows, 2020/01/01 00:00:00 to 2020/01/01 00:45:00, every 15 minutes\n"
    "  @/f_accumulated.txt:5: the accumulated item 'Rain' decreases from 0.5 to 0.2\n"
    "SKIP @/g_shape.txt: the template does not fit: @/g_shape.txt:3: the file has 2 lines; the template's data start "
    "row is past its end\n"
    "dry run: 7 files: 3 would convert, 3 would fail, 1 would be skipped; 2 rejected rows, 1 gap (2 missing steps), 1 "
    "repeated stamp, 1 decreasing stamp, 1 decrease of accumulated items; nothing was written\n";

std::string WithFolder(std::string text, const std::string& folder)
{
    for (size_t at = text.find('@'); at != std::string::npos; at = text.find('@', at + folder.size()))
        text.replace(at, 1, folder);
    return text;
}

class DryRun : public testing::Test {
protected:
    void SetUp() override
    {
        for (const auto& [name, rows] : kFiles)
            testsupport::WriteFile(in + "/" + name, kHead + rows);
        testsupport::WriteFile(in + "/g_shape.txt", "a,b,c\n1,2,3\n");
        ASSERT_EQ(CAsciiSpecification().Save(scratch.File("t.xml")), 1);
        e2e::SetupDoc setup;
        setup.type = 2;
        setup.input = in;
        setup.templateName = scratch.File("t.xml");
        setup.output = out;
        setup.log = scratch.File("run.log");
        testsupport::WriteFile(engineSetup, e2e::EngineDocument(setup));
        testsupport::WriteFile(hostDocument, e2e::HostDocument(setup));
    }

    testsupport::ScratchFolder scratch{"velmora-cli"};
    std::string in = scratch.MakeFolder("in"), out = scratch.MakeFolder("out");
    std::string engineSetup = scratch.File("setup.wpx"), hostDocument = scratch.File("doc.wpx");
};

TEST_F(DryRun, ReportsEachFaultWithItsPositionAndWritesNothing)
{
    const auto before = cli::Snapshot(scratch.Path());
    const testsupport::Outcome outcome = cli::Run("Velmora", ShellQuote(engineSetup) + " --dry-run --threads 3");
    EXPECT_EQ(outcome.status, 1) << outcome.err;
    EXPECT_EQ(outcome.out, WithFolder(kReport, in));
    EXPECT_EQ(outcome.err, "");
    // No output, no part file, no log.
    EXPECT_EQ(cli::Snapshot(scratch.Path()), before);
}

TEST_F(DryRun, CheckAllPrintsTheChecksThenTheSameReport)
{
    const auto before = cli::Snapshot(scratch.Path());
    const testsupport::Outcome outcome = cli::Run("velmora", "check --all " + ShellQuote(hostDocument));
    EXPECT_EQ(outcome.status, 1);
    const size_t report = outcome.out.find("ok " + in);
    ASSERT_NE(report, std::string::npos) << outcome.out;
    EXPECT_EQ(outcome.out.substr(0, report).find("FAIL"), std::string::npos) << "every check passes: " << outcome.out;
    EXPECT_EQ(outcome.out.substr(report), WithFolder(kReport, in));
    EXPECT_EQ(cli::Snapshot(scratch.Path()), before);
}

TEST_F(DryRun, JsonGivesTheSameFindingsToTools)
{
    const testsupport::Outcome outcome = cli::Run("Velmora", ShellQuote(engineSetup) + " --dry-run --json");
    EXPECT_EQ(outcome.status, 1);
    for (const std::string& part :
         {std::string("\"verdict\":\"fails\",\"reason\":\"2 rows do not read\""),
          std::string("\"rejected\":[{\"line\":4,\"column\":3,\"reason\":\"the value 'x' of item 'Level' is not a number\"},"
                      "{\"line\":6,\"column\":3,"),
          std::string("\"gaps\":[{\"line\":5,\"from\":\"2020/01/01 00:15:00\",\"to\":\"2020/01/01 01:00:00\",\"missing\":2,"),
          std::string("\"stampFaults\":[{\"line\":5,\"previousLine\":4,\"stamp\":\"2020/01/01 00:15:00\",\"previous\":"
                      "\"2020/01/01 00:15:00\",\"kind\":\"repeated\"}]"),
          std::string("\"decreases\":[{\"line\":5,\"item\":\"Rain\",\"from\":0.5,\"to\":0.2}]"),
          std::string("\"summary\":{\"files\":7,\"converts\":3,\"fails\":3,\"skipped\":1,\"rejected\":2,\"gaps\":1,"
                      "\"missingSteps\":2,\"repeatedStamps\":1,\"decreasingStamps\":1,\"decreases\":1}}\n")})
        EXPECT_NE(outcome.out.find(part), std::string::npos) << part << "\nin: " << outcome.out;
    const testsupport::Outcome check = cli::Run("velmora", "check --all --json " + ShellQuote(hostDocument));
    EXPECT_EQ(check.out.rfind("{\"checks\":[{\"name\":\"input\",\"passed\":true", 0), 0u) << check.out;
    EXPECT_NE(check.out.find("\"files\":[{\"input\":"), std::string::npos);
}

TEST_F(DryRun, GoodFilesAloneGiveExitStatusZero)
{
    for (const char* faulty : {"b_value.txt", "d_repeat.txt", "e_back.txt", "g_shape.txt"})
        fs::remove(in + "/" + faulty);
    const testsupport::Outcome outcome = cli::Run("Velmora", ShellQuote(engineSetup) + " --dry-run");
    EXPECT_EQ(outcome.status, 0) << outcome.out;
    EXPECT_NE(outcome.out.find("dry run: 3 files: 3 would convert, 0 would fail"), std::string::npos) << outcome.out;
    EXPECT_EQ(cli::Run("velmora", "check --all " + ShellQuote(hostDocument)).status, 0);
}

// The inputs named in the "converted" lines of a log.
std::vector<std::string> ConvertedInputs(const std::string& log)
{
    std::vector<std::string> inputs;
    std::istringstream lines(log);
    for (std::string line; std::getline(lines, line);)
        if (line.rfind("converted ", 0) == 0)
            inputs.push_back(line.substr(10, line.find(" -> ") - 10));
    return inputs;
}

TEST(Shards, NRunsConvertEveryFileOfAFolderExactlyOnce)
{
    testsupport::ScratchFolder scratch("velmora-cli");
    const std::string in = scratch.MakeFolder("in");
    std::set<std::string> all;
    for (int n = 1; n <= 23; ++n) {
        const std::string name = in + "/gauge-" + std::to_string(n) + ".txt";
        testsupport::WriteFile(name, kHead + kFiles.at("a_good.txt"));
        all.insert(name);
    }
    ASSERT_EQ(CAsciiSpecification().Save(scratch.File("t.xml")), 1);
    for (int shares : {1, 2, 3, 7}) {
        SCOPED_TRACE(std::to_string(shares) + " shares");
        const std::string out = scratch.MakeFolder("out" + std::to_string(shares));
        std::multiset<std::string> converted, checked;
        for (int share = 1; share <= shares; ++share) {
            e2e::SetupDoc setup;
            setup.type = 2;
            setup.input = in;
            setup.templateName = scratch.File("t.xml");
            setup.output = out;
            setup.log = scratch.File("run-" + std::to_string(share) + ".log");
            const std::string file = scratch.File("setup.wpx");
            testsupport::WriteFile(file, e2e::EngineDocument(setup));
            const std::string shard = " --shard " + std::to_string(share) + "/" + std::to_string(shares);
            const testsupport::Outcome dry = cli::Run("Velmora", ShellQuote(file) + " --dry-run" + shard);
            EXPECT_EQ(dry.status, 0) << dry.out;
            std::istringstream lines(dry.out);
            for (std::string line; std::getline(lines, line);)
                if (line.rfind("ok ", 0) == 0)
                    checked.insert(line.substr(3, line.find(": ") - 3));
            EXPECT_EQ(cli::Run("Velmora", ShellQuote(file) + " --quiet" + shard).status, 0);
            const std::string log = testsupport::ReadFile(setup.log);
            EXPECT_NE(log.find("; share " + std::to_string(share) + " of " + std::to_string(shares)), std::string::npos);
            for (const std::string& input : ConvertedInputs(log))
                converted.insert(input);
            fs::remove(setup.log);
        }
        EXPECT_EQ(converted, std::multiset<std::string>(all.begin(), all.end()));
        EXPECT_EQ(checked, converted);
        EXPECT_EQ(std::distance(fs::directory_iterator(out), fs::directory_iterator()), 23);
    }
}

TEST(Shards, AShareMustBeOneOfN)
{
    for (const char* shard : {"0/3", "4/3", "1/0", "3", "a/b", "1/2x"}) {
        const testsupport::Outcome outcome = cli::Run("Velmora", std::string("setup.wpx --shard ") + shard);
        EXPECT_EQ(outcome.status, 2) << shard;
        EXPECT_NE(outcome.err.find("--shard needs K/N with 1 <= K <= N"), std::string::npos) << outcome.err;
    }
}

} // namespace
