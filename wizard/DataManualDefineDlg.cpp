#include "wizard/DataManualDefineDlg.h"

#include "platform/ui/qt/Controls.h"
#include "wizard/ManualDefGridWnd.h"

#include <QHBoxLayout>
#include <QPushButton>
#include <QVBoxLayout>

namespace {

constexpr int kWidthUnits = 380;
constexpr int kHeightUnits = 160;

} // namespace

CDataManualDefineDlg::CDataManualDefineDlg(QWidget* parent) : QDialog(parent)
{
    setWindowTitle(tr("User Defined"));
    setObjectName(ui::ControlName(IDD));
    // The grid and the buttons are owned by the dialog.
    m_wndGrid = ui::Identify(new CManualDefGridWnd(this), IDC_GRID, tr("Item definitions"));
    auto* ok = ui::Identify(new QPushButton(tr("OK"), this), IDOK);
    auto* cancel = ui::Identify(new QPushButton(tr("Cancel"), this), IDCANCEL);
    ok->setDefault(true);
    auto* buttons = new QHBoxLayout();
    buttons->addStretch(1);
    buttons->addWidget(ok);
    buttons->addWidget(cancel);
    auto* layout = new QVBoxLayout(this);
    layout->addWidget(m_wndGrid, 1);
    layout->addLayout(buttons);
    resize(ui::DialogUnitsToPixels(font(), kWidthUnits, kHeightUnits));
    ui::AssignMnemonics(this, QString());

    connect(ok, &QPushButton::clicked, this, &CDataManualDefineDlg::OnClickedOK);
    connect(cancel, &QPushButton::clicked, this, &QDialog::reject);
}

bool CDataManualDefineDlg::OnInitDialog()
{
    m_wndGrid->Initialize(MakeManualDefGrid(m_vecItemDefs, m_arrEditable));
    return true;
}

int CDataManualDefineDlg::DoModal()
{
    OnInitDialog();
    return exec() == QDialog::Accepted ? IDOK : IDCANCEL;
}

int CDataManualDefineDlg::ReadGridDefinitions(std::vector<CItemDefinition>& items) const
{
    return ::ReadGridDefinitions(m_wndGrid->Grid(), items);
}

void CDataManualDefineDlg::OnClickedOK()
{
    m_wndGrid->FinishEditing();
    ReadGridDefinitions(m_vecItemDefs);
    if (CheckGridDefinitions(m_vecItemDefs))
        accept();
}
