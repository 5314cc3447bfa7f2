#include "wizard/ExcelTimeDescSettingPage.h"

#include "platform/ui/qt/Controls.h"

#include <QCheckBox>
#include <QDateEdit>
#include <QGridLayout>
#include <QLabel>
#include <QLineEdit>
#include <QRadioButton>
#include <QTimeEdit>

CExcelTimeDescSettingPage::CExcelTimeDescSettingPage(QWidget* parent)
    : CTimeDescPage(IDD, true,
                    {GroupIds{IDC_OPTION_DATETIME, IDC_DATETIME_FORMAT, IDC_DATETIME_COLUMN, IDC_DATETIME_SPIN, 0,
                              IDC_USE_DATETIME_FORMAT},
                     GroupIds{IDC_OPTION_SAME_DATE, IDC_TIME_FORMAT, IDC_TIME_COLUMN, IDC_TIME_SPIN, IDC_DATE_VALUE,
                              IDC_USE_TIME_FORMAT},
                     GroupIds{IDC_OPTION_SAME_TIME, IDC_DATE_FORMAT, IDC_DATE_COLUMN, IDC_DATE_SPIN, IDC_TIME_VALUE,
                              IDC_USE_DATE_FORMAT}},
                    parent)
{
    // Each option on its line; below it the picker and the column, then the format with its box.
    const QString pickerLabels[] = {QString(), tr("Date value:"), tr("Time value:")};
    const QString formatLabels[] = {tr("Date/time format:"), tr("Time format:"), tr("Date format:")};
    const QString columnLabels[] = {tr("Date/time column:"), tr("Time column:"), tr("Date column:")};
    QWidget* box = m_pickerDate->parentWidget();
    m_grid->setColumnStretch(5, 1);
    std::vector<QWidget*> tabs;
    for (int option = 0; option < 3; ++option) {
        const Group& group = m_groups[static_cast<size_t>(option)];
        const int row = option * 3;
        m_grid->addWidget(group.radio, row, 0, 1, 6);
        if (group.picker) {
            m_grid->addWidget(ui::LabelFor(pickerLabels[option], group.picker, box), row + 1, 1);
            m_grid->addWidget(group.picker, row + 1, 2);
        }
        m_grid->addWidget(ui::LabelFor(columnLabels[option], group.column, box), row + 1, 3);
        m_grid->addLayout(ColumnField(group), row + 1, 4);
        group.useFormat->setText(formatLabels[option]);
        group.format->setAccessibleName(formatLabels[option]);
        m_grid->addWidget(group.useFormat, row + 2, 1);
        m_grid->addWidget(group.format, row + 2, 2, 1, 2);
        m_grid->addWidget(new QLabel(tr("(Use | for column separation)"), box), row + 2, 4, 1, 2);
        for (QWidget* control : {static_cast<QWidget*>(group.radio), group.picker,
                                 static_cast<QWidget*>(group.column), static_cast<QWidget*>(group.useFormat),
                                 static_cast<QWidget*>(group.format)})
            if (control)
                tabs.push_back(control);
    }
    ui::ChainTabs(tabs);
    FinishPage(kPageWidthUnits, kPageHeightUnits);
}
