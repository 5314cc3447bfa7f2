#pragma once
// The rbx0 file-and-item selector: the user picks an rbx0 file and ticks the items of it to use,
// listed from the file's header. Opened by the rbx0 browse control of the select-input page.
#include "platform/system/Types.h"
#include "platform/ui/UserInterface.h"

#include <QDialog>

class QLabel;
class QLineEdit;
class QTreeWidget;

// One item as the selector lists it.
struct CRbxItemRow {
    CString name;
    CString type;
    CString unit;
};

// The items of an rbx0 file from its header; false with `error` naming the file and the fault.
bool ReadRbxItemRows(const CString& path, std::vector<CRbxItemRow>& rows, CString& error);

class COkaFileSelectorDlg : public QDialog {
    Q_OBJECT
public:
    // Control ids of the selector.
    enum : int { IDC_FILE = 1101, IDC_BROWSE = 1102, IDC_ITEMS = 1103, IDC_STATUS = 1104 };

    explicit COkaFileSelectorDlg(const ui::RbxSelectionRequest& request, QWidget* parent = nullptr);

    CString GetSelectedFile() const;
    // The ticked items, 0-based, ascending.
    CUIntArray GetSelectedItems() const;
    // Lists the items of `path`, ticking `ticked` (every item when empty); false when it cannot be
    // read (the list is then empty and the reason shows under it).
    bool LoadFile(const CString& path, const CUIntArray& ticked = {});

private slots:
    void OnBrowse();
    void OnFileEdited();

private:
    ui::RbxSelectionRequest m_request;
    QLineEdit* m_editFile = nullptr;   // owned by the dialog
    QTreeWidget* m_listItems = nullptr;
    QLabel* m_labelStatus = nullptr;
};
