#pragma once
// The host program's sub-commands. Each command lives in its own file and registers itself.
#include <string>
#include <vector>

namespace host {

struct Command {
    const char* name;    // the word after "velmora"
    const char* summary; // one line for the overview
    int (*run)(int argc, char** argv); // argv[0] is the command name; returns the exit status
};

// Exit statuses of every command.
enum ExitStatus { kSuccess = 0, kFailed = 1, kBadUsage = 2 };

void RegisterCommand(const Command& command);
const std::vector<Command>& RegisteredCommands();

// True when one of the arguments asks for help.
bool WantsHelp(int argc, char** argv);
// Prints "velmora: message" and a hint to stderr; returns kBadUsage.
int UsageError(const std::string& command, const std::string& message);

} // namespace host

#define VELMORA_REGISTER_COMMAND(NAME, SUMMARY, FUNCTION)                                                   \
    namespace {                                                                                             \
    const bool registered_##FUNCTION = (host::RegisterCommand({NAME, SUMMARY, FUNCTION}), true);            \
    }
