#pragma once
// The setup wizard: the framework's welcome and overview pages around the tool's pages, in sheet
// order, and a Preview button that runs the active page's preview.
#include "platform/harbor/qt/HarborWizard.h"

class CDataDescSettingPage;
class CDefineOutputItemsPage;
class CDefineTemplatePage;
class CDelimitersSettingPage;
class CExcelTimeDescSettingPage;
class COutputDataPage;
class COverviewPage;
class CSaveTempFilePage;
class CSelectInputPage;
class CTimeDescSettingPage;
class CWelcomePage;
class QPushButton;

class CWizard : public CHarborWizard {
    Q_OBJECT
public:
    enum : int { IDC_PREVIEW = 277 };

    CWizard();

    QPushButton* m_btnPreview = nullptr; // made by OnInitDialog; owned by the wizard
    // The pages, owned by the wizard (their Qt parent).
    CWelcomePage* m_pageWelcome = nullptr;
    CSelectInputPage* m_pageSelectInput = nullptr;
    CDefineTemplatePage* m_pageDefineTemplate = nullptr;
    CDelimitersSettingPage* m_pageDelimiters = nullptr;
    CTimeDescSettingPage* m_pageTimeDesc = nullptr;
    CDataDescSettingPage* m_pageDataDesc = nullptr;
    COutputDataPage* m_pageOutput = nullptr;
    CSaveTempFilePage* m_pageSaveTemplate = nullptr;
    CDefineOutputItemsPage* m_pageItems = nullptr;
    COverviewPage* m_pageOverview = nullptr;
    CExcelTimeDescSettingPage* m_pageExcelTimeDesc = nullptr;

protected:
    // Makes the Preview button, hidden, where it belongs.
    bool OnInitDialog() override;
    void resizeEvent(QResizeEvent* event) override;
    void showEvent(QShowEvent* event) override;

private:
    void OnPreview();
    // The Next button's size, 10 pixels from the sheet's left edge, on the Next button's line.
    void PlacePreviewButton();
};
