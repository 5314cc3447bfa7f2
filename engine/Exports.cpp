// The plug-in's exported entry points. No exception ever crosses them: a failure inside becomes
// the entry point's failure value.
#include "engine/Engine.h"
#include "platform/wpx/Wpx.h"
#include "wizard/SetupGui.h"

#include <algorithm>
#include <cstring>
#include <exception>

#define VELMORA_EXPORT extern "C" __attribute__((visibility("default")))

namespace {

template <typename Function>
int Guarded(int failure, Function function) noexcept
{
    try {
        return function();
    } catch (...) {
        return failure;
    }
}

void CopyMessage(const CString& message, char* buffer, int size)
{
    if (!buffer || size <= 0)
        return;
    size_t length = std::min(message.size(), static_cast<size_t>(size - 1));
    std::memcpy(buffer, message.data(), length);
    buffer[length] = '\0';
}

int RunWithSetup(int silent)
{
    CEngine engine;
    ReadSetup(engine);
    return engine.RunTool(silent);
}

} // namespace

VELMORA_EXPORT void SetWpxHandle(int handle) { SetModuleWpxHandle(handle); }

VELMORA_EXPORT int GetWpxHandle() { return GetModuleWpxHandle(); }

VELMORA_EXPORT int RunEngine() { return Guarded(-1, [] { return RunWithSetup(0); }); }

VELMORA_EXPORT int RunEngineSilent() { return Guarded(-1, [] { return RunWithSetup(1); }); }

VELMORA_EXPORT int MyFunc() { return -1; }

// Runs the setup wizard on the module's document; 12325 after Finish (the new document is then
// the module's), 2 after Cancel, -1 when it could not run.
VELMORA_EXPORT int ShowSetupGUI() { return Guarded(-1, [] { return ShowSetupWizard(); }); }

// Documents live in the plug-in's handle table, so the host opens, saves and closes them here.
// LoadWpxDocument returns the new document's handle, or 0 with the reason ("file:line: ...") in
// `error` (truncated to `size` bytes, terminated).
VELMORA_EXPORT int LoadWpxDocument(const char* path, char* error, int size)
{
    return Guarded(0, [&] {
        WPXHANDLE document = nullptr;
        CString message;
        if (!wpxRead(path ? path : "", &document, &message)) {
            CopyMessage(message, error, size);
            return 0;
        }
        return wpxHandleToInt(document);
    });
}

// Writes document `handle` to `path`; 1 on success, 0 when it cannot be written.
VELMORA_EXPORT int SaveWpxDocument(int handle, const char* path)
{
    return Guarded(0, [&] { return path ? wpxWrite(wpxHandleFromInt(handle), path) : 0; });
}

// Frees document `handle`; the module's handle is cleared when it was this one.
VELMORA_EXPORT int CloseWpxDocument(int handle)
{
    return Guarded(0, [&] {
        WPXHANDLE document = wpxHandleFromInt(handle);
        if (GetModuleWpxHandle() == handle)
            SetModuleWpxHandle(0);
        return wpxClose(&document);
    });
}
