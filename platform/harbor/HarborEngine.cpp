#include "platform/harbor/HarborEngine.h"
#include "platform/system/FileSystem.h"
#include "platform/system/Text.h"

#include <cerrno>
#include <cstdlib>
#include <signal.h>
#include <pthread.h>
#include <sys/prctl.h>
#include <sys/stat.h>
#include <sys/wait.h>
#include <unistd.h>

extern char** environ;

namespace {

// Results of RunEngine when the program never ran, in the shell's tradition.
constexpr int kProgramNotFound = 127;
constexpr int kCannotStart = 126;
constexpr size_t kMaxPathBytes = 4096;

bool IsExecutableFile(const CString& path)
{
    struct stat st {};
    return !path.empty() && ::stat(path.c_str(), &st) == 0 && S_ISREG(st.st_mode) && ::access(path.c_str(), X_OK) == 0;
}

// Tools name their program as on the toolbox's home system; here the executable has no ".exe".
CString ExecutableName(const CString& program)
{
    if (program.size() > 4 && text::EqualsNoCase(program.substr(program.size() - 4), ".exe"))
        return program.substr(0, program.size() - 4);
    return program;
}

CString SearchPath(const CString& name)
{
    const char* path = std::getenv("PATH");
    if (!path)
        return CString();
    CString folders = path;
    size_t start = 0;
    while (start <= folders.size()) {
        size_t end = folders.find(':', start);
        if (end == CString::npos)
            end = folders.size();
        CString folder = folders.substr(start, end - start);
        CString candidate = sys::JoinPath(folder.empty() ? "." : folder, name);
        if (IsExecutableFile(candidate))
            return candidate;
        start = end + 1;
    }
    return CString();
}

int WaitFor(pid_t child)
{
    int status = 0;
    while (::waitpid(child, &status, 0) < 0) {
        if (errno != EINTR)
            return kCannotStart;
    }
    if (WIFEXITED(status))
        return WEXITSTATUS(status);
    if (WIFSIGNALED(status))
        return 128 + WTERMSIG(status);
    return kCannotStart;
}

// In the child between fork and exec: only calls that are safe there. Handlers the host set are
// reset first, so that no signal in this short time runs host code in the child; the engine is
// tied to the life of the thread that started it, so it stops when the host dies, however it dies.
[[noreturn]] void ExecEngine(const char* path, char* const argv[], pid_t host, const sigset_t& hostMask)
{
    struct sigaction defaultAction {};
    defaultAction.sa_handler = SIG_DFL;
    for (int signal = 1; signal < NSIG; ++signal) {
        struct sigaction current {};
        if (::sigaction(signal, nullptr, &current) == 0 && current.sa_handler != SIG_IGN && current.sa_handler != SIG_DFL)
            ::sigaction(signal, &defaultAction, nullptr);
    }
    ::prctl(PR_SET_PDEATHSIG, SIGTERM);
    if (::getppid() != host)
        ::_exit(kCannotStart); // the host is already gone
    ::pthread_sigmask(SIG_SETMASK, &hostMask, nullptr);
    ::execve(path, argv, environ);
    ::_exit(errno == ENOENT ? kProgramNotFound : kCannotStart);
}

} // namespace

void CHarborEngine::SetDataDepDefaultValues() {}

void CHarborEngine::GetOverviewText(CString& text) { text += "Name: " + m_strSetupName + "\r\n"; }

void CHarborEngine::SetInputFileConstraints(COkaFileSelectorDlg*) {}

int CHarborEngine::RunTool(int)
{
    CString message;
    return _Verify(message);
}

int CHarborEngine::_Verify(CString& message)
{
    if (m_strLogFileDir.empty() || sys::IsDirectory(m_strLogFileDir) || IsValidFileName(m_strLogFileDir))
        return 0;
    message = "The log location \"" + m_strLogFileDir + "\" is neither a folder nor a file in an existing folder.";
    return 1;
}

CString CHarborEngine::FindEngineProgram(const CString& program)
{
    if (const char* chosen = std::getenv("VELMORA_ENGINE"); chosen && *chosen)
        return chosen;
    CString name = ExecutableName(program);
    if (name.empty())
        return CString();
    if (name.find('/') != CString::npos)
        return IsExecutableFile(name) ? name : CString();
    // Beside the module that holds this code: the plug-in, or a program linking it statically.
    CString beside = sys::JoinPath(sys::ModuleFolder(reinterpret_cast<const void*>(&CHarborEngine::FindEngineProgram)),
                                   name);
    if (IsExecutableFile(beside))
        return beside;
    return SearchPath(name);
}

int CHarborEngine::RunEngine(CString program, CString setupFile, int flag)
{
    return RunEngine(std::move(program), std::move(setupFile), flag, {});
}

int CHarborEngine::RunEngine(CString program, CString setupFile, int flag, const std::vector<CString>& options)
{
    CString path = FindEngineProgram(program);
    if (path.empty())
        return kProgramNotFound;
    CString flagText = std::to_string(flag);
    std::vector<CString> texts = options;
    std::vector<char*> argv = {path.data(), setupFile.data(), flagText.data()};
    for (CString& option : texts)
        argv.push_back(option.data());
    argv.push_back(nullptr);
    const pid_t host = ::getpid();
    sigset_t all, hostMask;
    sigfillset(&all);
    ::pthread_sigmask(SIG_SETMASK, &all, &hostMask);
    const pid_t child = ::fork();
    if (child == 0)
        ExecEngine(path.c_str(), argv.data(), host, hostMask);
    ::pthread_sigmask(SIG_SETMASK, &hostMask, nullptr);
    if (child < 0)
        return kCannotStart;
    return WaitFor(child);
}

int CHarborEngine::IsValidFileName(CString name)
{
    if (name.empty() || name.size() > kMaxPathBytes || name.find('\0') != CString::npos)
        return 0;
    CString last = sys::FileTitle(name);
    if (last.empty() || last == "." || last == "..")
        return 0;
    CString folder = sys::FolderOf(name);
    return sys::IsDirectory(folder.empty() ? CString(".") : folder) ? 1 : 0;
}
