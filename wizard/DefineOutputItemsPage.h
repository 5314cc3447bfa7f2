#pragma once
// The page on which the user ticks the items of the input to convert.
#include "wizard/ItemSelectionForm.h"
#include "wizard/TSHarborPage.h"

class QTreeWidget;

class CDefineOutputItemsPage : public CTSHarborPage {
    Q_OBJECT
public:
    enum : int { IDD = 2285 };
    enum : int { IDC_ITEMS = 276 };

    explicit CDefineOutputItemsPage(QWidget* parent = nullptr);

    bool OnInitDialog() override;
    bool OnSetActive() override;
    int OnWizardNext() override;
    int OnPreview() override;
    int GetNextPageID() override;
    int GetBackPageID() override;
    CString HelpText() const override;

    QTreeWidget* List() const { return m_listItems; }
    std::vector<bool> ReadTicks() const;

private:
    QTreeWidget* m_listItems = nullptr; // owned by the page
};
