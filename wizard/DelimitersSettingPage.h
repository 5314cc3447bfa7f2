#pragma once
// The page on which the user says how the fields of an ASCII file are separated and which decimal
// separator its numbers use.
#include "wizard/DelimitersForm.h"
#include "wizard/TSHarborPage.h"

class QCheckBox;
class QComboBox;
class QLineEdit;

class CDelimitersSettingPage : public CTSHarborPage {
    Q_OBJECT
public:
    enum : int { IDD = 2280 };
    enum : int { IDC_DELIMITER = 212, IDC_CONSECUTIVE = 213, IDC_LINE_START = 214, IDC_DECIMAL_SEPARATOR = 215,
                 IDC_USER_DELIMITER = 256 };

    explicit CDelimitersSettingPage(QWidget* parent = nullptr);

    bool OnInitDialog() override;
    bool OnSetActive() override;
    int OnWizardNext() override;
    int OnPreview() override;
    CString HelpText() const override;

    DelimitersState ReadControls() const;
    void ShowState(const DelimitersState& state);

private:
    void OnSelchangeDelimiter(int index);
    void OnSelchangeDecimalSeparator() {}

    QComboBox* m_listDelimiter = nullptr; // the controls are owned by the page
    QLineEdit* m_editUserDelimiter = nullptr;
    QCheckBox* m_checkConsecutive = nullptr;
    QCheckBox* m_checkLineStart = nullptr;
    QComboBox* m_listDecimal = nullptr;
};
