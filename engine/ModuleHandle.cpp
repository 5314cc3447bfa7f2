#include "engine/ModuleHandle.h"

namespace {
int g_wpxHandle = 0; // unlocked like the host's own variable: entry points run on the host's thread
}

int GetModuleWpxHandle() { return g_wpxHandle; }

void SetModuleWpxHandle(int handle) { g_wpxHandle = handle; }

WPXHANDLE ModuleWpxDocument() { return wpxHandleFromInt(g_wpxHandle); }
