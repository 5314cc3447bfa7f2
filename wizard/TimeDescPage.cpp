#include "wizard/TimeDescPage.h"

#include "engine/Engine.h"
#include "platform/ui/qt/Controls.h"
#include "platform/ui/qt/SpinButton.h"
#include "wizard/PageFlow.h"

#include <QButtonGroup>
#include <QCheckBox>
#include <QDateEdit>
#include <QGridLayout>
#include <QGroupBox>
#include <QHBoxLayout>
#include <QLineEdit>
#include <QLocale>
#include <QRadioButton>
#include <QTimeEdit>
#include <QVBoxLayout>

namespace {

const char* const kOptionTexts[] = {
    "Date and time values in one column or across multiple columns",
    "Same date for all values and time values in one column or across multiple columns",
    "Same time for all values and date values in one column or across multiple columns"};

constexpr int kLowestColumn = 1;
constexpr int kHighestColumn = 100;

// The locale's time format with seconds, which the stored time keeps.
QString TimeFormatWithSeconds()
{
    QString format = QLocale().timeFormat(QLocale::ShortFormat);
    if (!format.contains('s'))
        format.replace(QStringLiteral("mm"), QStringLiteral("mm:ss"));
    return format;
}

QDate DateOf(const COleDateTime& value) { return QDate(value.GetYear(), value.GetMonth(), value.GetDay()); }
QTime TimeOf(const COleDateTime& value) { return QTime(value.GetHour(), value.GetMinute(), value.GetSecond()); }

} // namespace

CTimeDescPage::CTimeDescPage(int dialogId, bool excel, const std::array<GroupIds, 3>& ids, QWidget* parent)
    : CTSHarborPage(dialogId, parent), m_bExcel(excel)
{
    setWindowTitle(tr("Time Description"));
    setTitle(tr("Time Description"));
    setSubTitle(tr("Here you define how the time and date values are stored in the input data file."));
    // Every control is owned by the page.
    auto* box = new QGroupBox(tr("Date and time values"), this);
    auto* options = new QButtonGroup(this);
    m_pickerDate = ui::Identify(new QDateEdit(box), ids[1].picker);
    m_pickerDate->setCalendarPopup(true);
    m_pickerDate->setDisplayFormat(QLocale().dateFormat(QLocale::ShortFormat));
    // Room for the longest date of the format beside the drop-down arrow.
    m_pickerDate->setMinimumWidth(
        m_pickerDate->fontMetrics().horizontalAdvance(QLocale().toString(QDate(2000, 12, 28), QLocale::ShortFormat)) + 40);
    m_pickerTime = ui::Identify(new QTimeEdit(box), ids[2].picker);
    m_pickerTime->setDisplayFormat(TimeFormatWithSeconds());
    for (int option = 0; option < 3; ++option) {
        Group& group = m_groups[static_cast<size_t>(option)];
        const GroupIds& id = ids[static_cast<size_t>(option)];
        group.radio = ui::Identify(new QRadioButton(tr(kOptionTexts[option]), box), id.radio);
        options->addButton(group.radio, option);
        group.format = ui::Identify(new QLineEdit(box), id.format);
        group.format->setMinimumWidth(group.format->fontMetrics().horizontalAdvance(QStringLiteral("YYYY/MM/DD HH:mm:ss")) + 12);
        group.column = ui::Identify(ui::NumberEdit(box), id.column);
        group.spin = ui::Identify(new ui::SpinButton(group.column, box), id.spin);
        group.spin->SetRange(kLowestColumn, kHighestColumn);
        if (excel)
            group.useFormat = ui::Identify(new QCheckBox(box), id.useFormat);
        group.picker = option == 1 ? static_cast<QWidget*>(m_pickerDate) : option == 2 ? m_pickerTime : nullptr;
    }
    m_grid = new QGridLayout(box);
    m_grid->setColumnMinimumWidth(0, 16);
    auto* layout = new QVBoxLayout(this);
    layout->addWidget(box);
    layout->addStretch(1);

    for (int option = 0; option < 3; ++option) {
        const Group& group = m_groups[static_cast<size_t>(option)];
        connect(group.radio, &QRadioButton::clicked, this, [this, option] { OnClickedDateTimeOption(option); });
        if (group.useFormat)
            connect(group.useFormat, &QCheckBox::clicked, this, [this, option] { OnClickedUseFormat(option); });
    }
}

