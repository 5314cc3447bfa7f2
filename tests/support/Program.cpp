#include "tests/support/Program.h"
#include "tests/support/Files.h"

#include <cstdio>
#include <fcntl.h>
#include <grp.h>
#include <map>
#include <sys/wait.h>
#include <unistd.h>

namespace testsupport {

namespace {

constexpr uid_t kNobody = 65534;

// The test's environment with the command's variables on top, as "NAME=value" texts.
std::vector<std::string> Environment(const Command& command)
{
    std::map<std::string, std::string> variables;
    for (char** entry = environ; *entry; ++entry) {
        const std::string text = *entry;
        variables[text.substr(0, text.find('='))] = text.substr(std::min(text.size(), text.find('=') + 1));
    }
    for (const auto& [name, value] : command.env)
        variables[name] = value;
    std::vector<std::string> texts;
    for (const auto& [name, value] : variables)
        texts.push_back(name + "=" + value);
    return texts;
}

} // namespace

pid_t StartProgram(const Command& command, const std::string& out, const std::string& err)
{
    std::vector<char*> argv;
    for (const std::string& arg : command.argv)
        argv.push_back(const_cast<char*>(arg.c_str()));
    argv.push_back(nullptr);
    // The environment is built before the fork: the child only makes system calls.
    std::vector<std::string> texts = Environment(command);
    std::vector<char*> envp;
    for (std::string& text : texts)
        envp.push_back(text.data());
    envp.push_back(nullptr);
    const pid_t pid = ::fork();
    if (pid != 0)
        return pid;
    const int outFd = ::open(out.c_str(), O_WRONLY | O_CREAT | O_TRUNC, 0666);
    const int errFd = ::open(err.c_str(), O_WRONLY | O_CREAT | O_TRUNC, 0666);
    if (outFd < 0 || errFd < 0 || ::dup2(outFd, 1) < 0 || ::dup2(errFd, 2) < 0)
        ::_exit(120);
    if (command.unprivileged && ::geteuid() == 0 &&
        (::setgroups(0, nullptr) != 0 || ::setgid(kNobody) != 0 || ::setuid(kNobody) != 0))
        ::_exit(121);
    ::execve(argv[0], argv.data(), envp.data());
    ::_exit(122);
}

int WaitForExit(pid_t pid)
{
    int status = 0;
    if (::waitpid(pid, &status, 0) != pid)
        return -1;
    return WIFEXITED(status) ? WEXITSTATUS(status) : 128 + WTERMSIG(status);
}

Outcome RunProgram(const Command& command, const std::string& out, const std::string& err)
{
    Outcome outcome;
    outcome.status = WaitForExit(StartProgram(command, out, err));
    outcome.out = ReadFile(out);
    outcome.err = ReadFile(err);
    std::remove(out.c_str());
    std::remove(err.c_str());
    return outcome;
}

} // namespace testsupport
