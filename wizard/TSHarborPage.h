#pragma once
// The tool's page base: every tool page has Help, a Preview action and a say in where Next and
// Back lead (the page-skipping flow of the wizard).
#include "platform/harbor/qt/HarborPage.h"

#include <QAbstractButton>

class CEngine;

class CTSHarborPage : public CHarborPage {
    Q_OBJECT
public:
    explicit CTSHarborPage(int dialogId, QWidget* parent = nullptr);

    // The Preview button's action for the page: check, parse and show the preview file.
    virtual int OnPreview();
    // Where Next leads: a dialog id, 0 for the next page in sheet order, -1 for no choice (taken
    // as 0). The same for Back.
    virtual int GetNextPageID();
    virtual int GetBackPageID();

    int OnWizardNext() override;
    // Hides the Preview button, then goes where GetBackPageID says.
    int OnWizardBack() override;

    CEngine* Engine() const;

protected:
    void SetPreviewButton(bool enabled, bool visible);
    // How a page's Next ends once it lets the user go: hide Preview, then GetNextPageID.
    int LeaveForward();
    // Gives the page its size in dialog units and keyboard mnemonics that leave the wizard's own
    // buttons theirs; called once the page's controls exist.
    void FinishPage(int widthUnits, int heightUnits);
};

// Runs a rule (a click, a browse) on the state of `page`'s controls and shows the outcome: what a
// page decides lives in plain functions over that state, the page only reads and shows it.
template <typename Page, typename Rule>
void ApplyRule(Page& page, Rule rule)
{
    auto state = page.ReadControls();
    rule(state);
    page.ShowState(state);
}

// Applies `rule` whenever `button` (a radio button, a check box) is clicked.
template <typename Page, typename Rule>
void ApplyRuleOnClick(Page* page, QAbstractButton* button, Rule rule)
{
    QObject::connect(button, &QAbstractButton::clicked, page, [page, rule] { ApplyRule(*page, rule); });
}
