#include "wizard/DelimitersSettingPage.h"

#include "platform/ui/qt/Controls.h"

#include <QCheckBox>
#include <QComboBox>
#include <QGridLayout>
#include <QLabel>
#include <QLineEdit>

namespace {

ChoiceList ReadList(const QComboBox* list)
{
    ChoiceList choices;
    choices.entries = ui::EntriesOf(list);
    choices.selected = list->currentIndex();
    return choices;
}

} // namespace

CDelimitersSettingPage::CDelimitersSettingPage(QWidget* parent) : CTSHarborPage(IDD, parent)
{
    setWindowTitle(tr("Specify Delimiters "));
    setTitle(tr("General Description"));
    setSubTitle(tr("Here you describe the delimiters and decimal separators used in the file. "));
    // Every control is owned by the page.
    m_listDelimiter = ui::Identify(ui::DropDownList(this), IDC_DELIMITER);
    m_editUserDelimiter = ui::Identify(new QLineEdit(this), IDC_USER_DELIMITER, tr("User-defined delimiter"));
    m_checkConsecutive =
        ui::Identify(new QCheckBox(tr("Treat consecutive delimiters as one"), this), IDC_CONSECUTIVE);
    m_checkLineStart =
        ui::Identify(new QCheckBox(tr("Ignore delimiters at beginning of line"), this), IDC_LINE_START);
    m_listDecimal = ui::Identify(ui::DropDownList(this), IDC_DECIMAL_SEPARATOR);
    m_editUserDelimiter->setEnabled(false);

    auto* layout = new QGridLayout(this);
    layout->setColumnStretch(3, 1);
    layout->addWidget(ui::LabelFor(tr("Delimiter:"), m_listDelimiter, this), 0, 0);
    layout->addWidget(m_listDelimiter, 0, 1);
    layout->addWidget(m_editUserDelimiter, 0, 2);
    layout->addWidget(m_checkConsecutive, 1, 0, 1, 4);
    layout->addWidget(m_checkLineStart, 2, 0, 1, 4);
    layout->setRowMinimumHeight(3, 12);
    layout->addWidget(ui::LabelFor(tr("Decimal separator:"), m_listDecimal, this), 4, 0);
    layout->addWidget(m_listDecimal, 4, 1);
    layout->setRowStretch(5, 1);
    FinishPage(kPageWidthUnits, kPageHeightUnits);

    connect(m_listDelimiter, &QComboBox::activated, this, &CDelimitersSettingPage::OnSelchangeDelimiter);
    connect(m_listDecimal, &QComboBox::activated, this, &CDelimitersSettingPage::OnSelchangeDecimalSeparator);
}

DelimitersState CDelimitersSettingPage::ReadControls() const
{
    DelimitersState state;
    state.delimiter = ReadList(m_listDelimiter);
    state.userDelimiter = m_editUserDelimiter->text().toStdString();
    state.userDelimiterEnabled = m_editUserDelimiter->isEnabled();
    state.consecutiveAsOne = m_checkConsecutive->isChecked() ? 1 : 0;
    state.ignoreAtLineStart = m_checkLineStart->isChecked() ? 1 : 0;
    state.decimalSeparator = ReadList(m_listDecimal);
    return state;
}

void CDelimitersSettingPage::ShowState(const DelimitersState& state)
{
    ui::ShowEntries(m_listDelimiter, state.delimiter.entries, state.delimiter.selected);
    m_editUserDelimiter->setText(QString::fromStdString(state.userDelimiter));
    m_editUserDelimiter->setEnabled(state.userDelimiterEnabled);
    m_checkConsecutive->setChecked(state.consecutiveAsOne != 0);
    m_checkLineStart->setChecked(state.ignoreAtLineStart != 0);
    ui::ShowEntries(m_listDecimal, state.decimalSeparator.entries, state.decimalSeparator.selected);
}

bool CDelimitersSettingPage::OnInitDialog()
{
    CTSHarborPage::OnInitDialog();
    ShowState(InitialDelimiters());
    return true;
}

bool CDelimitersSettingPage::OnSetActive()
{
    DelimitersState state = ReadControls();
    if (CEngine* engine = Engine())
        LoadDelimiters(state, *engine);
    ShowState(state);
    SetPreviewButton(true, true);
    return CTSHarborPage::OnSetActive();
}

void CDelimitersSettingPage::OnSelchangeDelimiter(int index)
{
    ApplyRule(*this, [index](DelimitersState& state) { SelectDelimiter(state, index); });
}

int CDelimitersSettingPage::OnWizardNext()
{
    StoreDelimiters(ReadControls(), Engine());
    return LeaveForward();
}

int CDelimitersSettingPage::OnPreview() { return PreviewDelimiters(ReadControls(), Engine()); }

CString CDelimitersSettingPage::HelpText() const
{
    return "Choose the character that separates the fields of a line (\"User Defined\" takes the text in the box "
           "beside the list) and the decimal separator of the numbers. Consecutive delimiters can count as one, "
           "and delimiters at the start of a line can be ignored. Preview shows how the file reads with these "
           "choices.";
}
