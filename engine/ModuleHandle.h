#pragma once
// The module's current parameter document, kept as the 32-bit handle the host hands over. It is the
// only state that outlives an entry-point call; 0 means no document.
#include "platform/wpx/Wpx.h"

int GetModuleWpxHandle();
void SetModuleWpxHandle(int handle);
// The current document as a library handle (sign-extended), null when none is set.
WPXHANDLE ModuleWpxDocument();
