#pragma once
// Runs a command line through the shell, as a user types it, for the tests of the programs.
#include <string>

namespace testsupport {

struct ShellRun {
    int status = -1;  // the exit status; -1 when the command could not run or ended by a signal
    std::string out;  // what it wrote to its standard output
};

// Runs `command` and collects its standard output (redirect standard error in `command`).
ShellRun RunShell(const std::string& command);
// Runs `command` with its output left as it goes; returns its exit status as RunShell does.
int ShellStatus(const std::string& command);
// `text` in single quotes for the shell, its own single quotes included.
std::string ShellQuote(const std::string& text);

} // namespace testsupport
