#pragma once
// The page that asks how an ASCII or Excel file is described: by a template used unchanged, by a
// template to modify, or by hand.
#include "wizard/DefineTemplateForm.h"
#include "wizard/TSHarborPage.h"

#include <array>

class QLabel;
class QLineEdit;
class QPushButton;
class QRadioButton;

class CDefineTemplatePage : public CTSHarborPage {
    Q_OBJECT
public:
    enum : int { IDD = 2279 };
    enum : int { IDC_USE_UNCHANGED = 249, IDC_BROWSE = 254, IDC_MODIFY = 259, IDC_MANUAL = 261, IDC_TEMPLATE = 263,
                 IDC_LINE1 = 265, IDC_LINE2 = 267, IDC_SEPARATOR = 268, IDC_LINE3 = 269 };

    explicit CDefineTemplatePage(QWidget* parent = nullptr);

    bool OnInitDialog() override;
    bool OnSetActive() override;
    int OnWizardNext() override;
    int OnPreview() override;
    int GetNextPageID() override;
    CString HelpText() const override;

    DefineTemplateState ReadControls() const;
    // Shows `state`, the wizard's Preview button included unless `withPreview` is false.
    void ShowState(const DefineTemplateState& state, bool withPreview = true);

private:
    void OnBrowse();

    int m_nOption = 1; // the page's option as last shown
    std::array<QLabel*, 3> m_lines{}; // the controls are owned by the page
    QRadioButton* m_radioUnchanged = nullptr;
    QRadioButton* m_radioModify = nullptr;
    QRadioButton* m_radioManual = nullptr;
    QLineEdit* m_editTemplate = nullptr;
    QPushButton* m_btnBrowse = nullptr;
};
