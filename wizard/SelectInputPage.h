#pragma once
// The first tool page: one file or a whole folder, its format, and the file or folder itself.
#include "wizard/SelectInputForm.h"
#include "wizard/TSHarborPage.h"

class CVelmoraBrowseCtrl;
class CVelmoraBrowseDirEdit;
class QRadioButton;

class CSelectInputPage : public CTSHarborPage {
    Q_OBJECT
public:
    enum : int { IDD = 2278 };
    enum : int { IDC_SINGLE_FILE = 201, IDC_ASCII = 202, IDC_RBX0 = 203, IDC_EXCEL = 204, IDC_FOLDER = 205,
                 IDC_FILE = 206, IDC_FOLDER_PATH = 208 };

    explicit CSelectInputPage(QWidget* parent = nullptr);

    bool OnInitDialog() override;
    bool OnSetActive() override;
    int OnWizardNext() override;
    int GetNextPageID() override;
    CString HelpText() const override;

    SelectInputState ReadControls() const;
    void ShowState(const SelectInputState& state);

private:

    QRadioButton* m_radioSingleFile = nullptr; // the controls are owned by the page
    QRadioButton* m_radioFolder = nullptr;
    QRadioButton* m_radioRbx0 = nullptr;
    QRadioButton* m_radioAscii = nullptr;
    QRadioButton* m_radioExcel = nullptr;
    CVelmoraBrowseCtrl* m_ctrlFile = nullptr;
    CVelmoraBrowseDirEdit* m_ctrlFolder = nullptr;
};
