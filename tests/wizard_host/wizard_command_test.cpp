// `velmora wizard DOC` as the host runs it: the plug-in loaded with dlopen shows its wizard in this
// process's Qt application, a script drives the wizard through the object names its controls carry
// (as an automation tool would), and the host's code writes the document back. The wizard also
// starts as a program of its own, on a real X server and offscreen.
#include "tests/engine/CheckTestSupport.h"
#include "tests/support/Files.h"
#include "tests/support/ShellCommand.h"
#include "tests/wizard_gui/QtTestApplication.h"

#include "apps/velmora/WizardDocument.h"
#include "converter/RbxSeriesWriter.h"

#include <QAbstractButton>
#include <QApplication>
#include <QLineEdit>
#include <QTest>
#include <QTimer>
#include <QWizard>

#include <gtest/gtest.h>

#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <sstream>
#include <sys/wait.h>

namespace {

using checktest::ScopedEnv;
using checktest::ScratchFolder;

constexpr int kFinished = 12325;

using testsupport::ReadFile;

[[maybe_unused]] testing::Environment* const g_application =
    testing::AddGlobalTestEnvironment(new QtTestApplication("velmora-host-tests"));

// Drives the plug-in's wizard by control names only.
class Automation {
public:
    explicit Automation(QWizard& wizard) : m_wizard(wizard) {}
    QWidget* Control(int id) { return m_wizard.findChild<QWidget*>(QStringLiteral("id%1").arg(id)); }
    void Click(int id)
    {
        auto* button = qobject_cast<QAbstractButton*>(Control(id));
        ASSERT_NE(button, nullptr) << "no button id" << id;
        QTest::mouseClick(button, Qt::LeftButton, Qt::NoModifier, QPoint(8, button->height() / 2));
    }
    void Type(int id, const std::string& text)
    {
        auto* edit = qobject_cast<QLineEdit*>(Control(id));
        ASSERT_NE(edit, nullptr) << "no edit id" << id;
        edit->clear();
        QTest::keyClicks(edit, QString::fromStdString(text));
    }
    // The wizard's own buttons, found by their accessible text as a screen reader would.
    void Press(const QString& text)
    {
        for (QAbstractButton* button : m_wizard.findChildren<QAbstractButton*>())
            if (button->isVisible() && button->text().remove('&') == text) {
                QTest::mouseClick(button, Qt::LeftButton);
                return;
            }
        ADD_FAILURE() << "no visible button " << text.toStdString();
    }
    int Page() const { return m_wizard.currentId(); }

private:
    QWizard& m_wizard;
};

// Runs `script` on the plug-in's wizard once it shows, and ends the wizard if the script did not.
void WhenTheWizardShows(const std::function<void(Automation&)>& script)
{
    QTimer::singleShot(0, [script] {
        QWizard* wizard = nullptr;
        for (QWidget* widget : QApplication::topLevelWidgets())
            if (auto* candidate = qobject_cast<QWizard*>(widget); candidate && candidate->isVisible())
                wizard = candidate;
        ASSERT_NE(wizard, nullptr) << "the plug-in showed no wizard";
        EXPECT_EQ(wizard->windowTitle(), "Velmora");
        EXPECT_STREQ(wizard->metaObject()->className(), "CWizard");
        Automation automation(*wizard);
        script(automation);
        if (wizard->isVisible())
            wizard->reject();
    });
}

class WizardCommand : public testing::Test {
protected:
    void SetUp() override
    {
        std::string error;
        plugin = host::Plugin::Load(error);
        ASSERT_NE(plugin, nullptr) << error;
        std::filesystem::create_directories(scratch.File("docs/data"));
        converter::RbxSeriesWriter writer;
        converter::SeriesHeader header;
        header.items = {{"Level", "Water level", "m", "Instantaneous"}};
        ASSERT_TRUE(writer.Begin(input, header, "Gauge").ok());
        for (int step = 0; step < 3; ++step)
            ASSERT_TRUE(writer.Write({1609459200 + 3600 * step, {1.0 + step}}).ok());
        ASSERT_TRUE(writer.Finish().ok());
    }
    // The rbx0 road to an ASCII file beside the input, ended with Finish.
    void FinishRbx0Road(Automation& a)
    {
        a.Press("Next >");
        a.Click(203);
        a.Type(206, input);
        a.Press("Next >");
        EXPECT_EQ(a.Page(), 2285);
        a.Press("Next >");
        a.Click(209);
        a.Type(264, scratch.File("docs/data/converted"));
        a.Press("Next >");
        EXPECT_EQ(a.Page(), 101);
        a.Press("Finish");
    }

