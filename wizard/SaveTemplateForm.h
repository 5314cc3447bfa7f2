#pragma once
// What the save-template page shows and decides, apart from its widgets: the name it proposes for
// the template file, the checks of that name, the questions before a file is replaced, and the
// save itself.
#include "platform/system/Types.h"
#include "platform/ui/UserInterface.h"

class CEngine;

// The caption of the page's questions.
inline constexpr const char* kSaveTemplateCaption = "Save template file";

// The name a template is saved under when none was chosen yet: the template that was modified
// (options 1 and 2), or "template.xml" beside the input (option 3).
CString ProposeTemplateName(const CEngine& engine);
// Activation: the name the template was saved under before, else `current` when not empty, else
// the proposal.
CString LoadTemplateName(const CEngine& engine, const CString& current);
// "...": the save dialog for an XML file.
ui::FileDialogRequest TemplateSaveRequest();
// 1 when `name` may be used: a valid file name ending in ".xml" (else 2301), and Yes to 2317 when it
// is the template the setup started from, or to 2302 when a template made by hand would replace a
// file. 0 when refused or declined.
int ValidateTemplateName(const CString& name, const CEngine* engine);
// Next: validates the name, then stores it in the template and saves the template there (a failed
// save does not hold the user back). False keeps the page.
bool AcceptTemplateName(const CString& name, CEngine* engine);
