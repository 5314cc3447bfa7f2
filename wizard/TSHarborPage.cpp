#include "wizard/TSHarborPage.h"

#include "engine/Engine.h"
#include "platform/ui/qt/Controls.h"
#include "wizard/PreviewChain.h"
#include "wizard/Wizard.h"

#include <QPushButton>

namespace {

// The letters of Back, Next, Finish, Help and Preview.
const QString kWizardMnemonics = QStringLiteral("bnfhp");

int TargetOf(int pageId) { return pageId == -1 ? 0 : pageId; }

} // namespace

CTSHarborPage::CTSHarborPage(int dialogId, QWidget* parent) : CHarborPage(dialogId, parent)
{
    m_dwFlags |= PSP_USECALLBACK | PSP_HASHELP;
}

CEngine* CTSHarborPage::Engine() const { return dynamic_cast<CEngine*>(GetEngine()); }

int CTSHarborPage::OnPreview() { return RunDefaultPreview(Engine()); }
int CTSHarborPage::GetNextPageID() { return 0; }
int CTSHarborPage::GetBackPageID() { return 0; }

int CTSHarborPage::OnWizardNext() { return TargetOf(GetNextPageID()); }

int CTSHarborPage::OnWizardBack()
{
    SetPreviewButton(false, false);
    return TargetOf(GetBackPageID());
}

int CTSHarborPage::LeaveForward()
{
    SetPreviewButton(false, false);
    return TargetOf(GetNextPageID());
}

void CTSHarborPage::SetPreviewButton(bool enabled, bool visible)
{
    auto* sheet = qobject_cast<CWizard*>(GetSheet());
    if (!sheet || !sheet->m_btnPreview)
        return;
    sheet->m_btnPreview->setEnabled(enabled);
    sheet->m_btnPreview->setVisible(visible);
}

void CTSHarborPage::FinishPage(int widthUnits, int heightUnits)
{
    SetPageSize(widthUnits, heightUnits);
    ui::AssignMnemonics(this, kWizardMnemonics);
}
