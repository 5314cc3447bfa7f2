#include "engine/TemporarySetupFile.h"

#include <atomic>
#include <cerrno>
#include <cstring>
#include <fcntl.h>
#include <iterator>
#include <mutex>
#include <signal.h>
#include <sys/stat.h>
#include <unistd.h>

namespace {

constexpr int kNameAttempts = 100;

// The signals after which the host can still act; each is handed on afterwards to whatever the
// host had set for it.
constexpr int kSignals[] = {SIGINT, SIGTERM, SIGHUP, SIGQUIT};
constexpr size_t kSignalCount = std::size(kSignals);

// The files a signal handler removes: fixed storage, read without locks or allocation. A host runs
// one engine at a time on its interface thread; a few more slots cover hosts that run several.
constexpr int kSlots = 16;
constexpr size_t kPathBytes = 4096;
char g_paths[kSlots][kPathBytes];
std::atomic<bool> g_claimed[kSlots];
std::atomic<bool> g_armed[kSlots]; // the path is complete and the file still ours

std::mutex g_handlersMutex;
int g_users = 0; // objects holding a slot; the handlers are in place while there are any
struct sigaction g_previous[kSignalCount];
bool g_installed[kSignalCount];

void RemoveOnSignal(int signal)
{
    const int savedErrno = errno;
    for (int slot = 0; slot < kSlots; ++slot)
        if (g_armed[slot].exchange(false))
            ::unlink(g_paths[slot]);
    // The signal is blocked while this runs: raised again, it reaches the host's own disposition
    // as soon as this returns.
    for (size_t i = 0; i < kSignalCount; ++i)
        if (kSignals[i] == signal && g_installed[i])
            ::sigaction(signal, &g_previous[i], nullptr);
    ::raise(signal);
    errno = savedErrno;
}

bool IsOurs(int signal)
{
    struct sigaction current {};
    return ::sigaction(signal, nullptr, &current) == 0 && current.sa_handler == RemoveOnSignal;
}

void InstallHandlers()
{
    struct sigaction ours {};
    ours.sa_handler = RemoveOnSignal;
    ours.sa_flags = SA_RESTART;
    sigemptyset(&ours.sa_mask);
    for (size_t i = 0; i < kSignalCount; ++i) {
        g_installed[i] = false;
        if (::sigaction(kSignals[i], nullptr, &g_previous[i]) != 0 || g_previous[i].sa_handler == SIG_IGN)
            continue; // a signal the host ignores stops nothing
        g_installed[i] = ::sigaction(kSignals[i], &ours, nullptr) == 0;
    }
}

void RestoreHandlers()
{
    for (size_t i = 0; i < kSignalCount; ++i)
        if (g_installed[i] && IsOurs(kSignals[i]))
            ::sigaction(kSignals[i], &g_previous[i], nullptr);
}

int ClaimSlot(const std::string& path)
{
    if (path.size() >= kPathBytes)
        return -1;
    for (int slot = 0; slot < kSlots; ++slot) {
        bool expected = false;
        if (!g_claimed[slot].compare_exchange_strong(expected, true))
            continue;
        std::memcpy(g_paths[slot], path.c_str(), path.size() + 1);
        std::lock_guard<std::mutex> lock(g_handlersMutex);
        if (g_users++ == 0)
            InstallHandlers();
        g_armed[slot].store(true);
        return slot;
    }
    return -1;
}

// False when the handler already removed the file.
bool ReleaseSlot(int slot)
{
    if (slot < 0)
        return true;
    const bool armed = g_armed[slot].exchange(false);
    {
        std::lock_guard<std::mutex> lock(g_handlersMutex);
        if (--g_users == 0)
            RestoreHandlers();
    }
    g_claimed[slot].store(false);
    return armed;
}

// `name` with "-<n>" before its extension.
std::string Numbered(const std::string& name, int n)
{
    const size_t dot = name.rfind('.');
    const size_t cut = dot == std::string::npos ? name.size() : dot;
    return name.substr(0, cut) + "-" + std::to_string(n) + name.substr(cut);
}

bool WriteAll(int fd, const std::string& content)
{
    size_t done = 0;
    while (done < content.size()) {
        const ssize_t n = ::write(fd, content.data() + done, content.size() - done);
        if (n < 0 && errno == EINTR)
            continue;
        if (n <= 0)
            return false;
        done += static_cast<size_t>(n);
    }
    return true;
}

} // namespace

TemporarySetupFile::TemporarySetupFile(const std::string& folder, const std::string& name, const std::string& content)
{
    for (int n = 0; n < kNameAttempts; ++n) {
        const int made = TryCreate(folder + (n == 0 ? name : Numbered(name, n)), content);
        if (made != 0)
            return;
    }
    m_status = sys::Status::Fail(folder + name, 0,
                                 "cannot create the temporary setup file " + folder + name + ": every numbered name is taken");
}

int TemporarySetupFile::TryCreate(const std::string& path, const std::string& content)
{
    const int fd = ::open(path.c_str(), O_WRONLY | O_CREAT | O_EXCL | O_NOFOLLOW | O_CLOEXEC, 0600);
    if (fd < 0) {
        if (errno == EEXIST)
            return 0;
        m_status = sys::Status::Fail(path, 0, "cannot create the temporary setup file " + path + ": " + std::strerror(errno));
        return -1;
    }
    struct stat st {};
    ::fstat(fd, &st);
    m_path = path;
    m_device = st.st_dev;
    m_inode = st.st_ino;
    m_slot = ClaimSlot(path);
    const bool written = WriteAll(fd, content);
    const int writeErrno = errno;
    if (::close(fd) != 0 || !written) {
        m_status = sys::Status::Fail(path, 0, "cannot write the temporary setup file " + path + ": " +
                                                  std::strerror(written ? errno : writeErrno));
        ReleaseSlot(m_slot);
        ::unlink(path.c_str());
        m_path.clear();
        return -1;
    }
    return 1;
}

TemporarySetupFile::~TemporarySetupFile()
{
    if (m_path.empty())
        return;
    const bool stillThere = ReleaseSlot(m_slot);
    // Only the file this object made: not one that took its place since.
    struct stat st {};
    if (stillThere && ::lstat(m_path.c_str(), &st) == 0 && st.st_dev == m_device && st.st_ino == m_inode)
        ::unlink(m_path.c_str());
}
