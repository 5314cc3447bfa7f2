#include "wizard/TimeDescSettingPage.h"

#include "platform/ui/qt/Controls.h"

#include <QDateEdit>
#include <QGridLayout>
#include <QLabel>
#include <QLineEdit>
#include <QRadioButton>
#include <QTimeEdit>

CTimeDescSettingPage::CTimeDescSettingPage(QWidget* parent)
    : CTimeDescPage(IDD, false,
                    {GroupIds{IDC_OPTION_DATETIME, IDC_DATETIME_FORMAT, IDC_DATETIME_COLUMN, IDC_DATETIME_SPIN, 0, 0},
                     GroupIds{IDC_OPTION_SAME_DATE, IDC_TIME_FORMAT, IDC_TIME_COLUMN, IDC_TIME_SPIN, IDC_DATE_VALUE, 0},
                     GroupIds{IDC_OPTION_SAME_TIME, IDC_DATE_FORMAT, IDC_DATE_COLUMN, IDC_DATE_SPIN, IDC_TIME_VALUE, 0}},
                    parent)
{
    // Each option on its line, its controls indented on the next: picker, format, column.
    const QString pickerLabels[] = {QString(), tr("Date value:"), tr("Time value:")};
    const QString formatLabels[] = {tr("Date/time format:"), tr("Time format:"), tr("Date format:")};
    const QString columnLabels[] = {tr("Date/time column:"), tr("Time column:"), tr("Date column:")};
    QWidget* box = m_pickerDate->parentWidget();
    m_grid->setColumnStretch(4, 1);
    std::vector<QWidget*> tabs;
    for (int option = 0; option < 3; ++option) {
        const Group& group = m_groups[static_cast<size_t>(option)];
        const int row = option * 2;
        m_grid->addWidget(group.radio, row, 0, 1, 7);
        if (group.picker) {
            m_grid->addWidget(ui::LabelFor(pickerLabels[option], group.picker, box), row + 1, 1);
            m_grid->addWidget(group.picker, row + 1, 2);
        }
        m_grid->addWidget(ui::LabelFor(formatLabels[option], group.format, box), row + 1, 3);
        m_grid->addWidget(group.format, row + 1, 4);
        m_grid->addWidget(ui::LabelFor(columnLabels[option], group.column, box), row + 1, 5);
        m_grid->addLayout(ColumnField(group), row + 1, 6);
        for (QWidget* control : {static_cast<QWidget*>(group.radio), group.picker,
                                 static_cast<QWidget*>(group.format), static_cast<QWidget*>(group.column)})
            if (control)
                tabs.push_back(control);
    }
    ui::ChainTabs(tabs);
    FinishPage(kPageWidthUnits, kPageHeightUnits);
}
