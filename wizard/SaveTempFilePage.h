#pragma once
// The page on which the user names the XML file a modified or hand-made template is saved to.
#include "wizard/TSHarborPage.h"

class QLineEdit;
class QPushButton;

class CSaveTempFilePage : public CTSHarborPage {
    Q_OBJECT
public:
    enum : int { IDD = 2282 };
    enum : int { IDC_BROWSE = 258, IDC_FILE = 263 };

    explicit CSaveTempFilePage(QWidget* parent = nullptr);

    bool OnInitDialog() override;
    bool OnSetActive() override;
    int OnWizardNext() override;
    CString HelpText() const override;

    int ValidateTemplateName();

private:
    void OnBrowseTemplateFile();

    QLineEdit* m_editFile = nullptr; // the controls are owned by the page
    QPushButton* m_btnBrowse = nullptr;
};
