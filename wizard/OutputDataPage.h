#pragma once
// The page on which the user chooses the output format and names the output file or folder.
#include "wizard/OutputForm.h"
#include "wizard/TSHarborPage.h"

class QLineEdit;
class QPushButton;
class QRadioButton;

class COutputDataPage : public CTSHarborPage {
    Q_OBJECT
public:
    enum : int { IDD = 2283 };
    enum : int { IDC_RBX0 = 207, IDC_ASCII = 209, IDC_EXCEL = 210, IDC_BROWSE_FILE = 260, IDC_BROWSE_FOLDER = 262,
                 IDC_FILE = 264, IDC_FOLDER = 268, IDC_TITLE = 270 };

    explicit COutputDataPage(QWidget* parent = nullptr);

    bool OnInitDialog() override;
    bool OnSetActive() override;
    int OnWizardNext() override;
    int GetBackPageID() override;
    CString HelpText() const override;

    void EnableOutputControls();
    int ValidateOutput();

    OutputState ReadControls() const;
    void ShowState(const OutputState& state);

private:
    void OnBrowseOutputFile();
    void OnBrowseOutputFolder();
    void OnClickedOutputFormat();
    int InputType() const;

    QRadioButton* m_radioRbx0 = nullptr; // the controls are owned by the page
    QRadioButton* m_radioAscii = nullptr;
    QRadioButton* m_radioExcel = nullptr;
    QLineEdit* m_editFile = nullptr;
    QLineEdit* m_editFolder = nullptr;
    QLineEdit* m_editTitle = nullptr;
    QPushButton* m_btnFile = nullptr;
    QPushButton* m_btnFolder = nullptr;
};
