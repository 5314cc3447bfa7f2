#pragma once
// The fixture of the roads through the wizard: the wizard run as the plug-in's entry point runs
// it, with dialogs answered by script, a picture of every page reached, and the document it
// leaves run by the host program.
#include "tests/wizard_gui/GuiTestSupport.h"

#include "engine/ModuleHandle.h"
#include "platform/harbor/qt/OverviewPage.h"
#include "platform/wpx/Wpx.h"
#include "tests/support/Files.h"
#include "tests/support/ShellCommand.h"
#include "wizard/SetupGui.h"

#include <filesystem>

namespace guitest {

using testsupport::ReadFile;

// What a program of ours printed on standard output, and whether it exited with 0.
struct ProgramRun {
    bool ok = false;
    std::string out;
    std::string err;
};

class RoadTest : public testing::Test {
protected:
    static constexpr int kFinished = 12325;

    void SetUp() override { SetModuleWpxHandle(0); }
    void TearDown() override
    {
        WPXHANDLE document = ModuleWpxDocument();
        if (document)
            wpxClose(&document);
        SetModuleWpxHandle(0);
    }

    // Saves a picture of the page the road has reached.
    void Snap(Driver& driver, const std::string& road)
    {
        SavePicture(driver.Wizard(), road + "-" + std::to_string(++m_step) + "-" + std::to_string(driver.Page()));
    }
    // Next, expecting to arrive at `page`, and a picture of it.
    void NextTo(Driver& driver, const std::string& road, int page)
    {
        driver.Next();
        ASSERT_EQ(driver.Page(), page) << road << ": " << (screen.boxes.empty() ? "" : screen.boxes.back().text);
        Snap(driver, road);
    }
    void FinishFrom(Driver& driver, const std::string& road)
    {
        NextTo(driver, road, COverviewPage::IDD);
        driver.Finish();
    }

    // Runs `program` of ours with `arguments` (each quoted).
    ProgramRun Run(const std::string& program, const std::vector<std::string>& arguments)
    {
        const std::string out = scratch.File("program.out");
        const std::string err = scratch.File("program.err");
        std::string command = "'" VELMORA_BIN_DIR "/" + program + "'";
        for (const std::string& argument : arguments)
            command += " '" + argument + "'";
        const int status = testsupport::ShellStatus(command + " >'" + out + "' 2>'" + err + "'");
        return {status == 0, ReadFile(out), ReadFile(err)};
    }

    // Runs the wizard as the plug-in's entry point does, then stores the new document and runs it
    // with the host program; returns what the run said.
    std::string RunRoad(const std::string& road, const std::function<void(Driver&)>& script)
    {
        m_step = 0;
        const int result = RunModal(ShowSetupWizard, [&](Driver& driver) {
            Snap(driver, road);
            driver.Next();
            Snap(driver, road);
            script(driver);
        });
        EXPECT_EQ(result, kFinished) << road;
        EXPECT_TRUE(std::filesystem::is_empty(inputs.temp)) << road << ": the wizard left a working file";
        if (result != kFinished || !GetModuleWpxHandle())
            return std::string();
        const std::string document = scratch.File(road + ".wpx");
        EXPECT_EQ(wpxWrite(ModuleWpxDocument(), document), 1);
        const ProgramRun run = Run("velmora", {"run", document});
        EXPECT_TRUE(run.ok) << road << ": " << run.err;
        return run.err;
    }

    wizardtest::ScratchFolder scratch;
    wizardtest::Inputs inputs{scratch};
    ui::ScriptedUserInterface screen;
    ui::ScopedUserInterface watching{screen};
    int m_step = 0;
};

} // namespace guitest
