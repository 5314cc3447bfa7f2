#include "platform/ui/qt/OkaFileSelectorDlg.h"

#include "platform/rbx/RbxReader.h"
#include "platform/ui/qt/Controls.h"

#include <QDialogButtonBox>
#include <QGridLayout>
#include <QHeaderView>
#include <QLabel>
#include <QLineEdit>
#include <QPushButton>
#include <QTreeWidget>

#include <algorithm>

namespace {

QString Text(const CString& text) { return QString::fromStdString(text); }

} // namespace

bool ReadRbxItemRows(const CString& path, std::vector<CRbxItemRow>& rows, CString& error)
{
    rows.clear();
    rbx::CRbxReader reader;
    // Only the header is needed; the data are checked when they are read.
    if (!reader.Open(path, rbx::VerifyChecksum::AtEnd)) {
        error = reader.status().problem().Describe();
        return false;
    }
    for (const rbx::ItemInfo& item : reader.Header().items)
        rows.push_back({item.name, item.itemTypeText, item.unitText});
    return true;
}

COkaFileSelectorDlg::COkaFileSelectorDlg(const ui::RbxSelectionRequest& request, QWidget* parent)
    : QDialog(parent), m_request(request)
{
    setWindowTitle(tr("Select Time Series File"));
    // Child widgets are owned by the dialog.
    m_editFile = ui::Identify(new QLineEdit(this), IDC_FILE);
    auto* browse = ui::Identify(new QPushButton(tr("Browse..."), this), IDC_BROWSE);
    m_listItems = ui::Identify(new QTreeWidget(this), IDC_ITEMS, tr("Items"));
    m_listItems->setHeaderLabels({tr("Item"), tr("Type"), tr("Unit")});
    m_listItems->setRootIsDecorated(false);
    m_listItems->header()->setSectionResizeMode(QHeaderView::ResizeToContents);
    m_labelStatus = ui::Identify(new QLabel(this), IDC_STATUS);
    m_labelStatus->setWordWrap(true);
    auto* buttons = new QDialogButtonBox(QDialogButtonBox::Ok | QDialogButtonBox::Cancel, this);

    auto* layout = new QGridLayout(this);
    layout->addWidget(ui::LabelFor(tr("File:"), m_editFile, this), 0, 0);
    layout->addWidget(m_editFile, 0, 1);
    layout->addWidget(browse, 0, 2);
    layout->addWidget(ui::LabelFor(tr("Items of the file:"), m_listItems, this), 1, 0, 1, 3);
    layout->addWidget(m_listItems, 2, 0, 1, 3);
    layout->addWidget(m_labelStatus, 3, 0, 1, 3);
    layout->addWidget(buttons, 4, 0, 1, 3);
    ui::AssignMnemonics(this, QString());
    resize(ui::DialogUnitsToPixels(font(), 260, 180));

    connect(browse, &QPushButton::clicked, this, &COkaFileSelectorDlg::OnBrowse);
    connect(m_editFile, &QLineEdit::editingFinished, this, &COkaFileSelectorDlg::OnFileEdited);
    connect(buttons, &QDialogButtonBox::accepted, this, &QDialog::accept);
    connect(buttons, &QDialogButtonBox::rejected, this, &QDialog::reject);

    m_editFile->setText(Text(request.initialFile));
    if (!request.initialFile.empty())
        LoadFile(request.initialFile, request.initialItems);
}

CString COkaFileSelectorDlg::GetSelectedFile() const { return m_editFile->text().toStdString(); }

CUIntArray COkaFileSelectorDlg::GetSelectedItems() const
{
    CUIntArray items;
    for (int i = 0; i < m_listItems->topLevelItemCount(); ++i)
        if (m_listItems->topLevelItem(i)->checkState(0) == Qt::Checked)
            items.push_back(static_cast<unsigned>(i));
    return items;
}

bool COkaFileSelectorDlg::LoadFile(const CString& path, const CUIntArray& ticked)
{
    m_listItems->clear();
    std::vector<CRbxItemRow> rows;
    CString error;
    if (!ReadRbxItemRows(path, rows, error)) {
        m_labelStatus->setText(Text(error));
        return false;
    }
    for (size_t i = 0; i < rows.size(); ++i) {
        auto* item = new QTreeWidgetItem(m_listItems, {Text(rows[i].name), Text(rows[i].type), Text(rows[i].unit)});
        const bool on = ticked.empty() || std::find(ticked.begin(), ticked.end(), i) != ticked.end();
        item->setCheckState(0, on ? Qt::Checked : Qt::Unchecked);
    }
    m_labelStatus->setText(tr("%n item(s)", nullptr, static_cast<int>(rows.size())));
    return true;
}

void COkaFileSelectorDlg::OnBrowse()
{
    ui::FileDialogRequest request;
    request.open = true;
    request.defaultExtension = m_request.extension;
    request.initialName = GetSelectedFile();
    request.filter = m_request.filter;
    request.flags = ui::OFN_FILEMUSTEXIST | ui::OFN_HIDEREADONLY;
    std::string path;
    if (!ui::Current().ChooseFile(request, path))
        return;
    m_editFile->setText(Text(path));
    LoadFile(path);
}

void COkaFileSelectorDlg::OnFileEdited() { LoadFile(GetSelectedFile()); }
