// The engine stopped hard at random points of a large folder conversion, twenty times over, and then
// run to the end: every output is at all times either the old file or the complete new one, no part
// file outlives the runs, and no input changes.
#include "tests/e2e_convert/RunSupport.h"

#include <chrono>
#include <random>
#include <thread>

using namespace e2e;

namespace {

constexpr int kInputs = 3;
constexpr int kKills = 20;

TEST(FaultInjection, AnEngineKilledAtRandomPointsLeavesOldOrCompleteOutputsOnly)
{
    RunFolder folder;
    std::vector<std::string> inputs, outputs;
    Untouched untouched;
    for (int n = 0; n < kInputs; ++n) {
        // About 2.5 MB each: long enough to be stopped in the middle, short enough for a quick test.
        inputs.push_back(folder.Write("in/gauge" + std::to_string(n) + ".txt", LargeSample(80000 + 1000 * n)));
        untouched.Add(inputs.back());
    }
    SetupDoc setup;
    setup.type = 2;
    setup.input = folder.Path("in");
    setup.output = folder.MakeFolder("reference");
    const std::string referenceSetup = folder.Write("reference.wpx", EngineDocument(setup));
    setup.output = folder.MakeFolder("out");
    setup.log = folder.Path("run.log");
    const std::string runSetup = folder.Write("run.wpx", EngineDocument(setup));
    untouched.Add(runSetup);

    // The complete new outputs, and how long a whole run takes (to spread the kills over it).
    const auto started = std::chrono::steady_clock::now();
    ASSERT_EQ(folder.Engine(referenceSetup).status, 0);
    const auto runTime = std::chrono::steady_clock::now() - started;
    std::vector<std::string> fresh;
    for (int n = 0; n < kInputs; ++n) {
        fresh.push_back(ReadFile(folder.Path("reference/gauge" + std::to_string(n) + ".rbx0")));
        outputs.push_back(folder.Write("out/gauge" + std::to_string(n) + ".rbx0", "an older output\n"));
    }

    const unsigned seed = std::random_device{}();
    SCOPED_TRACE("seed " + std::to_string(seed));
    std::mt19937 random(seed);
    std::uniform_int_distribution<long long> when(0, std::chrono::duration_cast<std::chrono::microseconds>(runTime).count());
    for (int kill = 0; kill < kKills; ++kill) {
        const int signal = random() % 2 ? SIGKILL : SIGTERM;
        const auto delay = std::chrono::microseconds(when(random));
        SCOPED_TRACE("kill " + std::to_string(kill) + ": " + strsignal(signal) + " after " +
                     std::to_string(delay.count()) + " us");
        const pid_t engine = testsupport::StartProgram({{kBin + "/Velmora", runSetup, "1", "--quiet"}, {}}, folder.Path("e.out"),
                                   folder.Path("e.err"));
        std::this_thread::sleep_for(delay);
        ::kill(engine, signal);
        const int status = testsupport::WaitForExit(engine);
        EXPECT_TRUE(status == 128 + signal || status == 0) << "status " << status << ReadFile(folder.Path("e.err"));
        for (int n = 0; n < kInputs; ++n) {
            const std::string content = ReadFile(outputs[n]);
            EXPECT_TRUE(content == "an older output\n" || content == fresh[n]) << outputs[n] << ": " << content.size() << " bytes";
        }
        if (signal == SIGTERM) {
            // Earlier killed engines may have left theirs; the next run that gets going removes those.
            for (const std::string& part : folder.PartFiles())
                EXPECT_FALSE(Contains(part, "-" + std::to_string(engine) + "-")) << "a stopped engine removes its own";
        }
    }

    ASSERT_EQ(folder.Engine(runSetup).status, 0) << ReadFile(folder.Path("run.log"));
    for (int n = 0; n < kInputs; ++n)
        EXPECT_EQ(ReadFile(outputs[n]), fresh[n]) << outputs[n];
    EXPECT_EQ(folder.PartFiles(), std::vector<std::string>{});
    untouched.Expect();
}

} // namespace
