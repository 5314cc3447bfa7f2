// Part files: made exclusively beside the output, committed only over a regular file, all removed
// when a run stops however many there are, and the leftovers of dead processes told from live ones.
#include "TestFiles.h"
#include "converter/ConversionJob.h"
#include "converter/OutputFile.h"
#include "converter/RunPlan.h"

#include <gtest/gtest.h>

#include <filesystem>
#include <fcntl.h>
#include <memory>
#include <sys/stat.h>
#include <sys/wait.h>
#include <unistd.h>

namespace fs = std::filesystem;
using namespace converter;

namespace {

std::vector<std::string> Hidden(const std::string& folder)
{
    std::vector<std::string> names;
    for (const auto& entry : fs::directory_iterator(folder))
        if (entry.path().filename().string()[0] == '.')
            names.push_back(entry.path().filename().string());
    return names;
}

std::string BootTag()
{
    return testsupport::ReadFile("/proc/sys/kernel/random/boot_id").substr(0, 8);
}

TEST(OutputFile, IsWrittenAsAHiddenPartFileAndCommittedOverARegularFileKeepingItsMode)
{
    testsupport::ScratchFolder folder;
    const std::string final = folder.File("out.txt");
    testsupport::WriteFile(final, "old");
    ::chmod(final.c_str(), 0640);
    OutputFile output(final);
    ASSERT_TRUE(output.Create());
    const std::string part = output.TemporaryPath();
    EXPECT_EQ(fs::path(part).parent_path(), fs::path(folder.Path()));
    EXPECT_EQ(fs::path(part).filename().string().rfind(".out.txt.part-" + BootTag() + "-" + std::to_string(::getpid()) + "-", 0), 0u)
        << part;
    testsupport::WriteFile(part, "new");
    ASSERT_TRUE(output.Commit());
    EXPECT_EQ(testsupport::ReadFile(final), "new");
    EXPECT_EQ(fs::status(final).permissions() & fs::perms::all,
              fs::perms::owner_read | fs::perms::owner_write | fs::perms::group_read);
    EXPECT_TRUE(Hidden(folder.Path()).empty());
}

TEST(OutputFile, ACommitDoesNotReplaceWhatIsNoLongerARegularFile)
{
    testsupport::ScratchFolder folder;
    const std::string final = folder.File("out.txt");
    {
        OutputFile output(final);
        ASSERT_TRUE(output.Create());
        ASSERT_EQ(::mkfifo(final.c_str(), 0600), 0); // made while the output was being written
        const sys::Status committed = output.Commit();
        EXPECT_FALSE(committed);
        EXPECT_NE(committed.problem().message.find("a named pipe (FIFO)"), std::string::npos);
    }
    EXPECT_TRUE(fs::is_fifo(final));
    EXPECT_TRUE(Hidden(folder.Path()).empty()) << "the part file goes with the object";
}

TEST(OutputFile, ALinkPlantedAtThePartFilesNameIsNeverWrittenThroughNorMovedIntoPlace)
{
    testsupport::ScratchFolder folder;
    const std::string victim = folder.File("victim.txt");
    testsupport::WriteFile(victim, "someone's file");
    const std::string final = folder.File("out.txt");
    OutputFile output(final);
    ASSERT_TRUE(output.Create());
    fs::remove(output.TemporaryPath());
    fs::create_symlink(victim, output.TemporaryPath());
    testsupport::WriteFile(output.WriterPath(), "converted"); // as a writer does
    EXPECT_EQ(testsupport::ReadFile(victim), "someone's file");
    const sys::Status committed = output.Commit();
    EXPECT_FALSE(committed);
    EXPECT_NE(committed.problem().message.find("was replaced"), std::string::npos) << committed.problem().message;
    EXPECT_FALSE(fs::exists(final));
}

TEST(OutputFile, ANameTooLongForThePartFileIsShortenedAndAMissingFolderSaysWhy)
{
    testsupport::ScratchFolder folder;
    const std::string longName = std::string(250, 'n') + ".txt";
    OutputFile output(folder.File(longName));
    ASSERT_TRUE(output.Create()) << output.FinalPath();
    EXPECT_LE(fs::path(output.TemporaryPath()).filename().string().size(), 255u);

    OutputFile nowhere(folder.File("missing/out.txt"));
    const sys::Status created = nowhere.Create();
    EXPECT_FALSE(created);
    EXPECT_EQ(created.problem().file, folder.File("missing/out.txt"));
    EXPECT_NE(created.problem().message.find("No such file or directory"), std::string::npos) << created.problem().message;
}

// In a child process: stopping is for good, and this test runs among others.
TEST(OutputFile, StoppingRemovesEveryPartFileHoweverManyAndRefusesNewOnes)
{
    testsupport::ScratchFolder folder;
    EXPECT_EXIT(
        {
            std::vector<std::unique_ptr<OutputFile>> outputs;
            for (int n = 0; n < 300; ++n) {
                outputs.push_back(std::make_unique<OutputFile>(folder.File("out" + std::to_string(n) + ".txt")));
                if (!outputs.back()->Create())
                    ::_exit(2);
            }
            const bool allRemoved = OutputFile::RemoveAllTemporaries() == 300 && Hidden(folder.Path()).empty();
            OutputFile late(folder.File("late.txt"));
            const bool lateRefused = !late.Create();
            ::_exit(allRemoved && lateRefused && !outputs[0]->Commit() ? 0 : 1);
        },
        testing::ExitedWithCode(0), "");
}

TEST(OutputFile, LeftoversOfStoppedProcessesAreRemovedAndTheFilesOfLiveOnesKept)
{
    testsupport::ScratchFolder folder;
    const pid_t gone = ::fork();
    if (gone == 0)
        ::_exit(0);
    ::waitpid(gone, nullptr, 0);
    std::string otherBoot = BootTag();
    otherBoot[0] = otherBoot[0] == 'a' ? 'b' : 'a';
    const std::string me = std::to_string(::getpid());
    const struct {
        std::string name;
        bool old; // last written long before this system started
        bool removed;
    } cases[] = {
        {".a.txt.part-" + BootTag() + "-" + std::to_string(gone) + "-0", false, true}, // its process is gone
        {".b.txt.part-" + BootTag() + "-" + me + "-0", false, false},                  // this process is at work
        {".c.txt.part-" + otherBoot + "-" + me + "-0", true, true},   // from an earlier start of the system
        {".d.txt.part-" + otherBoot + "-" + me + "-0", false, false}, // another machine's, perhaps
        {".e.txt.part-" + BootTag() + "-x1-0", false, false},         // not a part file's name
        {"f.txt.part-" + BootTag() + "-" + std::to_string(gone) + "-0", false, false}, // not hidden
        {".g.txt.part-" + BootTag() + "-" + std::to_string(gone) + "-0-1", false, false},
    };
    for (const auto& c : cases) {
        testsupport::WriteFile(folder.File(c.name), "part");
        if (c.old) {
            const timespec times[2] = {{1000000000, 0}, {1000000000, 0}}; // 2001
            ::utimensat(AT_FDCWD, folder.File(c.name).c_str(), times, 0);
        }
    }
    const std::string link = ".h.txt.part-" + BootTag() + "-" + std::to_string(gone) + "-0";
    fs::create_symlink(folder.File("f.txt"), folder.File(link));

    const std::vector<std::string> removed = OutputFile::RemoveStaleTemporaries(folder.Path());
    for (const auto& c : cases)
        EXPECT_EQ(!fs::exists(folder.File(c.name)), c.removed) << c.name;
    EXPECT_TRUE(fs::is_symlink(folder.File(link))) << "a link is never a part file";
    EXPECT_EQ(removed.size(), 2u);
}

TEST(RunPlan, TwoInputsGivingOneOutputAndOutputsThatCannotBeWrittenAreRefused)
{
    testsupport::ScratchFolder folder;
    fs::create_directories(folder.File("in"));
    fs::create_directories(folder.File("out"));
    for (const char* name : {"in/a.csv", "in/a.txt", "in/b.txt", "in/c.txt", "in/d.tab"})
        testsupport::WriteFile(folder.File(name), "x\n");
    ::mkfifo(folder.File("out/c.rbx0").c_str(), 0600);
    fs::create_directories(folder.File("out/d.rbx0"));
    const JobSetup setup = convtest::AsciiFolderToRbx0(folder);
    const RunPlan plan(setup, folder.File("out/b.rbx0"));
    const std::vector<PlannedFile>& files = plan.Files();
    ASSERT_EQ(files.size(), 5u);
    const std::pair<std::string, std::string> expected[] = {
        {"in/a.csv", ""},
        {"in/a.txt", "its output " + folder.File("out/a.rbx0") + " is also the output of " + folder.File("in/a.csv")},
        {"in/b.txt", "its output " + folder.File("out/b.rbx0") + " is the log file " + folder.File("out/b.rbx0")},
        {"in/c.txt", "its output " + folder.File("out/c.rbx0") + " is a named pipe (FIFO); only a regular file is replaced"},
        {"in/d.tab", "its output " + folder.File("out/d.rbx0") + " is a folder; only a regular file is replaced"},
    };
    for (size_t n = 0; n < files.size(); ++n) {
        EXPECT_EQ(files[n].input, folder.File(expected[n].first));
        EXPECT_EQ(files[n].refusal, expected[n].second);
        EXPECT_EQ(files[n].outputRefused, !expected[n].second.empty());
    }
    EXPECT_EQ(plan.OutputFolders(), std::vector<std::string>{folder.File("out")});
    EXPECT_EQ(plan.ReadFileAt(folder.File("in/./b.txt")), "the input file " + folder.File("in/b.txt"));
    EXPECT_EQ(plan.ReadFileAt(folder.File("out/b.rbx0")), "") << "the log itself is not a file the run reads";
}

} // namespace
