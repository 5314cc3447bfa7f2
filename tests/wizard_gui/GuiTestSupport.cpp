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
    QDir().mkpath(VELMORA_PICTURE_DIR);
    return VELMORA_PICTURE_DIR;
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
