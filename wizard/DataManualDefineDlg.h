#pragma once
// The dialog "User Defined" in which the user defines the items of the input file by hand: a grid
// of names, item types, units and value types, checked against the unit catalogue on OK.
#include "templates/Specification.h"

#include <QDialog>

#include <array>
#include <vector>

class CManualDefGridWnd;

class CDataManualDefineDlg : public QDialog {
    Q_OBJECT
public:
    enum : int { IDD = 2286, IDC_GRID = 314, IDOK = 1, IDCANCEL = 2 };

    explicit CDataManualDefineDlg(QWidget* parent = nullptr);

    // Shows the dialog modally: IDOK after an accepted OK, else IDCANCEL.
    int DoModal();
    // The grid's rows as item definitions; 0 when the grid does not have four columns.
    int ReadGridDefinitions(std::vector<CItemDefinition>& items) const;

    std::vector<CItemDefinition> m_vecItemDefs; // in: the items to show; out after OK: the grid's
    std::array<int, 4> m_arrEditable = {1, 1, 1, 1}; // names, item types, units, value types
    CManualDefGridWnd* m_wndGrid = nullptr;          // owned by the dialog

protected:
    bool OnInitDialog();

private:
    void OnClickedOK();
};
