#include "converter/OutputFile.h"

#include "platform/system/FileSystem.h"
#include "platform/system/Process.h"
#include "platform/system/Text.h"

#include <atomic>
#include <cerrno>
#include <cstdio>
#include <cstring>
#include <fcntl.h>
#include <mutex>
#include <optional>
#include <set>
#include <sys/stat.h>
#include <unistd.h>

namespace converter {

namespace {

constexpr const char* kPartMarker = ".part-";
constexpr size_t kBootTagLength = 8;
constexpr int kNameAttempts = 100;

// The part files being written, with no limit on their number. Stopping empties it once for good.
struct PartFiles {
    std::mutex mutex;
    std::set<std::string> paths;
    bool stopping = false;
};

PartFiles& Registry()
{
    static PartFiles registry;
    return registry;
}

std::atomic<unsigned> g_counter{0};

// ".<title>.part-<boot>-<pid>-<n>", the title shortened when the whole would be too long a name.
std::string PartName(const std::string& title, size_t maxName, unsigned n)
{
    const std::string suffix = kPartMarker + sys::BootTag() + "-" + std::to_string(::getpid()) + "-" + std::to_string(n);
    const size_t room = maxName > suffix.size() + 1 ? maxName - suffix.size() - 1 : 0;
    return "." + text::CutUtf8(title, room) + suffix;
}

bool AllDigits(const std::string& text)
{
    return !text.empty() && text.find_first_not_of("0123456789") == std::string::npos;
}

struct PartOwner {
    std::string bootTag;
    long pid = 0;
};

// Who wrote a part file, read from its name; nothing when `name` is not a part file's.
std::optional<PartOwner> OwnerOf(const std::string& name)
{
    const size_t marker = name.rfind(kPartMarker);
    if (name.empty() || name[0] != '.' || marker == std::string::npos || marker == 0)
        return std::nullopt;
    const std::string rest = name.substr(marker + std::strlen(kPartMarker));
    const size_t first = rest.find('-');
    const size_t second = first == std::string::npos ? first : rest.find('-', first + 1);
    if (first != kBootTagLength || second == std::string::npos)
        return std::nullopt;
    const std::string tag = rest.substr(0, first);
    const std::string pid = rest.substr(first + 1, second - first - 1);
    if (tag.find_first_not_of("0123456789abcdef") != std::string::npos || !AllDigits(pid) || pid.size() > 9 ||
        !AllDigits(rest.substr(second + 1)))
        return std::nullopt;
    return PartOwner{tag, std::stol(pid)};
}

// True when the process that wrote this part file cannot be at work any more: on this system start,
// its process is gone; from another start, it was last written before this one began (a fresh file
// of another start may be another machine's, writing into a shared folder).
bool IsLeftOver(const PartOwner& owner, const struct stat& st)
{
    if (owner.bootTag == sys::BootTag())
        return !sys::MayStillRun(owner.pid, st.st_mtime);
    const std::int64_t boot = sys::BootTime();
    return boot != 0 && st.st_mtime < boot;
}

} // namespace

OutputFile::OutputFile(std::string finalPath) : m_final(std::move(finalPath)) {}

OutputFile::~OutputFile()
{
    if (m_temporary.empty())
        return;
    PartFiles& registry = Registry();
    std::lock_guard<std::mutex> lock(registry.mutex);
    registry.paths.erase(m_temporary);
    if (!m_committed)
        ::unlink(m_temporary.c_str());
    if (m_fd >= 0)
        ::close(m_fd);
}

sys::Status OutputFile::Create()
{
    PartFiles& registry = Registry();
    std::lock_guard<std::mutex> lock(registry.mutex);
    if (registry.stopping)
        return sys::Status::Fail(m_final, 0, "the run is stopping");
    const std::string folder = sys::FolderOf(m_final);
    const size_t maxName = sys::MaxNameLength(folder);
    for (int attempt = 0; attempt < kNameAttempts; ++attempt) {
        const std::string name = PartName(sys::FileTitle(m_final), maxName, g_counter.fetch_add(1));
        const std::string path = folder.empty() ? name : sys::JoinPath(folder, name);
        const int fd = ::open(path.c_str(), O_WRONLY | O_CREAT | O_EXCL | O_NOFOLLOW | O_CLOEXEC, 0666);
        if (fd >= 0) {
            m_fd = fd;
            m_temporary = path;
            const std::string byDescriptor = "/proc/self/fd/" + std::to_string(fd);
            m_writerPath = ::access(byDescriptor.c_str(), W_OK) == 0 ? byDescriptor : path;
            registry.paths.insert(path);
            return sys::Status::Ok();
        }
        if (errno != EEXIST)
            return sys::Status::Fail(m_final, 0, "cannot create the file (" + name + " in " + (folder.empty() ? "." : folder) +
                                                "): " + std::strerror(errno));
    }
    return sys::Status::Fail(m_final, 0, "cannot create the file: every temporary name beside it is taken");
}

sys::Status OutputFile::Commit()
{
    PartFiles& registry = Registry();
    std::lock_guard<std::mutex> lock(registry.mutex);
    if (registry.stopping)
        return sys::Status::Fail(m_final, 0, "the run is stopping");
    struct stat written {}, named {};
    if (::fstat(m_fd, &written) != 0 || ::lstat(m_temporary.c_str(), &named) != 0 || written.st_dev != named.st_dev ||
        written.st_ino != named.st_ino)
        return sys::Status::Fail(m_final, 0, "the part file " + m_temporary + " was replaced while the output was written");
    struct stat old {};
    if (::lstat(m_final.c_str(), &old) == 0) {
        if (!S_ISREG(old.st_mode))
            return sys::Status::Fail(m_final, 0, std::string("it is ") + sys::Describe(sys::KindOf(m_final)) +
                                                " now; only a regular file is replaced");
        ::fchmod(m_fd, old.st_mode & 0777);
    }
    if (std::rename(m_temporary.c_str(), m_final.c_str()) != 0)
        return sys::Status::Fail(m_final, 0, std::string("cannot move the finished output into place: ") + std::strerror(errno));
    m_committed = true;
    registry.paths.erase(m_temporary);
    return sys::Status::Ok();
}

size_t OutputFile::RemoveAllTemporaries()
{
    PartFiles& registry = Registry();
    std::lock_guard<std::mutex> lock(registry.mutex);
    registry.stopping = true;
    size_t removed = 0;
    for (const std::string& path : registry.paths)
        removed += ::unlink(path.c_str()) == 0 ? 1 : 0;
    registry.paths.clear();
    return removed;
}

std::vector<std::string> OutputFile::RemoveStaleTemporaries(const std::string& folder)
{
    std::vector<std::string> removed;
    const auto names = sys::ListFolder(folder);
    if (!names)
        return removed;
    for (const std::string& name : *names) {
        const std::optional<PartOwner> owner = OwnerOf(name);
        if (!owner)
            continue;
        const std::string path = folder.empty() ? name : sys::JoinPath(folder, name);
        struct stat st {};
        if (::lstat(path.c_str(), &st) != 0 || !S_ISREG(st.st_mode) || st.st_uid != ::geteuid())
            continue;
        if (IsLeftOver(*owner, st) && ::unlink(path.c_str()) == 0)
            removed.push_back(path);
    }
    return removed;
}

} // namespace converter
