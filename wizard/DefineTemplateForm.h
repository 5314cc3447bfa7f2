#pragma once
// What the define-template page shows and decides, apart from its widgets: which template option
// is checked, the template path, the explanation lines, and the checks Next and Preview run.
#include "platform/system/Types.h"
#include "platform/ui/UserInterface.h"

#include <array>

class CEngine;

struct DefineTemplateState {
    int storedOption = 1;  // the page's option as last shown (1 unchanged, 2 modify, 3 manual)
    int checkedOption = 1; // the option whose radio is checked
    CString path;          // the template file field
    bool radiosVisible = true;
    std::array<CString, 3> lines = {"You have chosen to convert a single ascii file.",
                                    "To convert it, you need to specify the format manually or thought a template.",
                                    "You have the following option:"};
    bool pathEnabled = true; // the field and its "..." button
    bool previewEnabled = true;
    bool previewVisible = true;
};

// Activation: the option and path from the record (a "modify" without a file shows as manual, a
// manual one with a file as "modify"), the lines for the input, the field and Preview states.
void LoadDefineTemplate(DefineTemplateState& state, const CEngine& engine);
// "Use unchanged" (1) or "modify" (2) clicked.
void ClickExistingTemplate(DefineTemplateState& state, int option);
// "Manually" clicked: no template file.
void ClickManual(DefineTemplateState& state);
// The "..." dialog: open a template, or name one to save when the page's option is manual.
ui::FileDialogRequest TemplateFileRequest(const DefineTemplateState& state);

// The checks of the page: an existing template file for options 1 and 2 (else 2293), and with
// `check` for option 1 that the template fits the input (2282, 2283, or silently for a single
// file the bridge refuses).
bool CheckTemplateChoice(const DefineTemplateState& state, CEngine* engine, bool check);
// Next: checks, stores the option and path, loads the template and, for an unchanged template,
// parses the preview file. False keeps the user on the page (the choice may still be stored).
bool AcceptDefineTemplate(const DefineTemplateState& state, CEngine* engine);
// Preview: stores and loads the choice without checking its fit, then the common preview.
int PreviewDefineTemplate(const DefineTemplateState& state, CEngine* engine);
