#pragma once
// The setup wizard as the plug-in's entry point runs it: builds the setup record and the wizard,
// reads the setup from the module's document, runs the wizard and, on Finish, writes the new
// document. Returns the wizard's result: 12325 after Finish, 2 otherwise.
//
// It needs a Qt application; when the caller runs none, one is made for the call. When nobody
// installed a user interface, the Qt one answers for the call.
int ShowSetupWizard();
