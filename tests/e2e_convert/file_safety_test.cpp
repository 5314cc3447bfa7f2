// Nothing but the outputs the user named is ever written, replaced or removed, whatever the names,
// links, special files and interruptions around a run. Every case runs the built programs on files
// in a scratch folder and compares fingerprints of the inputs, template, setup and log.
#include "tests/e2e_convert/RunSupport.h"

#include "templates/AsciiSpecification.h"

#include <algorithm>
#include <chrono>
#include <csignal>
#include <cstring>
#include <functional>

#include <sys/prctl.h>
#include <sys/sysmacros.h>

using namespace e2e;

namespace {

std::vector<std::string> Entries(const fs::path& folder)
{
    std::vector<std::string> names;
    for (const auto& entry : fs::directory_iterator(folder))
        names.push_back(entry.path().filename().string());
    std::sort(names.begin(), names.end());
    return names;
}

std::vector<std::string> Lines(const std::string& text)
{
    std::vector<std::string> lines;
    std::istringstream in(text);
    for (std::string line; std::getline(in, line);)
        lines.push_back(line);
    return lines;
}

bool HasLineStarting(const std::string& text, const std::string& start)
{
    for (const std::string& line : Lines(text))
        if (line.rfind(start, 0) == 0)
            return true;
    return false;
}

// The last line of `text` that starts with `start`, or empty.
std::string LineStarting(const std::string& text, const std::string& start)
{
    std::string found;
    for (const std::string& line : Lines(text))
        if (line.rfind(start, 0) == 0)
            found = line;
    return found;
}

class FileSafety : public testing::Test {
protected:
    // A single-file setup converting gauge.txt to rbx0, logging to run.log.
    SetupDoc SingleFile(const std::string& output) const
    {
        SetupDoc setup;
        setup.input = gauge;
        setup.templateName = templ;
        setup.output = output;
        setup.log = log;
        return setup;
    }

