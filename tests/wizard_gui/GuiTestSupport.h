#pragma once
// The pieces the wizard's widget tests share: one Qt application for the test program, a wizard
// shown without a modal loop that a test clicks through like a user, and a way to run the modal
// wizard with a script.
#include "tests/wizard/WizardTestSupport.h"

#include "engine/Engine.h"
#include "platform/ui/qt/Controls.h"
#include "wizard/Wizard.h"

#include <QAbstractButton>
#include <QApplication>
#include <QLineEdit>
#include <QTest>
#include <QTimer>

#include <functional>
#include <memory>
#include <string>

namespace guitest {

// Where the pictures of the pages go.
std::string PictureFolder();
// Saves a picture of `widget` as <PictureFolder()>/<name>.png.
void SavePicture(QWidget& widget, const std::string& name);

// Every descendant of `root` named for a control ("id201", ...).
QList<QWidget*> Controls(QWidget& root);

// Drives a wizard on the screen as a user would: clicks, typing, the wizard's buttons.
class Driver {
public:
    explicit Driver(CWizard* wizard) : m_wizard(wizard) {}

    CWizard& Wizard() { return *m_wizard; }
    int Page() const { return m_wizard->currentId(); }
    template <typename T = QWidget>
    T* Find(int id)
    {
        return m_wizard->findChild<T*>(ui::ControlName(id));
    }
    void Click(int id);
    // The "..." beside browse field `id`.
    void Browse(int id);
    void Type(int id, const std::string& text);
    std::string Text(int id);
    void Next();
    void Back();
    void Finish();
    void Cancel();
    void Preview();
    bool PreviewVisible() const;

protected:
    CWizard* m_wizard;
};

// A wizard of its own on the screen, not modal.
class WizardWindow : public Driver {
public:
    explicit WizardWindow(CEngine* engine);
    ~WizardWindow();

private:
    std::unique_ptr<CWizard> m_owned;
};

// Clicks `button` the way a pointer does.
void Press(QAbstractButton* button);

// Runs `script` on the wizard once the modal loop of `run` has shown it, then closes the wizard
// if the script left it open (a failed assertion returns early), so the loop always ends.
int RunModal(const std::function<int()>& run, const std::function<void(Driver&)>& script);

} // namespace guitest
