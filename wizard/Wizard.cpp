#include "wizard/Wizard.h"

#include "platform/harbor/qt/OverviewPage.h"
#include "platform/harbor/qt/WelcomePage.h"
#include "platform/ui/qt/Controls.h"
#include "wizard/DataDescSettingPage.h"
#include "wizard/DefineOutputItemsPage.h"
#include "wizard/DefineTemplatePage.h"
#include "wizard/DelimitersSettingPage.h"
#include "wizard/ExcelTimeDescSettingPage.h"
#include "wizard/OutputDataPage.h"
#include "wizard/SaveTempFilePage.h"
#include "wizard/SelectInputPage.h"
#include "wizard/TimeDescSettingPage.h"

#include <QPushButton>

namespace {

constexpr int kPreviewLeft = 10;

} // namespace

CWizard::CWizard() : CHarborWizard("Velmora", nullptr, 0)
{
    // The pages are owned by the wizard once added.
    m_pageWelcome = new CWelcomePage();
    m_pageSelectInput = new CSelectInputPage();
    m_pageDefineTemplate = new CDefineTemplatePage();
    m_pageDelimiters = new CDelimitersSettingPage();
    m_pageTimeDesc = new CTimeDescSettingPage();
    m_pageDataDesc = new CDataDescSettingPage();
    m_pageOutput = new COutputDataPage();
    m_pageSaveTemplate = new CSaveTempFilePage();
    m_pageItems = new CDefineOutputItemsPage();
    m_pageOverview = new COverviewPage();
    m_pageExcelTimeDesc = new CExcelTimeDescSettingPage();
    m_pageWelcome->SetToolText("Velmora", "Using this tool you can do batch conversion amongst rbx0, ASCII and excel files");

    // Sheet order, which differs from the order the pages are made in.
    AddPage(m_pageWelcome);
    AddPage(m_pageSelectInput);
    AddPage(m_pageDefineTemplate);
    AddPage(m_pageDelimiters);
    AddPage(m_pageTimeDesc);
    AddPage(m_pageExcelTimeDesc);
    AddPage(m_pageDataDesc);
    AddPage(m_pageItems);
    AddPage(m_pageSaveTemplate);
    AddPage(m_pageOutput);
    AddPage(m_pageOverview);
}

bool CWizard::OnInitDialog()
{
    CHarborWizard::OnInitDialog();
    m_btnPreview = ui::Identify(new QPushButton(tr("&Preview"), this), IDC_PREVIEW);
    m_btnPreview->setFont(font());
    m_btnPreview->setEnabled(true);
    m_btnPreview->hide();
    connect(m_btnPreview, &QPushButton::clicked, this, &CWizard::OnPreview);
    return true;
}

void CWizard::PlacePreviewButton()
{
    QAbstractButton* next = button(QWizard::NextButton);
    if (!m_btnPreview || !next)
        return;
    const QPoint topLeft = next->mapTo(this, QPoint(0, 0));
    m_btnPreview->setGeometry(kPreviewLeft, topLeft.y(), next->width(), next->height());
}

void CWizard::resizeEvent(QResizeEvent* event)
{
    CHarborWizard::resizeEvent(event);
    PlacePreviewButton();
}

void CWizard::showEvent(QShowEvent* event)
{
    CHarborWizard::showEvent(event);
    PlacePreviewButton();
}

void CWizard::OnPreview()
{
    if (auto* page = dynamic_cast<CTSHarborPage*>(GetActivePage()))
        page->OnPreview();
}
