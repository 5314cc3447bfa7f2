#include "platform/ui/qt/BrowseEdit.h"

#include "platform/ui/qt/Controls.h"

#include <QHBoxLayout>
#include <QLineEdit>
#include <QPushButton>

CBrowseEdit::CBrowseEdit(int id, const QString& label, const QString& buttonName, QWidget* parent) : QWidget(parent)
{
    m_edit = ui::Identify(new QLineEdit(this), id, label);
    m_button = ui::BrowseButton(buttonName, this);
    m_button->setObjectName(ui::ControlName(id) + "Browse");
    auto* layout = new QHBoxLayout(this);
    layout->setContentsMargins(0, 0, 0, 0);
    layout->addWidget(m_edit, 1);
    layout->addWidget(m_button);
    setFocusProxy(m_edit);
    connect(m_button, &QPushButton::clicked, this, [this] { OnBrowse(); });
}

CString CBrowseEdit::GetText() const { return m_edit->text().toStdString(); }

void CBrowseEdit::SetText(const CString& text) { m_edit->setText(QString::fromStdString(text)); }
