#include "wizard/DataDescSettingPage.h"

#include "engine/Engine.h"
#include "platform/ui/qt/Controls.h"
#include "platform/ui/qt/SpinButton.h"
#include "wizard/DataManualDefineDlg.h"
#include "wizard/PageFlow.h"

#include <QButtonGroup>
#include <QCheckBox>
#include <QComboBox>
#include <QGridLayout>
#include <QGroupBox>
#include <QHBoxLayout>
#include <QLabel>
#include <QLineEdit>
#include <QPushButton>
#include <QRadioButton>
#include <QVBoxLayout>

namespace {

constexpr int kLowestRow = 1;
constexpr int kHighestRow = 100;
// The layout columns of a group: option, its field, a gap, option, its field.
enum : int { kFirstOption = 0, kFirstField = 1, kGap = 2, kSecondOption = 3, kSecondField = 4 };

ChoiceList ReadList(const QComboBox* list)
{
    ChoiceList choices;
    choices.entries = ui::EntriesOf(list);
    choices.selected = list->currentIndex();
    return choices;
}

QGridLayout* GroupGrid(QGroupBox* box)
{
    auto* grid = new QGridLayout(box); // owned by the box
    // A blank in the gap, so that every group spaces it alike (a grid leaves out empty columns).
    auto* gap = new QWidget(box); // owned by the box
    gap->setFixedWidth(8);
    grid->addWidget(gap, 0, kGap);
    grid->setColumnStretch(kSecondField + 1, 1);
    return grid;
}

} // namespace

CDataDescSettingPage::CDataDescSettingPage(QWidget* parent) : CTSHarborPage(IDD, parent)
{
    setWindowTitle(tr("Data Description"));
    setTitle(tr("Data Description"));
    setSubTitle(tr("Here you define how the data values are stored in the input data file. "));
    auto* layout = new QVBoxLayout(this);
    layout->setSpacing(4);
    layout->addWidget(MakeTitleGroup());
    layout->addWidget(MakeDescriptionGroup(
        kItemTypeGroup, tr("Item type"),
        {IDC_TYPE_SAME, IDC_TYPE_IN_ROW, IDC_TYPES_BY_HAND, IDC_TYPE_LIST, IDC_TYPE_ROW, IDC_TYPE_ROW_SPIN,
         IDC_DEFINE_TYPES},
        {tr("Same item type for all variables:"), tr("Item type in row:"), tr("Define item types manually:")}));
    layout->addWidget(MakeDescriptionGroup(
        kUnitGroup, tr("Unit"),
        {IDC_UNIT_SAME, IDC_UNIT_IN_ROW, IDC_UNITS_BY_HAND, IDC_UNIT_LIST, IDC_UNIT_ROW, IDC_UNIT_ROW_SPIN,
         IDC_DEFINE_UNITS},
        {tr("Same unit for all items:"), tr("Unit in row:"), tr("Define units manually:")}));
    layout->addWidget(MakeDescriptionGroup(
        kValueTypeGroup, tr("Value type"),
        {IDC_VALUE_TYPE_SAME, IDC_VALUE_TYPE_IN_ROW, IDC_VALUE_TYPES_BY_HAND, IDC_VALUE_TYPE_LIST, IDC_VALUE_TYPE_ROW,
         IDC_VALUE_TYPE_ROW_SPIN, IDC_DEFINE_VALUE_TYPES},
        {tr("Same value type for all items:"), tr("Value type in row:"), tr("Define value types manually:")}));
    layout->addWidget(MakeDataGroup());
    layout->addStretch(1);
    AlignGroupColumns();
    // The four "Define..." buttons share their few letters before the rest of the page takes any.
    m_btnDefineNames->setText(tr("&Define..."));
    m_groups[kItemTypeGroup].define->setText(tr("D&efine..."));
    m_groups[kUnitGroup].define->setText(tr("De&fine..."));
    m_groups[kValueTypeGroup].define->setText(tr("Def&ine..."));
    SetPageSize(kPageWidthUnits, kPageHeightUnits);
    // Finish is not on this page, so its letter serves a "Define..." button.
    ui::AssignMnemonics(this, QStringLiteral("bnhp"));
}

QLayout* CDataDescSettingPage::RowField(int editId, int spinId, const QString& name, QLineEdit*& edit,
                                        ui::SpinButton*& spin)
{
    edit = ui::Identify(ui::NumberEdit(this), editId, name);
    spin = ui::Identify(new ui::SpinButton(edit, this), spinId, name + tr(" spin"));
    spin->SetRange(kLowestRow, kHighestRow);
    auto* field = new QHBoxLayout(); // owned by the layout it is added to
    field->setSpacing(0);
    field->addWidget(edit);
    field->addWidget(spin);
    field->addStretch(1);
    return field;
}

