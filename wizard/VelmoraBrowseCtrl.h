#pragma once
// The input file field of the select-input page: a browse edit whose "..." opens either the rbx0
// file-and-item selector (mode 1) or a plain file-open dialog (mode 2).
#include "platform/ui/qt/BrowseEdit.h"

class COkaFileSelectorDlg;

class CVelmoraBrowseCtrl : public CBrowseEdit {
    Q_OBJECT
public:
    enum : int { kRbxSelector = 1, kFileDialog = 2 };

    CVelmoraBrowseCtrl(int id, const QString& label, QWidget* parent = nullptr);

    void SetFilter(const CString& filter) { m_strFilter = filter; }
    void SetExtension(const CString& extension) { m_strExtension = extension; }
    void SetInitialFile(const CString& file) { SetText(file); }
    void SetInitialItems(const CUIntArray& items) { m_arrInitialItems = items; }
    CString GetSelectedFile() const { return GetText(); }
    const CUIntArray& GetSelectedItems() const { return m_arrSelectedItems; }

    void OnBrowse() override;

    int m_nBrowseMode = kRbxSelector;
    int m_bSave = 0; // a save dialog instead of an open one
    CString m_strFilter;
    CString m_strExtension;
    CString m_strTitle; // the file dialog's title; empty for the standard one

signals:
    // The rbx0 selector is about to show; the page may narrow it.
    void SelectorOpening(COkaFileSelectorDlg* dialog);

private:
    CUIntArray m_arrInitialItems;
    CUIntArray m_arrSelectedItems;
};
