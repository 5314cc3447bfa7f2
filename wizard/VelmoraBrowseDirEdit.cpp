#include "wizard/VelmoraBrowseDirEdit.h"

#include "platform/system/FileSystem.h"
#include "platform/ui/UserInterface.h"
#include "resources/StringTable.h"

CString WithClosingSeparator(const CString& folder)
{
    return !folder.empty() && folder.back() == '/' ? folder : folder + '/';
}

CVelmoraBrowseDirEdit::CVelmoraBrowseDirEdit(int id, const QString& label, QWidget* parent)
    : CBrowseEdit(id, label, tr("Browse for the folder"), parent)
{
}

void CVelmoraBrowseDirEdit::OnBrowse()
{
    CString start = GetText();
    if (!start.empty() && !sys::IsDirectory(start)) {
        start.clear();
        SetText(start);
    }
    std::string chosen;
    if (ui::Current().BrowseForFolder({res::LoadString(res::IDS_SELECT_FOLDER), start, 0}, chosen) && !chosen.empty())
        SetText(WithClosingSeparator(chosen));
}
