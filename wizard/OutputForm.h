#pragma once
// What the output page shows and decides, apart from its widgets: the output format, file, folder
// and title, which of them can be edited, the default extension a name gets, and the output check.
#include "platform/system/Types.h"
#include "platform/ui/UserInterface.h"

class CEngine;

struct OutputState {
    int format = 1; // the checked format radio: 1 rbx0, 2 ASCII, 3 Excel
    CString file;
    CString folder;
    CString title;
    bool fileEnabled = true; // the file field and its "..."
    bool folderEnabled = false;
    bool titleEnabled = true;
};

// Activation: the output values of the record, the radio of its format (a format outside 1..3
// leaves the radios as they are), and the enabled fields.
void LoadOutput(OutputState& state, const CEngine& engine);
// A single-file conversion names a file, a folder conversion a folder; only rbx0 has a title.
void EnableOutputControls(OutputState& state, int inputType);
// A format radio clicked: only the title follows it.
void ClickOutputFormat(OutputState& state, int format);

// The save dialog of "..." beside the file name for a format (the Excel version picks .xlsx or .xls).
ui::FileDialogRequest OutputFileRequest(int format, int excelVersion);
// Completes `name` with the format's extension when it has none: 1 when acceptable, 0 when refused
// (an ASCII name ending in ".csv": 2295). An empty name is left alone.
int AddDefaultExtension(CString& name, int format, int excelVersion);
// The installed Excel version when the format needs it for a default extension, else 0.
int ExcelVersionFor(int format);

// "..." beside the file name and beside the folder name: the chosen path goes into `state`.
void BrowseOutputFile(OutputState& state, int excelVersion);
void BrowseOutputFolder(OutputState& state);

// Next: completes the file name, runs the output check and stores the output in the record. 0 with
// the check's message shown when it refuses.
int ValidateOutput(OutputState& state, CEngine* engine, int excelVersion);
