#pragma once
// The tool framework's wizard page: a page of a CHarborWizard under its dialog id, with the hooks
// the wizard calls in the order a property sheet does (OnInitDialog once before the first
// activation, OnSetActive on every activation, OnWizardNext/OnWizardBack when the user leaves).
#include "platform/system/Types.h"

#include <QWizardPage>

class CHarborEngine;
class CHarborWizard;

// The size of the framework's own pages, in dialog units; tool pages match it.
constexpr int kPageWidthUnits = 350;
constexpr int kPageHeightUnits = 180;

class CHarborPage : public QWizardPage {
    Q_OBJECT
public:
    // Page flags, with the values the toolbox uses.
    enum : unsigned { PSP_HASHELP = 0x20, PSP_USECALLBACK = 0x80 };

    explicit CHarborPage(int dialogId, QWidget* parent = nullptr);

    int DialogId() const { return m_nDialogId; }
    bool HasHelp() const { return (m_dwFlags & PSP_HASHELP) != 0; }
    // The wizard's engine; null before the page is on a wizard or when none was given.
    CHarborEngine* GetEngine() const;
    CHarborWizard* GetSheet() const;
    // A page message through the user interface; a null caption shows the tool's name. Returns
    // the button pressed.
    int MessageBoxA(const CString& text, const char* caption, unsigned type);

    // Runs OnInitDialog the first time only.
    void InitializeOnce();

    virtual bool OnInitDialog();
    virtual bool OnSetActive();
    // Where Next leads: 0 the next page in sheet order, -1 stay, else a page's dialog id.
    virtual int OnWizardNext();
    // Where Back leads, with the same values.
    virtual int OnWizardBack();
    // False keeps the wizard open.
    virtual bool OnWizardFinish();
    // Shows the help of this page: its heading and HelpText().
    virtual void OnHelp();
    // What the page is for and how to fill it in; by default the page's explanation line.
    virtual CString HelpText() const;

protected:
    // Gives the page its size in the dialog units of the toolbox's dialog templates, or the size its
    // laid-out controls need when that is larger.
    void SetPageSize(int widthUnits, int heightUnits);

    unsigned m_dwFlags = 0;

private:
    int m_nDialogId;
    bool m_bInitialized = false;
};
