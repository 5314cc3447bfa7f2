#pragma once
// Starts one of our programs without a shell: its arguments as they are, variables set on top of
// the test's environment, optionally as an unprivileged user, its output going to files.
#include <string>
#include <sys/types.h>
#include <utility>
#include <vector>

namespace testsupport {

struct Outcome {
    int status = -1; // the exit status, or 128 + the signal that ended the program
    std::string out;
    std::string err;
};

struct Command {
    Command(std::vector<std::string> arguments, std::vector<std::pair<std::string, std::string>> variables = {},
            bool asNobody = false)
        : argv(std::move(arguments)), env(std::move(variables)), unprivileged(asNobody)
    {
    }
    std::vector<std::string> argv;
    std::vector<std::pair<std::string, std::string>> env; // set on top of the test's environment
    bool unprivileged = false; // run as user and group 65534 when the test runs as root
};

// Starts the command with its standard output and error going to the files named.
pid_t StartProgram(const Command& command, const std::string& out, const std::string& err);
// The exit status of a child, or 128 + the signal that ended it.
int WaitForExit(pid_t pid);
// Runs the command to its end; `out` and `err` hold what it wrote there and are removed after.
Outcome RunProgram(const Command& command, const std::string& out, const std::string& err);

} // namespace testsupport
