#include "tests/wizard_gui/GuiTestSupport.h"
#include "tests/wizard_gui/QtTestApplication.h"

#include <QDir>
#include <QPixmap>
#include <QCheckBox>
#include <QPushButton>
#include <QRadioButton>

namespace guitest {
namespace {

[[maybe_unused]] testing::Environment* const g_application =
    testing::AddGlobalTestEnvironment(new QtTestApplication("velmora-wizard-tests"));

CWizard* ShownWizard()
{
    for (QWidget* widget : QApplication::topLevelWidgets())
        if (auto* wizard = qobject_cast<CWizard*>(widget); wizard && wizard->isVisible())
            return wizard;
    return nullptr;
}

} // namespace

std::string PictureFolder()
{
    // A run on another display keeps its pictures apart.
    const QString folder = qEnvironmentVariableIsEmpty("VELMORA_PICTURE_DIR") ? QStringLiteral(VELMORA_PICTURE_DIR)
                                                                               : qEnvironmentVariable("VELMORA_PICTURE_DIR");
    QDir().mkpath(folder);
    return folder.toStdString();
}

void SavePicture(QWidget& widget, const std::string& name)
{
    const QString path = QString::fromStdString(PictureFolder() + "/" + name + ".png");
    EXPECT_TRUE(widget.grab().save(path)) << path.toStdString();
}

QList<QWidget*> Controls(QWidget& root)
{
    QList<QWidget*> controls;
    for (QWidget* widget : root.findChildren<QWidget*>())
        if (widget->objectName().startsWith("id"))
            controls << widget;
    return controls;
}

void Press(QAbstractButton* button)
{
    ASSERT_NE(button, nullptr);
    ASSERT_TRUE(button->isVisible() && button->isEnabled())
        << button->text().toStdString() << " cannot be pressed: visible " << button->isVisible() << " enabled "
        << button->isEnabled() << " in " << (button->window() ? button->window()->metaObject()->className() : "");
    // A radio button or check box answers on its box and text, not on empty space beside them.
    const bool hasIndicator = qobject_cast<QRadioButton*>(button) || qobject_cast<QCheckBox*>(button);
    const QPoint where = hasIndicator ? QPoint(8, button->height() / 2) : button->rect().center();
    QTest::mouseClick(button, Qt::LeftButton, Qt::NoModifier, where);
    // Lets the layouts settle, as the event loop would before anyone looks.
    QCoreApplication::processEvents();
}

WizardWindow::WizardWindow(CEngine* engine) : Driver(nullptr), m_owned(std::make_unique<CWizard>())
{
    m_wizard = m_owned.get();
    m_wizard->m_pEngine = engine;
    m_wizard->show();
}

WizardWindow::~WizardWindow() { m_wizard->hide(); }

void Driver::Click(int id) { Press(Find<QAbstractButton>(id)); }

void Driver::Browse(int id) { Press(m_wizard->findChild<QAbstractButton*>(ui::ControlName(id) + "Browse")); }

std::string Driver::Text(int id)
{
    auto* edit = Find<QLineEdit>(id);
    return edit ? edit->text().toStdString() : std::string("<no edit>");
}

void Driver::Type(int id, const std::string& text)
{
    auto* edit = Find<QLineEdit>(id);
    ASSERT_NE(edit, nullptr) << "no edit " << id;
    edit->clear();
    QTest::keyClicks(edit, QString::fromStdString(text));
}

void Driver::Choose(int id, const std::string& text) { ChooseEntry(Find<QComboBox>(id), text); }

void Driver::Tick(int id, bool ticked)
{
    auto* box = Find<QAbstractButton>(id);
    ASSERT_NE(box, nullptr) << "no check box " << id;
    if (box->isChecked() != ticked)
        Press(box);
}

void ChooseEntry(QComboBox* list, const std::string& text)
{
    ASSERT_NE(list, nullptr);
    ASSERT_TRUE(list->isVisible() && list->isEnabled()) << "the list cannot be used for " << text;
    const int index = list->findText(QString::fromStdString(text), Qt::MatchExactly);
    ASSERT_GE(index, 0) << "no entry " << text;
    list->setCurrentIndex(index);
    emit list->activated(index);
}

void PressCell(CManualDefGridWnd& grid, int row, int column)
{
    const QModelIndex index = grid.model()->index(row - 1, column - 1);
    grid.scrollTo(index);
    QTest::mouseClick(grid.viewport(), Qt::LeftButton, Qt::NoModifier, grid.visualRect(index).center());
    QCoreApplication::processEvents();
}

void TypeInCell(CManualDefGridWnd& grid, int row, int column, const std::string& text)
{
    PressCell(grid, row, column);
    auto* edit = qobject_cast<QLineEdit*>(grid.indexWidget(grid.model()->index(row - 1, column - 1)));
    ASSERT_NE(edit, nullptr) << "cell " << row << "," << column << " did not open for typing";
    edit->selectAll();
    QTest::keyClicks(edit, QString::fromStdString(text));
    QTest::keyClick(edit, Qt::Key_Return);
    QCoreApplication::processEvents();
}

void ChooseInCell(CManualDefGridWnd& grid, int row, int column, const std::string& text)
{
    PressCell(grid, row, column);
    auto* list = qobject_cast<QComboBox*>(grid.indexWidget(grid.model()->index(row - 1, column - 1)));
    ASSERT_NE(list, nullptr) << "cell " << row << "," << column << " did not open a list";
    ChooseEntry(list, text);
    QCoreApplication::processEvents();
}

std::string CellText(const CManualDefGridWnd& grid, int row, int column)
{
    const QTableWidgetItem* item = grid.item(row - 1, column - 1);
    return item ? item->text().toStdString() : std::string("<no cell>");
}

void WhenDialogShown(const std::function<void(QDialog&)>& script)
{
    QTimer::singleShot(0, [script] {
        QDialog* shown = nullptr;
        for (QWidget* widget : QApplication::topLevelWidgets())
            if (auto* dialog = qobject_cast<QDialog*>(widget);
                dialog && dialog->isVisible() && !qobject_cast<CWizard*>(dialog))
                shown = dialog;
        EXPECT_NE(shown, nullptr) << "no dialog showed";
        if (!shown)
            return;
        script(*shown);
        if (shown->isVisible())
            shown->reject();
    });
}

void Driver::Next() { Press(m_wizard->button(QWizard::NextButton)); }
void Driver::Back() { Press(m_wizard->BackButton()); }
void Driver::Finish() { Press(m_wizard->button(QWizard::FinishButton)); }
void Driver::Cancel() { Press(m_wizard->button(QWizard::CancelButton)); }
void Driver::Preview() { Press(m_wizard->m_btnPreview); }

bool Driver::PreviewVisible() const
{
    return m_wizard->m_btnPreview && m_wizard->m_btnPreview->isVisible() && m_wizard->m_btnPreview->isEnabled();
}

int RunModal(const std::function<int()>& run, const std::function<void(Driver&)>& script)
{
    QTimer::singleShot(0, [&script] {
        CWizard* wizard = ShownWizard();
        EXPECT_NE(wizard, nullptr) << "the wizard did not show";
        if (!wizard)
            return;
        Driver driver(wizard);
        script(driver);
        if (wizard->isVisible())
            wizard->reject();
    });
    return run();
}

} // namespace guitest
