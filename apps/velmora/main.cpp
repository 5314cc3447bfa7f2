// velmora: the host program. It stands where the toolbox host stands: it loads the plug-in, hands it
// a parameter document and calls its entry points; it also carries the commands people need around it.
#include "apps/velmora/Commands.h"

#include <algorithm>
#include <cstdio>
#include <cstring>

namespace host {

std::vector<Command>& MutableCommands()
{
    static std::vector<Command> commands;
    return commands;
}

void RegisterCommand(const Command& command) { MutableCommands().push_back(command); }

const std::vector<Command>& RegisteredCommands()
{
    auto& commands = MutableCommands();
    std::sort(commands.begin(), commands.end(),
              [](const Command& a, const Command& b) { return std::strcmp(a.name, b.name) < 0; });
    return commands;
}

bool WantsHelp(int argc, char** argv)
{
    for (int i = 1; i < argc; ++i)
        if (std::strcmp(argv[i], "--help") == 0 || std::strcmp(argv[i], "-h") == 0)
            return true;
    return false;
}

int UsageError(const std::string& command, const std::string& message)
{
    std::fprintf(stderr, "velmora %s: %s\nTry 'velmora %s --help'.\n", command.c_str(), message.c_str(),
                 command.c_str());
    return kBadUsage;
}

} // namespace host

namespace {

void PrintOverview(FILE* out)
{
    std::fprintf(out,
                 "Usage: velmora COMMAND [ARGS...]\n\n"
                 "Describe and batch-convert time-series files (rbx0, ASCII text, Excel).\n\n"
                 "Commands:\n");
    for (const host::Command& command : host::RegisteredCommands())
        std::fprintf(out, "  %-10s %s\n", command.name, command.summary);
    std::fprintf(out, "\nRun 'velmora COMMAND --help' for the arguments of a command.\n");
}

} // namespace

int main(int argc, char** argv)
{
    if (argc < 2) {
        PrintOverview(stderr);
        return host::kBadUsage;
    }
    if (std::strcmp(argv[1], "--help") == 0 || std::strcmp(argv[1], "-h") == 0 || std::strcmp(argv[1], "help") == 0) {
        PrintOverview(stdout);
        return host::kSuccess;
    }
    for (const host::Command& command : host::RegisteredCommands())
        if (std::strcmp(argv[1], command.name) == 0)
            return command.run(argc - 1, argv + 1);
    std::fprintf(stderr, "velmora: unknown command '%s'\n\n", argv[1]);
    PrintOverview(stderr);
    return host::kBadUsage;
}
