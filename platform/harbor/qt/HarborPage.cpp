#include "platform/harbor/qt/HarborPage.h"

#include "platform/harbor/qt/HarborWizard.h"
#include "platform/ui/UserInterface.h"
#include "platform/ui/qt/Controls.h"

CHarborPage::CHarborPage(int dialogId, QWidget* parent) : QWizardPage(parent), m_nDialogId(dialogId) {}

CHarborWizard* CHarborPage::GetSheet() const { return qobject_cast<CHarborWizard*>(wizard()); }

CHarborEngine* CHarborPage::GetEngine() const
{
    CHarborWizard* sheet = GetSheet();
    return sheet ? sheet->m_pEngine : nullptr;
}

int CHarborPage::MessageBoxA(const CString& text, const char* caption, unsigned type)
{
    return ui::MessageBox(text, caption ? caption : "", type);
}

void CHarborPage::SetPageSize(int widthUnits, int heightUnits)
{
    // A page whose controls need more room than the dialog template's size gets it.
    setMinimumSize(ui::DialogUnitsToPixels(font(), widthUnits, heightUnits).expandedTo(minimumSizeHint()));
}

void CHarborPage::InitializeOnce()
{
    if (m_bInitialized)
        return;
    m_bInitialized = true;
    OnInitDialog();
}

bool CHarborPage::OnInitDialog() { return true; }
bool CHarborPage::OnSetActive() { return true; }
int CHarborPage::OnWizardNext() { return 0; }
int CHarborPage::OnWizardBack() { return 0; }
bool CHarborPage::OnWizardFinish() { return true; }

CString CHarborPage::HelpText() const { return subTitle().toStdString(); }

void CHarborPage::OnHelp()
{
    CString text = title().toStdString();
    const CString more = HelpText();
    if (!more.empty())
        text += "\n\n" + more;
    ui::MessageBox(text, "Velmora Help", ui::MB_OK | ui::MB_ICONINFORMATION);
}
