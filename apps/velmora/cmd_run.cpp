// velmora run DOC [--silent]: runs the tool on the setup stored in a parameter document.
#include "apps/velmora/Commands.h"
#include "apps/velmora/Plugin.h"
#include "platform/system/Text.h"

#include <cstdio>
#include <cstring>

namespace {

void PrintHelp()
{
    std::printf("Usage: velmora run DOC [--silent]\n\n"
                "Runs the conversion described by the setup in parameter document DOC: the plug-in hands the\n"
                "setup to the engine program and waits for it.\n\n"
                "  --silent   show no message about the outcome\n\n"
                "Exit status: 0 when the engine reported success, 1 when the run failed or DOC cannot be read,\n"
                "2 for bad usage.\n");
}

int Run(int argc, char** argv)
{
    if (host::WantsHelp(argc, argv)) {
        PrintHelp();
        return host::kSuccess;
    }
    const char* document = nullptr;
    bool silent = false;
    for (int i = 1; i < argc; ++i) {
        if (std::strcmp(argv[i], "--silent") == 0)
            silent = true;
        else if (argv[i][0] == '-' && argv[i][1] != '\0')
            return host::UsageError("run", std::string("unknown option ") + argv[i]);
        else if (document)
            return host::UsageError("run", "more than one document given");
        else
            document = argv[i];
    }
    if (!document)
        return host::UsageError("run", "no parameter document given");

    std::string error;
    std::unique_ptr<host::Plugin> plugin = host::Plugin::Load(error);
    if (!plugin) {
        std::fprintf(stderr, "velmora run: %s\n", text::EscapeControls(error).c_str());
        return host::kFailed;
    }
    int handle = plugin->LoadDocument(document, error);
    if (!handle) {
        std::fprintf(stderr, "velmora run: %s\n", text::EscapeControls(error).c_str());
        return host::kFailed;
    }
    plugin->SetWpxHandle(handle);
    int result = silent ? plugin->RunEngineSilent() : plugin->RunEngine();
    plugin->CloseDocument(plugin->GetWpxHandle());
    return result == 0 ? host::kSuccess : host::kFailed;
}

} // namespace

VELMORA_REGISTER_COMMAND("run", "run the conversion stored in a parameter document", Run)