QPushButton* CDataDescSettingPage::DefineButton(int id, const QString& text, const QString& name)
{
    auto* button = ui::Identify(new QPushButton(text, this), id, name);
    button->setSizePolicy(QSizePolicy::Fixed, QSizePolicy::Fixed);
    connect(button, &QPushButton::clicked, this, &CDataDescSettingPage::OnClickedDefine);
    return button;
}

QWidget* CDataDescSettingPage::MakeTitleGroup()
{
    // The controls are owned by the page; the layouts place them in the box.
    auto* box = new QGroupBox(tr("Item title"), this);
    m_radioNamesInRow = ui::Identify(new QRadioButton(tr("Item names in row:"), this), IDC_NAMES_IN_ROW);
    QLayout* row = RowField(IDC_NAME_ROW, IDC_NAME_ROW_SPIN, m_radioNamesInRow->text(), m_editNameRow, m_spinNameRow);
    m_radioNamesByHand = ui::Identify(new QRadioButton(tr("Define item names manually:"), this), IDC_NAMES_BY_HAND);
    m_btnDefineNames = DefineButton(IDC_DEFINE_NAMES, tr("Define..."), tr("Define item names"));
    auto* options = new QButtonGroup(box);
    options->addButton(m_radioNamesInRow);
    options->addButton(m_radioNamesByHand);
    QGridLayout* grid = GroupGrid(box);
    grid->addWidget(m_radioNamesInRow, 0, kFirstOption);
    grid->addLayout(row, 0, kFirstField);
    grid->addWidget(m_radioNamesByHand, 0, kSecondOption);
    grid->addWidget(m_btnDefineNames, 0, kSecondField);
    m_groupGrids.push_back(grid);
    ApplyRuleOnClick(this, m_radioNamesInRow, [](DataDescState& s) { ClickTitleOption(s, 0); });
    ApplyRuleOnClick(this, m_radioNamesByHand, [](DataDescState& s) { ClickTitleOption(s, 1); });
    return box;
}

QWidget* CDataDescSettingPage::MakeDescriptionGroup(DescriptionGroupIndex index, const QString& title,
                                                    const std::array<int, 7>& ids, const std::array<QString, 3>& texts)
{
    enum { kSame, kInRow, kByHand, kList, kRow, kSpin, kDefine };
    GroupControls& controls = m_groups[index];
    auto* box = new QGroupBox(title, this);
    auto* options = new QButtonGroup(box);
    for (int option = 0; option < 3; ++option) {
        auto* radio = ui::Identify(new QRadioButton(texts[static_cast<size_t>(option)], this), ids[static_cast<size_t>(option)]);
        options->addButton(radio);
        controls.radios[static_cast<size_t>(option)] = radio;
        ApplyRuleOnClick(this, radio, [index, option](DataDescState& s) { ClickGroupOption(s, index, option); });
    }
    controls.list = ui::Identify(ui::DropDownList(this), ids[kList], texts[0]);
    QLayout* row = RowField(ids[kRow], ids[kSpin], texts[1], controls.row, controls.spin);
    controls.define = DefineButton(ids[kDefine], tr("Define..."), texts[2].chopped(1));
    QGridLayout* grid = GroupGrid(box);
    grid->addWidget(controls.radios[0], 0, kFirstOption);
    grid->addWidget(controls.list, 0, kFirstField, 1, kSecondField, Qt::AlignLeft);
    grid->addWidget(controls.radios[1], 1, kFirstOption);
    grid->addLayout(row, 1, kFirstField);
    grid->addWidget(controls.radios[2], 1, kSecondOption);
    grid->addWidget(controls.define, 1, kSecondField);
    m_groupGrids.push_back(grid);
    ui::ChainTabs({controls.radios[0], controls.list, controls.radios[1], controls.row, controls.radios[2],
                   controls.define});
    if (index == kItemTypeGroup)
        connect(controls.list, &QComboBox::activated, this, &CDataDescSettingPage::OnSelchangeItemType);
    return box;
}

