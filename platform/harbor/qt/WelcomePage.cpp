#include "platform/harbor/qt/WelcomePage.h"

#include <QLabel>
#include <QVBoxLayout>

CWelcomePage::CWelcomePage(QWidget* parent) : CHarborPage(IDD, parent)
{
    setTitle(tr("Welcome"));
    // The labels are owned by the page.
    m_labelTitle = new QLabel(this);
    m_labelTitle->setObjectName("welcomeTitle");
    QFont large = m_labelTitle->font();
    large.setPointSizeF(large.pointSizeF() * 1.6);
    large.setBold(true);
    m_labelTitle->setFont(large);
    m_labelText = new QLabel(this);
    m_labelText->setObjectName("welcomeText");
    m_labelText->setWordWrap(true);
    auto* hint = new QLabel(tr("Press Next to describe the conversion, or Cancel to leave the setup as it is."), this);
    hint->setWordWrap(true);
    auto* layout = new QVBoxLayout(this);
    layout->addWidget(m_labelTitle);
    layout->addSpacing(12);
    layout->addWidget(m_labelText);
    layout->addStretch(1);
    layout->addWidget(hint);
}

void CWelcomePage::SetToolText(const CString& title, const CString& text)
{
    m_labelTitle->setText(QString::fromStdString(title));
    m_labelText->setText(QString::fromStdString(text));
}
