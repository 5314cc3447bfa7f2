#include "wizard/VelmoraBrowseCtrl.h"

#include "platform/ui/UserInterface.h"
#include "platform/ui/qt/OkaFileSelectorDlg.h"

CVelmoraBrowseCtrl::CVelmoraBrowseCtrl(int id, const QString& label, QWidget* parent)
    : CBrowseEdit(id, label, tr("Browse for the file"), parent)
{
}

void CVelmoraBrowseCtrl::OnBrowse()
{
    std::string path;
    if (m_nBrowseMode == kRbxSelector) {
        ui::RbxSelectionRequest request;
        request.filter = m_strFilter;
        request.extension = m_strExtension;
        request.initialFile = GetSelectedFile();
        request.initialItems = m_arrInitialItems;
        request.opening = [this](COkaFileSelectorDlg* dialog) { emit SelectorOpening(dialog); };
        CUIntArray items;
        if (!ui::Current().ChooseRbxItems(request, path, items))
            return;
        m_arrSelectedItems = items;
    } else {
        ui::FileDialogRequest request;
        request.open = !m_bSave;
        request.defaultExtension = m_strExtension;
        request.initialName = m_strExtension;
        request.filter = m_strFilter;
        request.flags = ui::OFN_ALLOWMULTISELECT | ui::OFN_HIDEREADONLY | ui::OFN_OVERWRITEPROMPT;
        if (!ui::Current().ChooseFile(request, path))
            return;
    }
    SetInitialFile(path);
}
