// velmora wizard DOC: the setup wizard on a parameter document.
#include "apps/velmora/Commands.h"
#include "apps/velmora/WizardDocument.h"

#include <cstdio>
#include <cstdlib>
#include <cstring>

namespace {

void PrintHelp()
{
    std::printf("Usage: velmora wizard DOC\n\n"
                "Opens the setup wizard on parameter document DOC: the setup stored in it is shown, or an empty\n"
                "setup when DOC does not exist yet. After Finish DOC is replaced by the new setup (file names\n"
                "inside DOC's folder are written relative to it); Cancel leaves DOC as it was.\n\n"
                "The wizard needs a display: an X server ($DISPLAY), Wayland ($WAYLAND_DISPLAY), or any Qt\n"
                "platform named in $QT_QPA_PLATFORM.\n\n"
                "Exit status: 0 after Finish with DOC written, 1 after Cancel or when DOC cannot be read or\n"
                "written, 2 for bad usage.\n");
}

bool HasDisplay()
{
    for (const char* name : {"DISPLAY", "WAYLAND_DISPLAY", "QT_QPA_PLATFORM"})
        if (const char* value = std::getenv(name); value && *value)
            return true;
    return false;
}

int Run(int argc, char** argv)
{
    if (host::WantsHelp(argc, argv)) {
        PrintHelp();
        return host::kSuccess;
    }
    const char* document = nullptr;
    for (int i = 1; i < argc; ++i) {
        if (argv[i][0] == '-' && argv[i][1] != '\0')
            return host::UsageError("wizard", std::string("unknown option ") + argv[i]);
        if (document)
            return host::UsageError("wizard", "more than one document given");
        document = argv[i];
    }
    if (!document)
        return host::UsageError("wizard", "no parameter document given");
    if (!HasDisplay()) {
        std::fprintf(stderr, "velmora wizard: no display to show the wizard on; set DISPLAY (or "
                             "QT_QPA_PLATFORM=offscreen for a wizard nobody sees)\n");
        return host::kFailed;
    }

    std::string error;
    std::unique_ptr<host::Plugin> plugin = host::Plugin::Load(error);
    if (!plugin) {
        std::fprintf(stderr, "velmora wizard: %s\n", error.c_str());
        return host::kFailed;
    }
    const host::WizardOutcome outcome = host::RunWizardOnDocument(*plugin, document);
    if (!outcome.error.empty()) {
        std::fprintf(stderr, "velmora wizard: %s\n", outcome.error.c_str());
        return host::kFailed;
    }
    if (outcome.result != 12325 && outcome.result != 2) {
        std::fprintf(stderr, "velmora wizard: the wizard could not run; %s is unchanged\n", document);
        return host::kFailed;
    }
    if (!outcome.written) {
        std::fprintf(stderr, "velmora wizard: cancelled; %s is unchanged\n", document);
        return host::kFailed;
    }
    std::printf("velmora wizard: the setup is written to %s\n", document);
    return host::kSuccess;
}

} // namespace

VELMORA_REGISTER_COMMAND("wizard", "describe a conversion in the setup wizard and store it in a parameter document", Run)
