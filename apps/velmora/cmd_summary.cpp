// velmora summary DOC: prints the summary of the setup stored in a parameter document, as the
// wizard's overview page shows it.
#include "apps/velmora/Commands.h"
#include "engine/Engine.h"

#include <cstdio>

namespace {

void PrintHelp()
{
    std::printf("Usage: velmora summary DOC\n\n"
                "Prints the summary of the setup stored in parameter document DOC (lines end in CR LF).\n\n"
                "Exit status: 0 on success, 1 when DOC cannot be read or holds no setup, 2 for bad usage.\n");
}

int Summary(int argc, char** argv)
{
    if (host::WantsHelp(argc, argv)) {
        PrintHelp();
        return host::kSuccess;
    }
    if (argc != 2)
        return host::UsageError("summary", argc < 2 ? "no parameter document given" : "more than one argument");
    if (argv[1][0] == '-')
        return host::UsageError("summary", std::string("unknown option ") + argv[1]);

    WPXHANDLE document = nullptr;
    CString error;
    if (!wpxRead(argv[1], &document, &error)) {
        std::fprintf(stderr, "velmora summary: %s\n", error.c_str());
        return host::kFailed;
    }
    SetModuleWpxHandle(wpxHandleToInt(document));
    CEngine engine;
    int read = ReadSetup(engine);
    SetModuleWpxHandle(0);
    wpxClose(&document);
    if (read != 0) {
        std::fprintf(stderr, "velmora summary: %s: no setup; expected a target holding a section \"Setup\"\n",
                     argv[1]);
        return host::kFailed;
    }
    CString text;
    engine.GetOverviewText(text);
    std::fwrite(text.data(), 1, text.size(), stdout);
    return host::kSuccess;
}

} // namespace

VELMORA_REGISTER_COMMAND("summary", "print the summary of the setup stored in a parameter document", Summary)
