#include "wizard/FilePreviewDlg.h"

#include "platform/ui/qt/Controls.h"
#include "wizard/PreviewRowsModel.h"

#include <QDialogButtonBox>
#include <QHeaderView>
#include <QLabel>
#include <QPushButton>
#include <QTableView>
#include <QVBoxLayout>

#include <algorithm>

namespace {

constexpr int kMinimumTitledWidth = 60;

QTableView* ReportList(int id, const QString& name, QWidget* parent)
{
    auto* list = ui::Identify(new QTableView(parent), id, name);
    list->setShowGrid(true);
    list->setSelectionBehavior(QAbstractItemView::SelectRows);
    list->setWordWrap(false);
    list->verticalHeader()->hide();
    // Every row is one line high, so a list of millions of rows costs nothing per row.
    list->verticalHeader()->setSectionResizeMode(QHeaderView::Fixed);
    list->verticalHeader()->setDefaultSectionSize(list->fontMetrics().height() + 4);
    list->horizontalHeader()->setDefaultAlignment(Qt::AlignLeft | Qt::AlignVCenter);
    list->horizontalHeader()->setHighlightSections(false);
    list->horizontalHeader()->setMinimumSectionSize(1); // the widths are the fill rule's, however narrow
    return list;
}

} // namespace

int FillListColumnCount(std::span<const ui::Row> rows, std::span<const std::string> titles)
{
    if (rows.empty() || (rows.front().empty() && titles.empty()))
        return 0;
    return static_cast<int>(titles.empty() ? rows.front().size() : titles.size());
}

int FillListColumnWidth(int listWidth, int columns, bool titled)
{
    if (columns <= 0)
        return 0;
    const int shared = (listWidth - 5) / columns;
    return titled ? std::max(kMinimumTitledWidth, shared) : shared;
}

CFilePreviewDlg::CFilePreviewDlg(QWidget* parent) : QDialog(parent)
{
    setObjectName(ui::ControlName(IDD));
    setWindowTitle(tr("File Preview Dialog"));
    // The controls and models are owned by the dialog.
    m_listInput = ReportList(IDC_LIST_INPUT, tr("Input file"), this);
    m_listResult = ReportList(IDC_LIST_RESULT, tr("Import result"), this);
    m_labelInput = ui::Identify(ui::LabelFor(tr("Input file"), m_listInput, this), IDC_STATIC_INPUT);
    m_labelResult = ui::Identify(ui::LabelFor(tr("Import result"), m_listResult, this), IDC_STATIC_RESULT);
    m_modelInput = new CPreviewRowsModel(this);
    m_modelResult = new CPreviewRowsModel(this);
    m_listInput->setModel(m_modelInput);
    m_listResult->setModel(m_modelResult);
    auto* buttons = new QDialogButtonBox(this);
    QPushButton* close = ui::Identify(buttons->addButton(tr("&Close"), QDialogButtonBox::AcceptRole), IDOK);
    close->setDefault(true);
    connect(buttons, &QDialogButtonBox::accepted, this, &QDialog::accept);

    auto* layout = new QVBoxLayout(this);
    layout->addWidget(m_labelInput);
    layout->addWidget(m_listInput, 1);
    layout->addWidget(m_labelResult);
    layout->addWidget(m_listResult, 1);
    layout->addWidget(buttons);
    resize(ui::DialogUnitsToPixels(font(), 365, 310));
}

int CFilePreviewDlg::DoModal()
{
    OnInitDialog();
    exec();
    return IDOK;
}

bool CFilePreviewDlg::OnInitDialog()
{
    layout()->activate(); // the lists' widths decide their columns
    if (!m_strTitle.empty())
        setWindowTitle(QString::fromStdString(m_strTitle));
    if (!m_vecInputLines.empty())
        FillList(*m_listInput, *m_modelInput, m_vecInputLines, {});
    else
        HideInputPart();
    if (!m_vecResultRows.empty())
        FillList(*m_listResult, *m_modelResult, m_vecResultRows, m_vecHeader);
    return true;
}

void CFilePreviewDlg::FillList(QTableView& list, CPreviewRowsModel& model, std::span<const ui::Row> rows,
                               std::span<const std::string> titles)
{
    if (rows.empty() || (rows.front().empty() && titles.empty()))
        return;
    const int columns = FillListColumnCount(rows, titles);
    model.SetRows(rows, titles, columns);
    const int width = FillListColumnWidth(list.width(), columns, !titles.empty());
    for (int column = 0; column < columns; ++column)
        list.horizontalHeader()->resizeSection(column, width);
}

void CFilePreviewDlg::HideInputPart()
{
    // With the input part gone, the result label and list move up into its place.
    m_labelInput->hide();
    m_listInput->hide();
    layout()->activate();
}
