#include "tests/support/ShellCommand.h"

#include <cstdio>
#include <cstdlib>
#include <sys/wait.h>

namespace testsupport {

namespace {

int ExitStatus(int raw) { return raw != -1 && WIFEXITED(raw) ? WEXITSTATUS(raw) : -1; }

} // namespace

ShellRun RunShell(const std::string& command)
{
    ShellRun run;
    FILE* pipe = ::popen(command.c_str(), "r");
    if (!pipe)
        return run;
    char buffer[4096];
    while (const size_t got = std::fread(buffer, 1, sizeof buffer, pipe))
        run.out.append(buffer, got);
    run.status = ExitStatus(::pclose(pipe));
    return run;
}

int ShellStatus(const std::string& command) { return ExitStatus(std::system(command.c_str())); }

std::string ShellQuote(const std::string& text)
{
    std::string quoted = "'";
    for (char c : text)
        quoted += c == '\'' ? std::string("'\\''") : std::string(1, c);
    return quoted + "'";
}

} // namespace testsupport
