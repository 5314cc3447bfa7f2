#pragma once
// The pieces the wizard's widget tests share: one Qt application for the test program, a wizard
// shown without a modal loop that a test clicks through like a user, and a way to run the modal
// wizard with a script.
#include "tests/wizard/WizardTestSupport.h"

#include "engine/Engine.h"
#include "platform/ui/qt/Controls.h"
#include "wizard/ManualDefGridWnd.h"
#include "wizard/Wizard.h"

#include <QAbstractButton>
#include <QComboBox>
#include <QDialog>
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
    // Control `id` of the current page, else of the wizard (pages may reuse an id).
    template <typename T = QWidget>
    T* Find(int id)
    {
        if (QWidget* page = m_wizard->currentPage())
            if (T* control = page->findChild<T*>(ui::ControlName(id)))
                return control;
        return m_wizard->findChild<T*>(ui::ControlName(id));
    }
    void Click(int id);
    // The "..." beside browse field `id`.
    void Browse(int id);
    void Type(int id, const std::string& text);
    // Picks the entry `text` of drop-down list `id` as a user does.
    void Choose(int id, const std::string& text);
    // Ticks or clears check box `id` by clicking it when it is not as wanted.
    void Tick(int id, bool ticked);
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

// Cells of the manual definition grid (rows and columns from 1), used as a pointer and keyboard do:
// a click (which opens the cell's editor), typing into a text cell, picking from a list cell.
void PressCell(CManualDefGridWnd& grid, int row, int column);
void TypeInCell(CManualDefGridWnd& grid, int row, int column, const std::string& text);
void ChooseInCell(CManualDefGridWnd& grid, int row, int column, const std::string& text);
// The text a cell shows.
std::string CellText(const CManualDefGridWnd& grid, int row, int column);

// Runs `script` on the dialog a modal loop shows next (the first visible dialog that is not the
// wizard), then rejects it if the script left it open.
void WhenDialogShown(const std::function<void(QDialog&)>& script);
// Picks entry `text` of `list` as a user does; fails the test when the list lacks it.
void ChooseEntry(QComboBox* list, const std::string& text);

// Runs `script` on the wizard once the modal loop of `run` has shown it, then closes the wizard
// if the script left it open (a failed assertion returns early), so the loop always ends.
int RunModal(const std::function<int()>& run, const std::function<void(Driver&)>& script);

} // namespace guitest