    RunFolder folder;
    std::string gauge = folder.Write("gauge.txt", kSample);
    std::string templ = SaveTemplate(folder.Path("gauge.xml"));
    std::string log = folder.Write("run.log", "an earlier run\n");

private:
    static std::string SaveTemplate(const std::string& path)
    {
        CAsciiSpecification().Save(path);
        return path;
    }
};

TEST_F(FileSafety, TheTemporarySetupFileIsOnlyEverItsOwnInsideTheTemporaryFolder)
{
    const std::string notes = folder.Write("victim/notes.txt", "my notes\n");
    const struct {
        const char* what;
        std::string setupName;
        std::string planted; // what already stands at tmp/Gauge.wpx
    } cases[] = {
        {"a name that climbs out of the temporary folder", std::string("../victim/notes.txt") + '\0', ""},
        {"a link planted at the setup's file name", "Gauge", "link"},
        {"the name taken by another run", "Gauge", "file"},
        {"a name with blanks", "Gauge", ""},
    };
    for (const auto& c : cases) {
        SCOPED_TRACE(c.what);
        fs::remove_all(folder.Path("tmp"));
        folder.MakeFolder("tmp");
        const std::string planted = folder.Path("tmp/Gauge.wpx");
        if (c.planted == "link")
            fs::create_symlink(notes, planted);
        else if (c.planted == "file")
            WriteFile(planted, "another run's setup\n");
        const std::string output = folder.Path("out.rbx0");
        fs::remove(output);
        SetupDoc setup = SingleFile(output);
        setup.name = c.setupName;
        const std::string doc = folder.Write("setup.wpx", HostDocument(setup));
        Untouched untouched;
        for (const std::string& path : {notes, gauge, templ, doc, planted})
            untouched.Add(path);
        untouched.AddLog(log);

        const Outcome outcome = folder.Host(doc);
        EXPECT_EQ(outcome.status, 0) << outcome.err << ReadFile(log);
        EXPECT_TRUE(fs::exists(output)) << "the run converted its own setup";
        untouched.Expect();
        EXPECT_EQ(Entries(folder.Path("tmp")), c.planted.empty() ? std::vector<std::string>{}
                                                                 : std::vector<std::string>{"Gauge.wpx"})
            << "only what was there before is left in the temporary folder";
    }
}

struct OutputCase {
    const char* what;
    std::string output;    // the output named by the setup
    std::string protectedFile; // the file the output would have destroyed
};

TEST_F(FileSafety, AnOutputThatIsAnInputTheTemplateTheSetupOrTheLogIsRefusedNamingBoth)
{
    folder.MakeFolder("sub");
    fs::create_symlink(gauge, folder.Path("link.rbx0"));
    const std::string engineSetup = folder.Path("engine.wpx");
    const OutputCase cases[] = {
        {"the input, spelled as the input", gauge, gauge},
        {"the input, spelled another way", folder.Path("sub/../gauge.txt"), gauge},
        {"the input, through a link", folder.Path("link.rbx0"), gauge},
        {"the template", templ, templ},
        {"the log", log, log},
        {"the setup file", engineSetup, engineSetup},
    };
    for (const OutputCase& c : cases) {
        SCOPED_TRACE(c.what);
        WriteFile(engineSetup, EngineDocument(SingleFile(c.output)));
        Untouched untouched;
        for (const std::string& path : {gauge, templ, engineSetup, folder.Path("link.rbx0")})
            untouched.Add(path);
        untouched.AddLog(log);

        const Outcome outcome = folder.Engine(engineSetup);
        EXPECT_EQ(outcome.status, 1) << outcome.err;
        untouched.Expect();
        const std::string entry = LineStarting(ReadFile(log), "FAILED " + gauge);
        EXPECT_TRUE(Contains(entry, c.output) && Contains(entry.substr(entry.find(c.output) + 1), c.protectedFile))
            << "the refusal names the output and the file it is:\n" << ReadFile(log);
    }
}

// The check holds an output name to its format's extension first, so here every file the output
// names has a text file's name and the output is ASCII.
TEST_F(FileSafety, TheCheckReportsTheSameRefusals)
{
    folder.MakeFolder("sub");
    fs::create_symlink(gauge, folder.Path("link.txt"));
    const std::string textTemplate = folder.Write("template.txt", ReadFile(templ));
    const std::string textLog = folder.Write("run.txt", "an earlier run\n");
    const std::string doc = folder.Path("host.txt");
    const OutputCase cases[] = {
        {"the input, spelled as the input", gauge, gauge},
        {"the input, spelled another way", folder.Path("sub/../gauge.txt"), gauge},
        {"the input, through a link", folder.Path("link.txt"), gauge},
        {"the template", textTemplate, textTemplate},
        {"the log", textLog, textLog},
        {"the setup document", doc, doc},
    };
    for (const OutputCase& c : cases) {
        SCOPED_TRACE(c.what);
        SetupDoc setup = SingleFile(c.output);
        setup.templateName = textTemplate;
        setup.outFormat = 2;
        setup.log = textLog;
        WriteFile(doc, HostDocument(setup));
        Untouched untouched;
        for (const std::string& path : {gauge, textTemplate, textLog, doc})
            untouched.Add(path);
        const Outcome outcome = folder.Check(doc);
        EXPECT_EQ(outcome.status, 1) << outcome.out;
        const std::string line = LineStarting(outcome.out, "FAIL output: ");
        EXPECT_TRUE(Contains(line, "its output " + c.output + " is ") && Contains(line, c.protectedFile)) << outcome.out;
        untouched.Expect();
    }
}

TEST_F(FileSafety, AFolderRunIntoItsOwnFolderRefusesTheOutputsThatAreInputsAndConvertsTheRest)
{
    const std::string in = folder.MakeFolder("in");
    const std::string aCsv = folder.Write("in/a.csv", kSample);
    const std::string aTxt = folder.Write("in/a.txt", kSample.substr(0, kSample.rfind("2020")));
    const std::string cCsv = folder.Write("in/c.csv", kSample);
    fs::create_directory_symlink(in, folder.Path("inlink"));
    for (const std::string& output : {in + "/.", in + "//", in + "/../in", folder.Path("inlink")}) {
        SCOPED_TRACE("output folder " + output);
        fs::remove(folder.Path("in/c.txt"));
        SetupDoc setup;
        setup.type = 2;
        setup.input = in;
        setup.outFormat = 2;
        setup.output = output;
        setup.log = log;
        const std::string doc = folder.Write("setup.wpx", HostDocument(setup));
        Untouched untouched;
        for (const std::string& path : {aCsv, aTxt, cCsv, doc})
            untouched.Add(path);
        untouched.AddLog(log);

        const Outcome outcome = folder.Host(doc);
        EXPECT_EQ(outcome.status, 1) << outcome.err;
        untouched.Expect();
        EXPECT_EQ(ReadFile(folder.Path("in/c.txt")).substr(0, 20), kSample.substr(0, 20)) << "the rest of the run goes on";
        const std::string text = ReadFile(log);
        EXPECT_TRUE(Contains(LineStarting(text, "FAILED " + aCsv), aTxt)) << text;
        EXPECT_TRUE(HasLineStarting(text, "FAILED " + aTxt)) << text;

        const Outcome check = folder.Check(doc);
        EXPECT_EQ(check.status, 1) << check.out;
        EXPECT_TRUE(Contains(LineStarting(check.out, "FAIL output: "), aTxt)) << check.out;
    }
}

TEST_F(FileSafety, AnOutputThatIsNotARegularFileIsRefusedAndLeftAsItIs)
{
    const std::string other = folder.Write("other.txt", "a file the link names\n");
    const struct {
        const char* what;
        std::function<bool(const std::string&)> make; // false when this system cannot make it
    } cases[] = {
        {"a named pipe", [](const std::string& path) { return ::mkfifo(path.c_str(), 0644) == 0; }},
        {"a link to a regular file", [&](const std::string& path) { fs::create_symlink(other, path); return true; }},
        {"a folder", [](const std::string& path) { return fs::create_directory(path); }},
        {"a device", [](const std::string& path) { return ::mknod(path.c_str(), S_IFCHR | 0666, makedev(1, 3)) == 0; }},
    };
    for (const auto& c : cases) {
        SCOPED_TRACE(c.what);
        const std::string output = folder.Path("special.rbx0");
        fs::remove(output);
        if (!c.make(output)) {
            std::printf("[ NOTE     ] %s: cannot be made here (%s); case left out\n", c.what, std::strerror(errno));
            continue;
        }
        const std::string setup = folder.Write("engine.wpx", EngineDocument(SingleFile(output)));
        Untouched untouched;
        for (const std::string& path : {output, other, gauge, setup})
            untouched.Add(path);
        const Outcome outcome = folder.Engine(setup);
        EXPECT_EQ(outcome.status, 1);
        untouched.Expect();
        EXPECT_TRUE(Contains(LineStarting(ReadFile(log), "FAILED " + gauge), output)) << ReadFile(log);

        const std::string doc = folder.Write("host.wpx", HostDocument(SingleFile(output)));
        EXPECT_TRUE(Contains(LineStarting(folder.Check(doc).out, "FAIL output: "), output));
        untouched.Expect();
        fs::remove_all(output);
    }
}

TEST_F(FileSafety, ALogNamingAnInputOrTheTemplateIsNotAppendedTo)
{
    for (const std::string& named : {gauge, templ}) {
        SCOPED_TRACE("log " + named);
        const std::string output = folder.Path("out.rbx0");
        SetupDoc setup = SingleFile(output);
        setup.log = named;
        const std::string doc = folder.Write("setup.wpx", HostDocument(setup));
        Untouched untouched;
        for (const std::string& path : {gauge, templ, doc})
            untouched.Add(path);
        const Outcome outcome = folder.Run({{kBin + "/velmora", "run", doc}});
        EXPECT_EQ(outcome.status, 0) << outcome.err;
        untouched.Expect();
        EXPECT_TRUE(fs::exists(output));
        EXPECT_TRUE(Contains(outcome.err, "converted " + gauge)) << "the log goes to standard error:\n" << outcome.err;
        fs::remove(output);

        const Outcome check = folder.Check(doc);
        EXPECT_TRUE(Contains(LineStarting(check.out, "FAIL output: "), named)) << check.out;
    }
}

TEST_F(FileSafety, ALaterRunRemovesThePartFilesOfAKilledEngineButNotThoseOfALiveOne)
{
    const std::string big = folder.Write("big.txt", LargeSample(1000000));
    SetupDoc setup = SingleFile(folder.Path("big.rbx0"));
    setup.input = big;
    const std::string engineSetup = folder.Write("engine.wpx", EngineDocument(setup));
    const pid_t engine = testsupport::StartProgram({{kBin + "/Velmora", engineSetup, "1", "--quiet"}}, folder.Path("e.out"), folder.Path("e.err"));
    while (folder.PartFiles().empty())
        ASSERT_EQ(::waitpid(engine, nullptr, WNOHANG), 0) << "the engine ended before its output was begun";
    ::kill(engine, SIGKILL);
    ASSERT_EQ(testsupport::WaitForExit(engine), 128 + SIGKILL);
    ASSERT_EQ(folder.PartFiles().size(), 1u) << "a killed engine cannot clean up";

    // Part files that may still be written: one of this test's own process, which started before
    // the file was made, and a fresh one of another system start (another machine sharing the folder).
    std::string bootTag = ReadFile("/proc/sys/kernel/random/boot_id").substr(0, 8);
    const std::string live = folder.Write(".big.rbx0.part-" + bootTag + "-" + std::to_string(::getpid()) + "-7", "x");
    bootTag[0] = bootTag[0] == '0' ? '1' : '0';
    const std::string otherMachine = folder.Write(".big.rbx0.part-" + bootTag + "-1-1", "x");

    Untouched untouched;
    for (const std::string& path : {big, engineSetup, live, otherMachine})
        untouched.Add(path);
    EXPECT_EQ(folder.Engine(engineSetup).status, 0);
    untouched.Expect();
    std::vector<std::string> left = folder.PartFiles();
    std::sort(left.begin(), left.end());
    std::vector<std::string> expected{live, otherMachine};
    std::sort(expected.begin(), expected.end());
    EXPECT_EQ(left, expected) << "only the killed engine's part file is gone";
    EXPECT_GT(fs::file_size(folder.Path("big.rbx0")), 1000000u);
}

// The engine started by `velmora run` dies with it, and the temporary setup file goes when the host
// can still act.
TEST_F(FileSafety, KillingTheHostStopsTheEngineBeforeItReplacesTheOutput)
{
    ASSERT_EQ(::prctl(PR_SET_CHILD_SUBREAPER, 1), 0); // the orphaned engine becomes this test's child
    const std::string big = folder.Write("big.txt", LargeSample(1000000));
    const std::string output = folder.Write("big.rbx0", "an older output\n");
    for (int signal : {SIGTERM, SIGKILL}) {
        SCOPED_TRACE(strsignal(signal));
        SetupDoc setup = SingleFile(output);
        setup.input = big;
        const std::string doc = folder.Write("setup.wpx", HostDocument(setup));
        Untouched untouched;
        for (const std::string& path : {big, doc, output})
            untouched.Add(path);
        const pid_t host = testsupport::StartProgram({{kBin + "/velmora", "run", doc, "--silent"}, {{"TMPDIR", folder.Path("tmp")}}},
                                 folder.Path("h.out"), folder.Path("h.err"));
        while (folder.PartFiles().empty())
            ASSERT_EQ(::waitpid(host, nullptr, WNOHANG), 0) << "the run ended before its output was begun";
        ::kill(host, signal);
        EXPECT_EQ(testsupport::WaitForExit(host), 128 + signal);
        int status = 0;
        const pid_t engine = ::waitpid(-1, &status, 0);
        ASSERT_GT(engine, 0) << "the engine outlived the host";
        EXPECT_TRUE(WIFEXITED(status) && WEXITSTATUS(status) == 128 + SIGTERM) << "engine status " << status;
        untouched.Expect();
        EXPECT_TRUE(folder.PartFiles().empty());
        if (signal != SIGKILL) {
            EXPECT_TRUE(Entries(folder.Path("tmp")).empty()) << "the temporary setup file is removed";
        }
        fs::remove_all(folder.Path("tmp"));
        folder.MakeFolder("tmp");
    }
    ::prctl(PR_SET_CHILD_SUBREAPER, 0);
}

// A folder of 300 inputs converted on 300 threads, stopped while many outputs are being written.
// The inputs are links to one large text, so the folder costs the disk one file. How many are open
// at the stop depends on the machine's load; that no fixed number of them limits the clean-up is
// shown with 300 open part files in the OutputFile tests.
TEST_F(FileSafety, AStoppedEngineRemovesEveryPartFileHoweverManyAreOpen)
{
    constexpr int kFiles = 300;
    constexpr size_t kOpenAtTheStop = 32;
    const std::string in = folder.MakeFolder("in");
    const std::string out = folder.MakeFolder("out");
    const std::string large = folder.Write("large.txt", LargeSample(400000));
    for (int n = 0; n < kFiles; ++n)
        ASSERT_EQ(::link(large.c_str(), (in + "/" + std::to_string(1000 + n) + ".txt").c_str()), 0);
    SetupDoc setup;
    setup.type = 2;
    setup.input = in;
    setup.outFormat = 2;
    setup.output = out;
    setup.log = log;
    const std::string engineSetup = folder.Write("engine.wpx", EngineDocument(setup));
    const pid_t engine = testsupport::StartProgram({{kBin + "/Velmora", engineSetup, "1", "--quiet", "--threads", std::to_string(kFiles)}},
                               folder.Path("e.out"), folder.Path("e.err"));

    auto partFilesInOut = [&] {
        size_t count = 0;
        for (const std::string& name : Entries(out))
            count += name.find(".part-") != std::string::npos ? 1 : 0;
        return count;
    };
    while (partFilesInOut() < kOpenAtTheStop)
        ASSERT_EQ(::waitpid(engine, nullptr, WNOHANG), 0) << ReadFile(folder.Path("e.err"));
    ::kill(engine, SIGTERM);
    EXPECT_EQ(testsupport::WaitForExit(engine), 128 + SIGTERM);
    EXPECT_EQ(folder.PartFiles().size(), 0u);
    // The outputs finished before the stop are whole: the same text, as their inputs are.
    const std::vector<std::string> finished = Entries(out);
    for (const std::string& name : finished)
        EXPECT_EQ(ReadFile(out + "/" + name), ReadFile(out + "/" + finished.front())) << name;
}

TEST_F(FileSafety, EveryLogEntryIsOneLineWhateverTheNamesAndValuesHold)
{
    const std::string in = folder.MakeFolder("in");
    folder.Write("in/a.txt", kSample);
    const std::string forged = folder.Write("in/x\nFAILED forged: y.txt", "not a described file\n");
    std::string withNul = kSample;
    withNul.replace(withNul.find("1.5"), 3, std::string("1\0abc", 5));
    const std::string nul = folder.Write("in/nul.txt", withNul);
    SetupDoc setup;
    setup.type = 2;
    setup.input = in;
    setup.output = folder.MakeFolder("out");
    setup.log = log;
    const std::string doc = folder.Write("setup.wpx", HostDocument(setup));
    Untouched untouched;
    for (const std::string& path : {forged, nul, doc})
        untouched.Add(path);
    EXPECT_EQ(folder.Host(doc).status, 1);
    untouched.Expect();

    const std::string text = ReadFile(log);
    EXPECT_EQ(text.find('\0'), std::string::npos);
    for (const std::string& line : Lines(text)) {
        const bool known = line == "an earlier run" || line.rfind("run ", 0) == 0 || line.rfind("converted ", 0) == 0 ||
                           line.rfind("FAILED ", 0) == 0 || line.rfind("SKIPPED ", 0) == 0 ||
                           line.rfind("  ", 0) == 0 || line.rfind("result: ", 0) == 0;
        EXPECT_TRUE(known) << "'" << line << "' is not a line of the log's own";
    }
    EXPECT_FALSE(HasLineStarting(text, "FAILED forged")) << text;
    const std::vector<std::string> lines = Lines(text);
    const auto entry = std::find_if(lines.begin(), lines.end(),
                                    [&](const std::string& line) { return line.rfind("FAILED " + nul, 0) == 0; });
    ASSERT_NE(entry, lines.end()) << text;
    EXPECT_TRUE(Contains(*entry, "1\\0abc")) << *entry;
    ASSERT_NE(entry + 1, lines.end());
    EXPECT_EQ((entry + 1)->rfind("  no output written", 0), 0u) << text;

    // What the check prints is one line a check too.
    SetupDoc single = SingleFile(folder.Path("o.rbx0"));
    single.input = folder.Write("x\nPASS output: forged.txt", kSample);
    const Outcome check = folder.Check(folder.Write("host.wpx", HostDocument(single)));
    EXPECT_EQ(Lines(check.out).size(), 4u) << check.out;
    EXPECT_FALSE(HasLineStarting(check.out, "PASS output: forged")) << check.out;
}

TEST_F(FileSafety, ASelectionNamingAnItemTwiceOrBeyondTheFileIsRefused)
{
    const std::string output = folder.Path("out.rbx0");
    std::string repeated = "0";
    for (int n = 1; n < 5000; ++n)
        repeated += ", 0";
    const struct {
        const char* items;
        int status;
        const char* named; // in the log's refusal
    } cases[] = {
        {repeated.c_str(), 3, "item 0"},
        {"2, 1, 2", 3, "item 2"},
        {"0, 7", 1, "item 7"},
    };
    for (const auto& c : cases) {
        SCOPED_TRACE(std::string(c.items).substr(0, 12));
        SetupDoc setup = SingleFile(output);
        setup.items = c.items;
        const std::string engineSetup = folder.Write("engine.wpx", EngineDocument(setup));
        Untouched untouched;
        untouched.Add(gauge);
        untouched.Add(engineSetup);
        untouched.AddLog(log);
        const Outcome outcome = folder.Engine(engineSetup);
        EXPECT_EQ(outcome.status, c.status) << ReadFile(log);
        EXPECT_FALSE(fs::exists(output));
        untouched.Expect();
        const std::string text = ReadFile(log);
        const std::string last = text.substr(text.rfind("\nrun "));
        EXPECT_TRUE(Contains(last, c.named)) << last;
        EXPECT_LT(last.size(), 2000u) << "the refusal names the place, not the whole selection";
    }
}

TEST_F(FileSafety, AnOutputThatCannotBeWrittenIsRefusedWithTheSystemsReason)
{
    const std::string notFolder = folder.Write("plain", "a file, not a folder\n");
    const std::string readOnly = folder.MakeFolder("read-only");
    fs::permissions(readOnly, fs::perms::owner_read | fs::perms::owner_exec | fs::perms::group_read |
                                  fs::perms::group_exec | fs::perms::others_read | fs::perms::others_exec);
    // As root, the unprivileged case runs as user 65534, who must be able to run the programs.
    const bool unprivilegedRuns = folder.Run({{kBin + "/Velmora", "--help"}, {}, true}).status == 0;
    const struct {
        const char* what;
        std::string output;
        const char* reason;
        bool unprivileged;
    } cases[] = {
        {"a name too long", folder.Path(std::string(300, 'x') + ".rbx0"), "File name too long", false},
        {"a folder that is a file", notFolder + "/out.rbx0", "Not a directory", false},
        {"a missing folder", folder.Path("missing/out.rbx0"), "No such file or directory", false},
        {"a folder the user may not write to", readOnly + "/out.rbx0", "Permission denied", true},
    };
    for (const auto& c : cases) {
        SCOPED_TRACE(c.what);
        if (c.unprivileged && !unprivilegedRuns) {
            std::printf("[ NOTE     ] %s: user 65534 cannot run the programs here; case left out\n", c.what);
            continue;
        }
        SetupDoc setup = SingleFile(c.output);
        setup.log.clear(); // standard error: an unprivileged run may not write the scratch log
        const std::string engineSetup = folder.Write("engine.wpx", EngineDocument(setup));
        const std::string doc = folder.Write("host.wpx", HostDocument(setup));
        fs::permissions(engineSetup, fs::perms::all);
        fs::permissions(doc, fs::perms::all);
        Untouched untouched;
        for (const std::string& path : {gauge, templ, engineSetup, doc, notFolder})
            untouched.Add(path);

        const Outcome outcome =
            folder.Run({{kBin + "/Velmora", engineSetup, "1", "--quiet"}, {}, c.unprivileged});
        EXPECT_EQ(outcome.status, 1) << outcome.err;
        const std::string entry = LineStarting(outcome.err, "FAILED " + gauge);
        EXPECT_TRUE(Contains(entry, c.output) && Contains(entry, c.reason)) << outcome.err;

        const Outcome check = folder.Check(doc, c.unprivileged);
        EXPECT_EQ(check.status, 1) << check.out;
        const std::string line = LineStarting(check.out, "FAIL output: ");
        EXPECT_TRUE(Contains(line, c.output.substr(0, c.output.rfind('/')))) << check.out;
        untouched.Expect();
    }
}

} // namespace
