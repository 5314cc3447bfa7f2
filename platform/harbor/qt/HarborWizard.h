#pragma once
// The tool framework's wizard: a modal sheet of CHarborPage pages whose ids are their dialog ids.
// The sheet order is the order pages are added; Next and Back go where the active page says
// (OnWizardNext / OnWizardBack), not where Qt's own page history would go.
#include "platform/system/Types.h"

#include <QWizard>

#include <vector>

class CHarborEngine;
class CHarborPage;
class QPushButton;

class CHarborWizard : public QWizard {
    Q_OBJECT
public:
    // DoModal's results: the Finish command, or the Cancel answer for any other way out.
    enum : int { ID_WIZFINISH = 12325, IDCANCEL = 2 };

    explicit CHarborWizard(const CString& caption, QWidget* parentWnd = nullptr, int selectPage = 0);

    // Appends `page` to the sheet order; the wizard owns it from now on (as its Qt parent).
    void AddPage(CHarborPage* page);
    // Keeps a place in the sheet order for a page this wizard does not hold: a move to it goes on
    // to the nearest page beyond it in the direction of the move.
    void AddPagePlace(int dialogId);

    // Shows the wizard modally; ID_WIZFINISH when the user finished, else IDCANCEL.
    int DoModal();

    CHarborPage* GetActivePage() const;
    CHarborPage* GetPage(int dialogId) const;
    const std::vector<int>& SheetOrder() const { return m_vecSheet; }
    // The Back button the wizard shows in place of Qt's own.
    QPushButton* BackButton() const { return m_btnBack; }

    // Leaves the active page backwards, as the Back button does.
    void GoBack();

    CHarborEngine* m_pEngine = nullptr; // not owned; set before DoModal

protected:
    // Runs once, just before the wizard is first shown.
    virtual bool OnInitDialog();

    void setVisible(bool visible) override;
    int nextId() const override;
    bool validateCurrentPage() override;

private:
    // Gives every page the size of the largest, as a property sheet does, so the wizard keeps its
    // size from page to page.
    void SizePagesAlike();
    void OnCurrentIdChanged(int id);
    void Activate(int id);
    // The page a move reaches: `result` of OnWizardNext/OnWizardBack (0 = the neighbour in sheet
    // order) from page `from`, `step` +1 forwards, -1 backwards; -1 when there is none.
    int Resolve(int result, int from, int step) const;
    int SheetIndex(int id) const;
    void ShowHelpButton(bool show);
    // Returns to a page already passed, or to one before the active page that was skipped.
    void ReturnTo(int id);

    std::vector<int> m_vecSheet;
    QPushButton* m_btnBack = nullptr; // owned by the wizard
    int m_nPendingNext = -1;          // the page the Next under way leads to
    bool m_bMoving = false;           // set while ReturnTo passes pages without activating them
    bool m_bInitialized = false;
};
