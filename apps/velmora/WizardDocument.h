#pragma once
// `velmora wizard DOC` apart from its command line: the setup wizard of the plug-in run on a
// parameter document, and the new document written back in its place.
#include "apps/velmora/Plugin.h"

#include <string>

namespace host {

// The wizard's outcome for the caller.
struct WizardOutcome {
    int result = 0;         // ShowSetupGUI's result: 12325 after Finish, 2 after Cancel
    bool written = false;   // DOC holds the new setup
    std::string error;      // why DOC could not be read or written
};

// Loads `document` (or starts from an empty setup when it does not exist), runs the wizard, and
// after Finish replaces `document` at once by the new one (written beside it, then renamed), with
// the file names inside its folder written relative to it. Cancel leaves `document` untouched.
WizardOutcome RunWizardOnDocument(const Plugin& plugin, const std::string& document);

// Writes the text of a document the plug-in saved at `savedPath` to `document`, file names inside
// the document's folder made relative, replacing it in one step; false with `error` set.
bool ReplaceDocument(const std::string& savedPath, const std::string& document, std::string& error);

} // namespace host
