#pragma once
// What the select-input page shows and decides, apart from its widgets: the state of its controls,
// how each click changes them (and the setup record), and what Next checks and stores.
#include "platform/system/Types.h"

class CEngine;
class COkaFileSelectorDlg;

// The file control's settings for an input format.
struct BrowseSettings {
    CString filter;
    CString extension;
    int mode = 1; // 1 the rbx0 selector, 2 a file-open dialog
};

// rbx0 gives its extension as "*.rbx0" when set from the record or by "Single file", and as "rbx0"
// at the page's start and by a click on "rbx0".
enum class RbxExtensionForm { Pattern, Bare };
BrowseSettings BrowseSettingsFor(int format, RbxExtensionForm form);

struct SelectInputState {
    bool singleFile = true;
    int format = 1;        // the checked format radio: 1 rbx0, 2 ASCII, 3 Excel
    BrowseSettings browse; // of the file control
    CString file;          // the file control's text
    CString folder;        // the folder control's text
    bool fileEnabled = true;
    bool folderEnabled = false;
};

// The page as first made: rbx0 settings with the bare extension, the folder field disabled.
SelectInputState InitialSelectInput();
// Activation: the controls from the record.
void LoadSelectInput(SelectInputState& state, const CEngine& engine);
// "Folder" and "Single file" start the setup afresh (ResetSetup).
void ClickFolder(SelectInputState& state, CEngine* engine);
void ClickSingleFile(SelectInputState& state, CEngine* engine);
// A format radio only changes the controls.
void ClickFormat(SelectInputState& state, int format);
// The rbx0 selector opens: with a single rbx0 file the record narrows it.
void SelectorOpening(const SelectInputState& state, CEngine* engine, COkaFileSelectorDlg* dialog);
// Next: checks the file or folder (showing 2282, 2281 or 2328 when it fails), stores the input and
// prepares the preview file and the working template. False keeps the user on the page.
bool AcceptSelectInput(const SelectInputState& state, CEngine* engine);