QLayout* CTimeDescPage::ColumnField(const Group& group)
{
    auto* field = new QHBoxLayout(); // owned by the layout it is added to
    field->setSpacing(0);
    field->addWidget(group.column);
    field->addWidget(group.spin);
    group.spin->setAccessibleName(group.column->accessibleName() + tr(" spin"));
    return field;
}

TimeDescState CTimeDescPage::ReadControls() const
{
    TimeDescState state;
    state.excel = m_bExcel;
    state.option = m_groups[0].radio->isChecked() ? 0 : m_groups[1].radio->isChecked() ? 1 : 2;
    for (size_t i = 0; i < 3; ++i) {
        const Group& group = m_groups[i];
        state.formats[i] = group.format->text().toStdString();
        state.columns[i] = group.column->text().toInt(); // an empty box reads as 0
        state.useFormat[i] = group.useFormat && group.useFormat->isChecked() ? 1 : 0;
        state.groupEnabled[i] = group.column->isEnabled();
        state.formatEnabled[i] = group.format->isEnabled();
    }
    const QDate date = m_pickerDate->date();
    state.date = COleDateTime(date.year(), date.month(), date.day(), 0, 0, 0);
    const QTime time = m_pickerTime->time();
    state.time = COleDateTime(1899, 12, 30, time.hour(), time.minute(), time.second());
    return state;
}

void CTimeDescPage::ShowState(const TimeDescState& state)
{
    for (size_t i = 0; i < 3; ++i) {
        const Group& group = m_groups[i];
        group.radio->setChecked(static_cast<int>(i) == state.option);
        group.format->setText(QString::fromStdString(state.formats[i]));
        group.column->setText(QString::number(state.columns[i]));
        group.column->setEnabled(state.groupEnabled[i]);
        if (group.picker)
            group.picker->setEnabled(state.groupEnabled[i]);
        if (group.useFormat) {
            group.useFormat->setChecked(state.useFormat[i] != 0);
            group.useFormat->setEnabled(state.groupEnabled[i]);
        }
        group.format->setEnabled(state.formatEnabled[i]);
    }
    m_pickerDate->setDate(DateOf(state.date));
    m_pickerTime->setTime(TimeOf(state.time));
}

bool CTimeDescPage::OnInitDialog()
{
    CTSHarborPage::OnInitDialog();
    ShowState(InitialTimeDescription(m_bExcel));
    return true;
}

bool CTimeDescPage::OnSetActive()
{
    CTimeDescription record;
    if (CEngine* engine = Engine(); engine && engine->m_pSpecification)
        record = engine->m_pSpecification->m_TimeDesc;
    ShowTimeDescription(record);
    SetPreviewButton(true, true);
    return CTSHarborPage::OnSetActive();
}

void CTimeDescPage::ShowTimeDescription(const CTimeDescription& record)
{
    ApplyRule(*this, [&record](TimeDescState& state) { ::ShowTimeDescription(state, record); });
}

int CTimeDescPage::CollectTimeDescription(CTimeDescription& record) const
{
    return ::CollectTimeDescription(ReadControls(), record);
}

void CTimeDescPage::OnClickedDateTimeOption(int option)
{
    ApplyRule(*this, [option](TimeDescState& state) { ClickDateTimeOption(state, option); });
}

void CTimeDescPage::OnClickedUseFormat(int option)
{
    ApplyRule(*this, [option](TimeDescState& state) { ClickUseFormat(state, option); });
}

int CTimeDescPage::OnWizardNext()
{
    if (!AcceptTimeDescription(ReadControls(), Engine()))
        return -1;
    // The page that follows shows Preview too.
    SetPreviewButton(true, true);
    return CTSHarborPage::OnWizardNext();
}

int CTimeDescPage::OnPreview() { return PreviewTimeDescription(ReadControls(), Engine()); }

int CTimeDescPage::GetNextPageID() { return NextPageOf(DialogId(), Engine()); }

int CTimeDescPage::GetBackPageID() { return BackPageOf(DialogId(), Engine()); }

CString CTimeDescPage::HelpText() const
{
    CString help = "Say where the date and time of each data row stand: in one column (or across several), or a "
                   "column of times with one date for all rows, or a column of dates with one time for all rows. "
                   "Columns count from 1. A format is made of Y, M, D, H, m and S with separators such as "
                   "/ - : . T and blanks.";
    if (m_bExcel)
        help += " Tick a format's box when the date or time is text to be read with that format; \"|\" in a "
                "format separates the cells it spans.";
    return help;
}
