#include "platform/harbor/qt/OverviewPage.h"

#include "platform/harbor/HarborEngine.h"

#include <QFontDatabase>
#include <QLabel>
#include <QPlainTextEdit>
#include <QVBoxLayout>

COverviewPage::COverviewPage(QWidget* parent) : CHarborPage(IDD, parent)
{
    setTitle(tr("Overview"));
    setSubTitle(tr("These are the settings of the setup. Press Finish to keep them."));
    // The summary box is owned by the page.
    m_editSummary = new QPlainTextEdit(this);
    m_editSummary->setObjectName("overviewText");
    m_editSummary->setAccessibleName(tr("Summary of the setup"));
    m_editSummary->setReadOnly(true);
    m_editSummary->setLineWrapMode(QPlainTextEdit::NoWrap);
    m_editSummary->setTabStopDistance(QFontMetricsF(m_editSummary->font()).horizontalAdvance(' ') * 4);
    SetPageSize(kPageWidthUnits, kPageHeightUnits);
    auto* layout = new QVBoxLayout(this);
    layout->addWidget(m_editSummary);
}

bool COverviewPage::OnSetActive()
{
    CString text;
    if (CHarborEngine* engine = GetEngine())
        engine->GetOverviewText(text);
    // The summary's lines end in CR LF; the box wants plain line feeds.
    m_editSummary->setPlainText(QString::fromStdString(text).remove('\r'));
    return CHarborPage::OnSetActive();
}

QString COverviewPage::SummaryText() const { return m_editSummary->toPlainText(); }
