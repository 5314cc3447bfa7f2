#pragma once
// The input folder field of the select-input page: a browse edit whose "..." opens the folder
// browser and always yields a path ending in "/".
#include "platform/ui/qt/BrowseEdit.h"

class CVelmoraBrowseDirEdit : public CBrowseEdit {
    Q_OBJECT
public:
    CVelmoraBrowseDirEdit(int id, const QString& label, QWidget* parent = nullptr);

    // Opens the folder browser at the current folder (the desktop when the text names none).
    void OnBrowse() override;
};

// The folder browser's answer as the field shows it: with a closing "/".
CString WithClosingSeparator(const CString& folder);
