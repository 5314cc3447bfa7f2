#pragma once
// What the ASCII and the Excel time description pages share: three option radios, each with a
// group of a format box, a column box with its spin, and for options 1 and 2 a date or time
// picker; the Excel page adds a "use the format" box to each group. The two pages differ only in
// their control ids and layout.
#include "wizard/TSHarborPage.h"
#include "wizard/TimeDescForm.h"

#include <array>

class QCheckBox;
class QDateEdit;
class QGridLayout;
class QLineEdit;
class QRadioButton;
class QTimeEdit;
namespace ui {
class SpinButton;
}

class CTimeDescPage : public CTSHarborPage {
    Q_OBJECT
public:
    bool OnInitDialog() override;
    bool OnSetActive() override;
    int OnWizardNext() override;
    int OnPreview() override;
    int GetNextPageID() override;
    int GetBackPageID() override;
    CString HelpText() const override;

    // The page's operations, on its controls.
    void ShowTimeDescription(const CTimeDescription& record);
    int CollectTimeDescription(CTimeDescription& record) const;

    TimeDescState ReadControls() const;
    void ShowState(const TimeDescState& state);

protected:
    // The ids of one option's controls; 0 for a control the page does not have.
    struct GroupIds {
        int radio;
        int format;
        int column;
        int spin;
        int picker;
        int useFormat;
    };

    CTimeDescPage(int dialogId, bool excel, const std::array<GroupIds, 3>& ids, QWidget* parent);

    // The controls of one option, owned by the page.
    struct Group {
        QRadioButton* radio = nullptr;
        QLineEdit* format = nullptr;
        QLineEdit* column = nullptr;
        ui::SpinButton* spin = nullptr;
        QCheckBox* useFormat = nullptr; // Excel only
        QWidget* picker = nullptr;      // options 1 and 2
    };

    // The column box and its spin side by side.
    QLayout* ColumnField(const Group& group);

    std::array<Group, 3> m_groups;
    QDateEdit* m_pickerDate = nullptr; // owned by the page
    QTimeEdit* m_pickerTime = nullptr;
    QGridLayout* m_grid = nullptr; // the layout of the "Date and time values" group, filled by the page

private:
    void OnClickedDateTimeOption(int option);
    void OnClickedUseFormat(int option);

    bool m_bExcel;
};