QWidget* CDataDescSettingPage::MakeDataGroup()
{
    auto* box = new QGroupBox(tr("Data description"), this);
    auto* startLabel = new QLabel(tr("Data start row:"), this);
    QLayout* startRow = RowField(IDC_START_ROW, IDC_START_ROW_SPIN, startLabel->text(), m_editStartRow, m_spinStartRow);
    startLabel->setBuddy(m_editStartRow);
    m_checkDeleteValue = ui::Identify(new QCheckBox(tr("Delete value is not empty value"), this), IDC_DELETE_VALUE_CHECK);
    m_radioDeleteValue = ui::Identify(new QRadioButton(tr("Use delete value:"), this), IDC_DELETE_VALUE_USE);
    m_editDeleteValue = ui::Identify(new QLineEdit(this), IDC_DELETE_VALUE, m_radioDeleteValue->text());
    m_editDeleteValue->setMaximumWidth(m_editDeleteValue->fontMetrics().horizontalAdvance(QStringLiteral("-0.000001e-10")));
    m_radioDeleteRow = ui::Identify(new QRadioButton(tr("Delete value in row:"), this), IDC_DELETE_VALUE_IN_ROW);
    QLayout* deleteRow =
        RowField(IDC_DELETE_ROW, IDC_DELETE_ROW_SPIN, m_radioDeleteRow->text(), m_editDeleteRow, m_spinDeleteRow);
    auto* options = new QButtonGroup(box);
    options->addButton(m_radioDeleteValue);
    options->addButton(m_radioDeleteRow);
    QGridLayout* grid = GroupGrid(box);
    grid->addWidget(startLabel, 0, kFirstOption);
    grid->addLayout(startRow, 0, kFirstField);
    grid->addWidget(m_checkDeleteValue, 0, kSecondOption, 1, 2);
    grid->addWidget(m_radioDeleteValue, 1, kFirstOption);
    grid->addWidget(m_editDeleteValue, 1, kFirstField);
    grid->addWidget(m_radioDeleteRow, 1, kSecondOption);
    grid->addLayout(deleteRow, 1, kSecondField);
    m_groupGrids.push_back(grid);
    connect(m_checkDeleteValue, &QCheckBox::clicked, this, &CDataDescSettingPage::OnClickedDeleteValueCheck);
    ApplyRuleOnClick(this, m_radioDeleteValue, [](DataDescState& s) { ClickDeleteValueOption(s, 0); });
    ApplyRuleOnClick(this, m_radioDeleteRow, [](DataDescState& s) { ClickDeleteValueOption(s, 1); });
    return box;
}

void CDataDescSettingPage::AlignGroupColumns()
{
    // The same column widths in every group, so that the options stand under each other.
    for (int column : {kFirstOption, kFirstField, kSecondOption}) {
        int width = 0;
        for (QGridLayout* grid : m_groupGrids) {
            for (int i = 0; i < grid->count(); ++i) {
                int row = 0, at = 0, rowSpan = 0, columnSpan = 0;
                grid->getItemPosition(i, &row, &at, &rowSpan, &columnSpan);
                if (at == column && columnSpan == 1)
                    width = std::max(width, grid->itemAt(i)->sizeHint().width());
            }
        }
        for (QGridLayout* grid : m_groupGrids)
            grid->setColumnMinimumWidth(column, width);
    }
}

DataDescState CDataDescSettingPage::ReadControls() const
{
    DataDescState state;
    state.titleOption = m_radioNamesInRow->isChecked() ? 0 : 1;
    state.nameRow = m_editNameRow->text().toInt(); // an empty box reads as 0
    state.nameRowEnabled = m_editNameRow->isEnabled();
    state.defineNamesEnabled = m_btnDefineNames->isEnabled();
    for (size_t g = 0; g < 3; ++g) {
        const GroupControls& controls = m_groups[g];
        DescriptionGroup& group = state.groups[g];
        group.option = controls.radios[0]->isChecked() ? 0 : controls.radios[1]->isChecked() ? 1 : 2;
        group.list = ReadList(controls.list);
        group.row = controls.row->text().toInt();
        group.listEnabled = controls.list->isEnabled();
        group.rowEnabled = controls.row->isEnabled();
        group.defineEnabled = controls.define->isEnabled();
    }
    state.startRow = m_editStartRow->text().toInt();
    state.deleteValueUsed = m_checkDeleteValue->isChecked() ? 1 : 0;
    state.deleteValueOption = m_radioDeleteValue->isChecked() ? 0 : m_radioDeleteRow->isChecked() ? 1 : -1;
    state.deleteValue = m_editDeleteValue->text().toStdString();
    state.deleteValueRow = m_editDeleteRow->text().toInt();
    state.deleteRadiosEnabled = m_radioDeleteValue->isEnabled();
    state.deleteValueEnabled = m_editDeleteValue->isEnabled();
    state.deleteRowEnabled = m_editDeleteRow->isEnabled();
    state.definitions = m_vecItemDefs;
    return state;
}

