#pragma once
// The page on which the user says where an ASCII or Excel file keeps the names, item types, units
// and value types of its items, where its data start, and how missing values are marked.
#include "wizard/DataDescForm.h"
#include "wizard/TSHarborPage.h"

#include <array>

class QCheckBox;
class QComboBox;
class QGridLayout;
class QLineEdit;
class QPushButton;
class QRadioButton;
namespace ui {
class SpinButton;
}

class CDataDescSettingPage : public CTSHarborPage {
    Q_OBJECT
public:
    enum : int { IDD = 2290 };
    enum : int { IDC_NAME_ROW_SPIN = 278, IDC_NAME_ROW = 279, IDC_TYPE_SAME = 280, IDC_NAMES_BY_HAND = 281,
                 IDC_NAMES_IN_ROW = 282, IDC_TYPES_BY_HAND = 283, IDC_UNITS_BY_HAND = 284, IDC_DELETE_VALUE_USE = 285,
                 IDC_DELETE_VALUE_IN_ROW = 286, IDC_DELETE_ROW = 287, IDC_DELETE_ROW_SPIN = 288,
                 IDC_DELETE_VALUE = 289, IDC_DEFINE_TYPES = 290, IDC_DEFINE_UNITS = 291, IDC_DEFINE_VALUE_TYPES = 292,
                 IDC_TYPE_LIST = 293, IDC_TYPE_IN_ROW = 294, IDC_TYPE_ROW = 295, IDC_TYPE_ROW_SPIN = 296,
                 IDC_UNIT_SAME = 297, IDC_UNIT_LIST = 298, IDC_UNIT_IN_ROW = 300, IDC_UNIT_ROW = 301,
                 IDC_UNIT_ROW_SPIN = 302, IDC_VALUE_TYPE_SAME = 303, IDC_VALUE_TYPE_LIST = 304,
                 IDC_VALUE_TYPE_IN_ROW = 305, IDC_VALUE_TYPE_ROW = 306, IDC_VALUE_TYPE_ROW_SPIN = 307,
                 IDC_START_ROW = 308, IDC_START_ROW_SPIN = 309, IDC_DELETE_VALUE_CHECK = 310,
                 IDC_VALUE_TYPES_BY_HAND = 312, IDC_DEFINE_NAMES = 313 };

    explicit CDataDescSettingPage(QWidget* parent = nullptr);

    bool OnInitDialog() override;
    bool OnSetActive() override;
    int OnWizardNext() override;
    int OnPreview() override;
    int GetBackPageID() override;
    CString HelpText() const override;

    // The page's operations, on its controls.
    void ShowDataDescription(const CDataDescription& record);
    int CollectDataDescription(CDataDescription& record) const;
    int GetItemDefinitions(std::vector<CItemDefinition>& definitions);
    int CheckManualDefinitions();

    DataDescState ReadControls() const;
    void ShowState(const DataDescState& state);

private:
    // The controls of the item type, unit or value type group, owned by the page.
    struct GroupControls {
        std::array<QRadioButton*, 3> radios{}; // same for all, in a row, by hand
        QComboBox* list = nullptr;
        QLineEdit* row = nullptr;
        ui::SpinButton* spin = nullptr;
        QPushButton* define = nullptr;
    };

    QWidget* MakeTitleGroup();
    QWidget* MakeDescriptionGroup(DescriptionGroupIndex index, const QString& title, const std::array<int, 7>& ids,
                                  const std::array<QString, 3>& texts);
    QWidget* MakeDataGroup();
    // A row box with its spin, named after the radio or label in front of it.
    QLayout* RowField(int editId, int spinId, const QString& name, QLineEdit*& edit, ui::SpinButton*& spin);
    QPushButton* DefineButton(int id, const QString& text, const QString& name);
    void AlignGroupColumns();

    void OnClickedDefine();
    void OnClickedDeleteValueCheck();
    void OnSelchangeItemType(int index);

    QRadioButton* m_radioNamesInRow = nullptr;
    QRadioButton* m_radioNamesByHand = nullptr;
    QLineEdit* m_editNameRow = nullptr;
    ui::SpinButton* m_spinNameRow = nullptr;
    QPushButton* m_btnDefineNames = nullptr;
    std::array<GroupControls, 3> m_groups;
    QLineEdit* m_editStartRow = nullptr;
    ui::SpinButton* m_spinStartRow = nullptr;
    QCheckBox* m_checkDeleteValue = nullptr;
    QRadioButton* m_radioDeleteValue = nullptr;
    QRadioButton* m_radioDeleteRow = nullptr;
    QLineEdit* m_editDeleteValue = nullptr;
    QLineEdit* m_editDeleteRow = nullptr;
    ui::SpinButton* m_spinDeleteRow = nullptr;
    std::vector<QGridLayout*> m_groupGrids; // to line the groups' columns up

    std::vector<CItemDefinition> m_vecItemDefs; // the page's own definitions
};