    ScratchFolder scratch;
    ScopedEnv tmpdir{"TMPDIR", scratch.MakeFolder("tmp")};
    std::unique_ptr<host::Plugin> plugin;
    std::string input = scratch.File("docs/data/gauge.rbx0");
    std::string document = scratch.File("docs/setup.wpx");
};

TEST_F(WizardCommand, FinishWritesANewDocumentWithNamesRelativeToItsFolderThatRuns)
{
    WhenTheWizardShows([this](Automation& a) { FinishRbx0Road(a); });
    const host::WizardOutcome outcome = host::RunWizardOnDocument(*plugin, document);
    EXPECT_EQ(outcome.result, kFinished);
    EXPECT_TRUE(outcome.written) << outcome.error;
    const std::string text = ReadFile(document);
    EXPECT_NE(text.find("File_name = file \"data/gauge.rbx0\""), std::string::npos) << text;
    EXPECT_NE(text.find("File_name = file \"data/converted.txt\""), std::string::npos) << text;
    EXPECT_EQ(plugin->GetWpxHandle(), 0) << "the host closed the new document";
    for (const auto& entry : std::filesystem::directory_iterator(scratch.File("docs")))
        EXPECT_EQ(entry.path().filename().string().find(".wizard-"), std::string::npos) << "a scratch file was left";

    // The document works from anywhere, for the host program.
    const std::string err = scratch.File("run.err");
    EXPECT_EQ(testsupport::ShellStatus("cd / && '" VELMORA_BIN_DIR "/velmora' run '" + document + "' 2>'" + err + "' >/dev/null"), 0);
    EXPECT_NE(ReadFile(err).find("Status: OK"), std::string::npos) << ReadFile(err);
    EXPECT_TRUE(std::filesystem::exists(scratch.File("docs/data/converted.txt")));
}

TEST_F(WizardCommand, TheStoredSetupIsShownAndCancelLeavesTheDocumentAsItWas)
{
    WhenTheWizardShows([this](Automation& a) { FinishRbx0Road(a); });
    ASSERT_TRUE(host::RunWizardOnDocument(*plugin, document).written);
    const std::string before = ReadFile(document);
    WhenTheWizardShows([this](Automation& a) {
        a.Press("Next >");
        auto* file = qobject_cast<QLineEdit*>(a.Control(206));
        ASSERT_NE(file, nullptr);
        EXPECT_EQ(file->text().toStdString(), input) << "the stored setup is shown";
        a.Click(205);
        a.Press("Cancel");
    });
    const host::WizardOutcome outcome = host::RunWizardOnDocument(*plugin, document);
    EXPECT_EQ(outcome.result, 2);
    EXPECT_FALSE(outcome.written);
    EXPECT_EQ(ReadFile(document), before);
    EXPECT_EQ(plugin->GetWpxHandle(), 0);
}

TEST_F(WizardCommand, ADamagedDocumentIsReportedAndNoWizardShows)
{
    std::ofstream(document) << "wpx 1\ntarget \"OkaToolbox\"\n";
    const host::WizardOutcome outcome = host::RunWizardOnDocument(*plugin, document);
    EXPECT_EQ(outcome.result, 0);
    EXPECT_NE(outcome.error.find("setup.wpx:"), std::string::npos) << outcome.error;
}

TEST_F(WizardCommand, WithoutADisplayTheCommandSaysSoAndWithoutADocumentHowToUseIt)
{
    const std::string err = scratch.File("err.txt");
    EXPECT_EQ(testsupport::ShellStatus("env -u DISPLAY -u WAYLAND_DISPLAY -u QT_QPA_PLATFORM '" VELMORA_BIN_DIR "/velmora' wizard '" + document +
                    "' 2>'" + err + "'"),
              1);
    EXPECT_NE(ReadFile(err).find("no display"), std::string::npos) << ReadFile(err);
    EXPECT_FALSE(std::filesystem::exists(document));
    EXPECT_EQ(testsupport::ShellStatus("'" VELMORA_BIN_DIR "/velmora' wizard 2>/dev/null"), 2);
    EXPECT_EQ(testsupport::ShellStatus("'" VELMORA_BIN_DIR "/velmora' wizard --help >/dev/null"), 0);
}

} // namespace
