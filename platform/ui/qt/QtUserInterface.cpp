#include "platform/ui/qt/QtUserInterface.h"

#include "platform/system/FileSystem.h"
#include "platform/ui/qt/DialogTranslation.h"
#include "platform/ui/qt/OkaFileSelectorDlg.h"
#include "resources/StringTable.h"
#include "wizard/FilePreviewDlg.h"

#include <QApplication>
#include <QDir>
#include <QStandardPaths>

namespace ui {
namespace {

QString Text(const std::string& text) { return QString::fromStdString(text); }

} // namespace

QWidget* QtUserInterface::DialogParent()
{
    if (QWidget* modal = QApplication::activeModalWidget())
        return modal;
    return QApplication::activeWindow();
}

int QtUserInterface::MessageBox(const std::string& text, const std::string& caption, unsigned type)
{
    const MessageBoxLook look = LookOfMessageBox(type);
    const std::string title = caption.empty() ? res::LoadString(res::IDS_VELMORA) : caption;
    QMessageBox box(look.icon, Text(title), Text(text), look.buttons, DialogParent());
    box.setDefaultButton(look.defaultButton);
    box.exec();
    return AnswerOfButton(box.standardButton(box.clickedButton()));
}

void QtUserInterface::ShowPreview(const PreviewContent& content)
{
    CFilePreviewDlg dialog(DialogParent());
    dialog.m_strTitle = content.title;
    dialog.m_vecInputLines = content.inputLines;
    dialog.m_vecHeader = content.headers;
    dialog.m_vecResultRows = content.resultRows;
    dialog.DoModal();
}

bool QtUserInterface::ChooseFile(const FileDialogRequest& request, std::string& path)
{
    const FileDialogSetup setup = SetupOfFileDialog(request);
    QFileDialog dialog(DialogParent());
    dialog.setOption(QFileDialog::DontUseNativeDialog);
    dialog.setAcceptMode(setup.acceptMode);
    dialog.setFileMode(setup.fileMode);
    dialog.setNameFilters(setup.nameFilters);
    dialog.setDefaultSuffix(setup.defaultSuffix);
    dialog.setOption(QFileDialog::DontConfirmOverwrite, !setup.confirmOverwrite);
    if (!setup.startFolder.isEmpty())
        dialog.setDirectory(setup.startFolder);
    if (!setup.selectedName.isEmpty())
        dialog.selectFile(setup.selectedName);
    if (dialog.exec() != QDialog::Accepted || dialog.selectedFiles().isEmpty())
        return false;
    path = dialog.selectedFiles().constFirst().toStdString();
    return true;
}

bool QtUserInterface::ChooseFolder(const std::string& prompt, std::string& path)
{
    return BrowseForFolder(FolderDialogRequest{prompt, path, 0}, path);
}

bool QtUserInterface::BrowseForFolder(const FolderDialogRequest& request, std::string& path)
{
    QString start = Text(request.startFolder);
    if (start.isEmpty() || !QDir(start).exists())
        start = QStandardPaths::writableLocation(QStandardPaths::DesktopLocation);
    QFileDialog dialog(DialogParent(), Text(request.prompt), start);
    dialog.setOption(QFileDialog::DontUseNativeDialog);
    dialog.setFileMode(QFileDialog::Directory);
    dialog.setOption(QFileDialog::ShowDirsOnly);
    if (dialog.exec() != QDialog::Accepted || dialog.selectedFiles().isEmpty())
        return false;
    path = dialog.selectedFiles().constFirst().toStdString();
    return true;
}

bool QtUserInterface::ChooseRbxItems(const RbxSelectionRequest& request, std::string& file,
                                     std::vector<unsigned>& items)
{
    COkaFileSelectorDlg dialog(request, DialogParent());
    if (request.opening)
        request.opening(&dialog);
    if (dialog.exec() != QDialog::Accepted)
        return false;
    file = dialog.GetSelectedFile();
    items = dialog.GetSelectedItems();
    return true;
}

} // namespace ui