void CDataDescSettingPage::ShowState(const DataDescState& state)
{
    (state.titleOption == 0 ? m_radioNamesInRow : m_radioNamesByHand)->setChecked(true);
    m_editNameRow->setText(QString::number(state.nameRow));
    m_editNameRow->setEnabled(state.nameRowEnabled);
    m_btnDefineNames->setEnabled(state.defineNamesEnabled);
    for (size_t g = 0; g < 3; ++g) {
        const GroupControls& controls = m_groups[g];
        const DescriptionGroup& group = state.groups[g];
        controls.radios[static_cast<size_t>(std::clamp(group.option, 0, 2))]->setChecked(true);
        ui::ShowEntries(controls.list, group.list.entries, group.list.selected);
        controls.row->setText(QString::number(group.row));
        controls.list->setEnabled(group.listEnabled);
        controls.row->setEnabled(group.rowEnabled);
        controls.define->setEnabled(group.defineEnabled);
    }
    m_editStartRow->setText(QString::number(state.startRow));
    m_checkDeleteValue->setChecked(state.deleteValueUsed != 0);
    if (state.deleteValueOption == 0 || state.deleteValueOption == 1)
        (state.deleteValueOption == 0 ? m_radioDeleteValue : m_radioDeleteRow)->setChecked(true);
    m_editDeleteValue->setText(QString::fromStdString(state.deleteValue));
    m_editDeleteRow->setText(QString::number(state.deleteValueRow));
    m_radioDeleteValue->setEnabled(state.deleteRadiosEnabled);
    m_radioDeleteRow->setEnabled(state.deleteRadiosEnabled);
    m_editDeleteValue->setEnabled(state.deleteValueEnabled);
    m_editDeleteRow->setEnabled(state.deleteRowEnabled);
    m_vecItemDefs = state.definitions;
}

bool CDataDescSettingPage::OnInitDialog()
{
    CTSHarborPage::OnInitDialog();
    ShowState(InitialDataDescription());
    // The three lists as wide as the widest, the item types, whatever units they come to hold.
    int width = 0;
    for (const GroupControls& controls : m_groups)
        width = std::max(width, controls.list->sizeHint().width());
    for (const GroupControls& controls : m_groups)
        controls.list->setMinimumWidth(width);
    return true;
}

bool CDataDescSettingPage::OnSetActive()
{
    CDataDescription record;
    if (CEngine* engine = Engine(); engine && engine->m_pSpecification)
        record = engine->m_pSpecification->m_DataDesc;
    ShowDataDescription(record);
    SetPreviewButton(true, true);
    return CTSHarborPage::OnSetActive();
}

void CDataDescSettingPage::ShowDataDescription(const CDataDescription& record)
{
    ApplyRule(*this, [&record](DataDescState& state) { ::ShowDataDescription(state, record); });
}

int CDataDescSettingPage::CollectDataDescription(CDataDescription& record) const
{
    return ::CollectDataDescription(ReadControls(), record);
}

int CDataDescSettingPage::GetItemDefinitions(std::vector<CItemDefinition>& definitions)
{
    CEngine* engine = Engine();
    return engine ? ::GetItemDefinitions(ReadControls(), *engine, definitions) : 0;
}

int CDataDescSettingPage::CheckManualDefinitions()
{
    DataDescState state = ReadControls();
    const int complete = ::CheckManualDefinitions(state, Engine());
    m_vecItemDefs = state.definitions;
    return complete;
}

void CDataDescSettingPage::OnClickedDeleteValueCheck() { ApplyRule(*this, ClickDeleteValueUsed); }

void CDataDescSettingPage::OnSelchangeItemType(int index)
{
    ApplyRule(*this, [index](DataDescState& state) { SelectItemType(state, index); });
}

void CDataDescSettingPage::OnClickedDefine()
{
    ManualDefinitionRequest request;
    if (!PrepareManualDefinition(ReadControls(), Engine(), request))
        return;
    CDataManualDefineDlg dialog(this);
    dialog.m_vecItemDefs = request.definitions;
    dialog.m_arrEditable = request.editable;
    if (dialog.DoModal() == CDataManualDefineDlg::IDOK)
        m_vecItemDefs = dialog.m_vecItemDefs;
}

int CDataDescSettingPage::OnWizardNext()
{
    DataDescState state = ReadControls();
    const bool accepted = AcceptDataDescription(state, Engine());
    m_vecItemDefs = state.definitions;
    if (!accepted)
        return -1;
    return LeaveForward();
}

int CDataDescSettingPage::OnPreview()
{
    DataDescState state = ReadControls();
    const int shown = PreviewDataDescription(state, Engine());
    m_vecItemDefs = state.definitions;
    return shown;
}

int CDataDescSettingPage::GetBackPageID() { return BackPageOf(IDD, Engine()); }

CString CDataDescSettingPage::HelpText() const
{
    return "Say which row of the file holds the item names, or define the names by hand. Item types, units and "
           "value types can be one value for all items, a row of the file, or defined by hand in a grid "
           "(\"Define...\"). Rows count from 1; the data start below every header row in use. Tick \"Delete value "
           "is not empty value\" when missing values are marked by a value, given here or in a row of the file. "
           "Next checks the description against the file.";
}
