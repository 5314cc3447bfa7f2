#pragma once
// The one way the plug-in talks to a person: message boxes, the preview dialog and file choosers.
// Parsers, pages and the setup record call these functions; which implementation answers is chosen
// at the edge (Qt in the wizard, console in the host program, scripted in tests, silent in the bridge).
#include <deque>
#include <functional>
#include <span>
#include <string>
#include <vector>

class COkaFileSelectorDlg; // the rbx0 file-and-item selector of the Qt layer

namespace ui {

// Message box styles and answers, with the values the toolbox uses.
enum : unsigned {
    MB_OK = 0x0,
    MB_OKCANCEL = 0x1,
    MB_ABORTRETRYIGNORE = 0x2,
    MB_YESNOCANCEL = 0x3,
    MB_YESNO = 0x4,
    MB_RETRYCANCEL = 0x5,
    MB_ICONSTOP = 0x10,
    MB_ICONQUESTION = 0x20,
    MB_ICONEXCLAMATION = 0x30,
    MB_ICONINFORMATION = 0x40,
};
enum : int { IDOK = 1, IDCANCEL = 2, IDABORT = 3, IDRETRY = 4, IDIGNORE = 5, IDYES = 6, IDNO = 7 };

// File dialog flags the pages pass, with the values the toolbox uses.
enum : unsigned {
    OFN_OVERWRITEPROMPT = 0x2,
    OFN_HIDEREADONLY = 0x4,
    OFN_ALLOWMULTISELECT = 0x200,
    OFN_FILEMUSTEXIST = 0x1000,
};

using Row = std::vector<std::string>;
using Rows = std::vector<Row>;

// What the file preview dialog shows. The lists are borrowed from the caller for the duration of
// ShowPreview: a preview table can hold millions of rows, so it is never copied on the way.
struct PreviewContent {
    std::string title;                     // window title; empty keeps the dialog's own
    std::span<const Row> inputLines;       // "Input file" list; empty hides it
    std::span<const std::string> headers;  // column titles of "Import result"
    std::span<const Row> resultRows;       // "Import result" rows
};

// A preview kept after its dialog closed, with its own copy of the lists.
struct RecordedPreview {
    std::string title;
    Rows inputLines;
    std::vector<std::string> headers;
    Rows resultRows;
};

struct FileDialogRequest {
    bool open = true;                 // open dialog, else save dialog
    std::string defaultExtension;     // without the dot
    std::string initialName;
    std::string filter;               // "Name (*.x)|*.x|...||"
    unsigned flags = 0;
};

// The folder browser: `startFolder` is where it opens (empty: the desktop).
struct FolderDialogRequest {
    std::string prompt;
    std::string startFolder;
    unsigned flags = 0; // the shell's BIF_ flags, as the page passes them
};

// The rbx0 file-and-item selector: a file and the items of it to use.
struct RbxSelectionRequest {
    std::string filter; // "Name (*.x)|*.x|...||" for its file chooser
    std::string extension;
    std::string initialFile;
    std::vector<unsigned> initialItems; // 0-based positions
    // Called once the selector exists, before it is shown, so the caller may narrow it (null in
    // implementations that show no selector).
    std::function<void(COkaFileSelectorDlg*)> opening;
};

class UserInterface {
public:
    virtual ~UserInterface() = default;
    // Shows a modal message box and returns the button pressed (IDOK, IDYES, ...).
    virtual int MessageBox(const std::string& text, const std::string& caption, unsigned type) = 0;
    // Shows the preview dialog modally; returns when it is closed.
    virtual void ShowPreview(const PreviewContent& content) = 0;
    // File and folder choosers: true with `path` set when the user chose one.
    virtual bool ChooseFile(const FileDialogRequest& request, std::string& path) = 0;
    virtual bool ChooseFolder(const std::string& prompt, std::string& path) = 0;
    // The folder browser with its start folder and flags; by default the plain ChooseFolder.
    virtual bool BrowseForFolder(const FolderDialogRequest& request, std::string& path);
    // The rbx0 selector: true with the chosen file and items; none where nothing can be shown.
    virtual bool ChooseRbxItems(const RbxSelectionRequest& request, std::string& file, std::vector<unsigned>& items);
};

// The implementation in force on the calling thread: the one installed for this thread by a
// ScopedUserInterface, else the process-wide one, else the console.
UserInterface& Current();
// Replaces the process-wide implementation (null restores the console); not owned.
void SetProcessUserInterface(UserInterface* ui);
// The implementation someone installed (thread or process), or null when the console answers.
UserInterface* InstalledUserInterface();

// Installs an implementation for the calling thread for the lifetime of this object.
class ScopedUserInterface {
public:
    explicit ScopedUserInterface(UserInterface& ui);
    ~ScopedUserInterface();
    ScopedUserInterface(const ScopedUserInterface&) = delete;
    ScopedUserInterface& operator=(const ScopedUserInterface&) = delete;

private:
    UserInterface* m_previous;
};

// Shorthands through Current().
int MessageBox(const std::string& text, const std::string& caption, unsigned type);
// An OK box with the warning icon showing string-table text `stringId`, as parsers and pages show them.
int ShowStringMessage(int stringId);

// Prints boxes to stderr and answers the default button; used by the host program without a display.
class ConsoleUserInterface : public UserInterface {
public:
    int MessageBox(const std::string& text, const std::string& caption, unsigned type) override;
    void ShowPreview(const PreviewContent& content) override;
    bool ChooseFile(const FileDialogRequest& request, std::string& path) override;
    bool ChooseFolder(const std::string& prompt, std::string& path) override;
};

// Shows nothing and answers the default button: for readers that must run silently.
class SilentUserInterface : public UserInterface {
public:
    int MessageBox(const std::string&, const std::string&, unsigned type) override;
    void ShowPreview(const PreviewContent&) override {}
    bool ChooseFile(const FileDialogRequest&, std::string&) override { return false; }
    bool ChooseFolder(const std::string&, std::string&) override { return false; }
};

// Records everything shown and answers from queues: for tests and for `--json` reports.
class ScriptedUserInterface : public UserInterface {
public:
    struct Box {
        std::string text;
        std::string caption;
        unsigned type = 0;
    };
    std::vector<Box> boxes;
    std::vector<RecordedPreview> previews;
    std::deque<int> answers;            // next message-box answers; default button when empty
    std::deque<std::string> chosenPaths; // next file/folder choices; cancelled when empty
    std::vector<FileDialogRequest> fileRequests;
    std::vector<FolderDialogRequest> folderRequests;
    std::vector<RbxSelectionRequest> rbxRequests;
    std::deque<std::vector<unsigned>> chosenItems; // items of the next rbx0 selections; none when empty

    int MessageBox(const std::string& text, const std::string& caption, unsigned type) override;
    void ShowPreview(const PreviewContent& content) override;
    bool ChooseFile(const FileDialogRequest& request, std::string& path) override;
    bool ChooseFolder(const std::string& prompt, std::string& path) override;
    bool BrowseForFolder(const FolderDialogRequest& request, std::string& path) override;
    // Tells the caller the selector opens (with no dialog), then answers from chosenPaths and
    // chosenItems.
    bool ChooseRbxItems(const RbxSelectionRequest& request, std::string& file, std::vector<unsigned>& items) override;

private:
    bool NextPath(std::string& path);
};

// The button a box answers with when nobody presses one: OK, or Yes for a yes/no box.
int DefaultAnswer(unsigned type);

} // namespace ui
