#include "platform/harbor/qt/WelcomePage.h"

#include <QLabel>
#include <QVBoxLayout>

CWelcomePage::CWelcomePage(QWidget* parent) : CHarborPage(IDD, parent)
{
    // The label is owned by the page.
    auto* hint = new QLabel(tr("The following pages ask for the input, how it is laid out, the items to convert and "
                               "the output, and check each answer against the files.\n\n"
                               "Press Next to begin, or Cancel to leave the setup as it is."),
                            this);
    hint->setObjectName("welcomeText");
    hint->setWordWrap(true);
    SetPageSize(kPageWidthUnits, kPageHeightUnits);
    auto* layout = new QVBoxLayout(this);
    layout->addWidget(hint);
    layout->addStretch(1);
}

void CWelcomePage::SetToolText(const CString& title, const CString& text)
{
    setTitle(QString::fromStdString(title));
    setSubTitle(QString::fromStdString(text));
}
