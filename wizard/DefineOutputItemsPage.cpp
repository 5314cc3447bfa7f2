#include "wizard/DefineOutputItemsPage.h"

#include "platform/ui/qt/Controls.h"
#include "wizard/PageFlow.h"

#include <QHeaderView>
#include <QTreeWidget>
#include <QVBoxLayout>

CDefineOutputItemsPage::CDefineOutputItemsPage(QWidget* parent) : CTSHarborPage(IDD, parent)
{
    setWindowTitle(tr("Item Selection"));
    setTitle(tr("Item Selection"));
    setSubTitle(tr("Here you define which items to convert and  save in the output."));
    // The list is owned by the page.
    m_listItems = ui::Identify(new QTreeWidget(this), IDC_ITEMS, tr("Output Items"));
    auto* layout = new QVBoxLayout(this);
    layout->addWidget(m_listItems);
    FinishPage(kPageWidthUnits, kPageHeightUnits);
}

bool CDefineOutputItemsPage::OnInitDialog()
{
    CTSHarborPage::OnInitDialog();
    m_listItems->setColumnCount(1);
    m_listItems->setHeaderLabels({tr("Output Items")});
    m_listItems->setRootIsDecorated(false);
    m_listItems->setAllColumnsShowFocus(true);
    m_listItems->setSelectionBehavior(QAbstractItemView::SelectRows);
    m_listItems->header()->setSectionsMovable(true);
    m_listItems->header()->setStretchLastSection(true);
    SetPreviewButton(true, true);
    return true;
}

bool CDefineOutputItemsPage::OnSetActive()
{
    SetPreviewButton(true, true);
    if (CEngine* engine = Engine()) {
        const ItemSelection selection = LoadItemSelection(engine);
        m_listItems->clear();
        for (size_t i = 0; i < selection.names.size(); ++i) {
            auto* row = new QTreeWidgetItem(m_listItems, {QString::fromStdString(selection.names[i])});
            row->setCheckState(0, selection.ticked[i] ? Qt::Checked : Qt::Unchecked);
        }
    }
    return CTSHarborPage::OnSetActive();
}

std::vector<bool> CDefineOutputItemsPage::ReadTicks() const
{
    std::vector<bool> ticked;
    for (int i = 0; i < m_listItems->topLevelItemCount(); ++i)
        ticked.push_back(m_listItems->topLevelItem(i)->checkState(0) == Qt::Checked);
    return ticked;
}

int CDefineOutputItemsPage::OnWizardNext()
{
    if (!AcceptItemSelection(ReadTicks(), Engine()))
        return -1;
    return LeaveForward();
}

int CDefineOutputItemsPage::OnPreview() { return PreviewItemSelection(ReadTicks(), Engine()); }

int CDefineOutputItemsPage::GetNextPageID() { return NextPageOf(IDD, Engine()); }

int CDefineOutputItemsPage::GetBackPageID() { return BackPageOf(IDD, Engine()); }

CString CDefineOutputItemsPage::HelpText() const
{
    return "Tick the items of the input that are to be converted and written to the output; at least one must be "
           "ticked. Preview shows the ticked items as they are read. For a folder, or a template used unchanged, "
           "Next also writes the choice into the template file.";
}
