#pragma once
// The user interface the wizard runs with: real Qt message boxes, file dialogs, the folder browser,
// the rbx0 selector and the preview dialog, each modal over the window in front.
#include "platform/ui/UserInterface.h"

class QWidget;

namespace ui {

class QtUserInterface : public UserInterface {
public:
    int MessageBox(const std::string& text, const std::string& caption, unsigned type) override;
    void ShowPreview(const PreviewContent& content) override;
    bool ChooseFile(const FileDialogRequest& request, std::string& path) override;
    bool ChooseFolder(const std::string& prompt, std::string& path) override;
    bool BrowseForFolder(const FolderDialogRequest& request, std::string& path) override;
    bool ChooseRbxItems(const RbxSelectionRequest& request, std::string& file, std::vector<unsigned>& items) override;

    // The window a new dialog belongs to: the modal dialog in front, else the active window.
    static QWidget* DialogParent();
};

} // namespace ui
