#include "platform/system/FileSystem.h"

#include <cerrno>
#include <climits>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <dirent.h>
#include <filesystem>
#include <dlfcn.h>
#include <fcntl.h>
#include <langinfo.h>
#include <locale.h>
#include <sys/stat.h>
#include <unistd.h>

namespace sys {

namespace {

std::string KindOfSpecialFile(mode_t mode)
{
    if (S_ISDIR(mode))
        return "it is a folder, not a file";
    if (S_ISFIFO(mode))
        return "it is a FIFO (a named pipe), not a regular file";
    if (S_ISSOCK(mode))
        return "it is a socket, not a regular file";
    return "it is a device, not a regular file";
}

} // namespace

unsigned GetTempPath(unsigned bufferLength, std::string& folder)
{
    const char* env = std::getenv("TMPDIR");
    std::string path = (env && *env) ? env : "/tmp";
    if (path.back() != '/')
        path += '/';
    if (path.size() + 1 > bufferLength)
        return static_cast<unsigned>(path.size() + 1);
    folder = path;
    return static_cast<unsigned>(path.size());
}

std::optional<FileAttributes> GetAttributes(const std::string& path)
{
    struct stat st {};
    if (path.empty() || ::stat(path.c_str(), &st) != 0)
        return std::nullopt;
    FileAttributes attributes;
    attributes.directory = S_ISDIR(st.st_mode);
    std::string title = FileTitle(path);
    attributes.hidden = !title.empty() && title[0] == '.';
    attributes.readable = ::access(path.c_str(), R_OK) == 0;
    return attributes;
}

bool FileExists(const std::string& path) { return !path.empty() && ::access(path.c_str(), F_OK) == 0; }

std::FILE* OpenRegularFile(const std::string& path, std::string& error)
{
    // Without O_NONBLOCK opening a FIFO would wait for a writer.
    const int fd = ::open(path.c_str(), O_RDONLY | O_NONBLOCK | O_CLOEXEC | O_NOCTTY);
    if (fd < 0) {
        error = std::string("cannot be opened: ") + std::strerror(errno);
        return nullptr;
    }
    struct stat info {};
    if (::fstat(fd, &info) != 0) {
        error = std::string("cannot examine the file: ") + std::strerror(errno);
        ::close(fd);
        return nullptr;
    }
    if (!S_ISREG(info.st_mode)) {
        error = KindOfSpecialFile(info.st_mode);
        ::close(fd);
        return nullptr;
    }
    const int flags = ::fcntl(fd, F_GETFL);
    if (flags != -1)
        ::fcntl(fd, F_SETFL, flags & ~O_NONBLOCK);
    std::FILE* file = ::fdopen(fd, "rb");
    if (!file) {
        error = std::string("cannot be opened: ") + std::strerror(errno);
        ::close(fd);
    }
    return file;
}

bool IsRegularFile(const std::string& path)
{
    struct stat st {};
    return !path.empty() && ::stat(path.c_str(), &st) == 0 && S_ISREG(st.st_mode);
}

bool IsDirectory(const std::string& path)
{
    struct stat st {};
    return !path.empty() && ::stat(path.c_str(), &st) == 0 && S_ISDIR(st.st_mode);
}

std::optional<std::int64_t> FileSize(const std::string& path)
{
    struct stat st {};
    if (path.empty() || ::stat(path.c_str(), &st) != 0)
        return std::nullopt;
    return static_cast<std::int64_t>(st.st_size);
}

bool DeleteFile(const std::string& path) { return !path.empty() && std::remove(path.c_str()) == 0; }

EntryKind KindOf(const std::string& path)
{
    struct stat st {};
    if (path.empty() || ::lstat(path.c_str(), &st) != 0)
        return EntryKind::Missing;
    if (S_ISREG(st.st_mode))
        return EntryKind::Regular;
    if (S_ISDIR(st.st_mode))
        return EntryKind::Folder;
    if (S_ISLNK(st.st_mode))
        return EntryKind::Link;
    if (S_ISFIFO(st.st_mode))
        return EntryKind::Pipe;
    if (S_ISSOCK(st.st_mode))
        return EntryKind::Socket;
    return EntryKind::Device;
}

const char* Describe(EntryKind kind)
{
    switch (kind) {
    case EntryKind::Missing: return "nothing";
    case EntryKind::Regular: return "a regular file";
    case EntryKind::Folder: return "a folder";
    case EntryKind::Link: return "a symbolic link";
    case EntryKind::Pipe: return "a named pipe (FIFO)";
    case EntryKind::Device: return "a device";
    case EntryKind::Socket: return "a socket";
    }
    return "?";
}

std::string IdentityKey(const std::string& path)
{
    struct stat st {};
    if (!path.empty() && ::stat(path.c_str(), &st) == 0)
        return "file " + std::to_string(st.st_dev) + ":" + std::to_string(st.st_ino);
    const std::string folder = FolderOf(path);
    return IdentityKeyIn(ResolvedFolder(folder.empty() ? "." : folder), FileTitle(path));
}

std::string IdentityKeyIn(const std::string& resolvedFolder, const std::string& name)
{
    return "path " + JoinPath(resolvedFolder, name);
}

std::string ResolvedFolder(const std::string& folder)
{
    std::error_code error;
    const std::filesystem::path absolute = std::filesystem::absolute(folder, error);
    const std::filesystem::path resolved = std::filesystem::weakly_canonical(absolute, error);
    return (error ? absolute.lexically_normal() : resolved).string();
}

std::string WhyNotWritable(const std::string& path)
{
    const int mode = IsDirectory(path) ? W_OK | X_OK : W_OK;
    if (::faccessat(AT_FDCWD, path.empty() ? "." : path.c_str(), mode, AT_EACCESS) == 0)
        return {};
    return std::strerror(errno);
}

size_t MaxNameLength(const std::string& folder)
{
    const long length = ::pathconf(folder.empty() ? "." : folder.c_str(), _PC_NAME_MAX);
    return length > 0 ? static_cast<size_t>(length) : NAME_MAX;
}

std::optional<std::vector<std::string>> ListFolder(const std::string& folder)
{
    DIR* dir = ::opendir(folder.empty() ? "." : folder.c_str());
    if (!dir)
        return std::nullopt;
    std::vector<std::string> names;
    while (dirent* entry = ::readdir(dir)) {
        std::string name = entry->d_name;
        if (name != "." && name != "..")
            names.push_back(std::move(name));
    }
    ::closedir(dir);
    return names;
}

std::string FileTitle(const std::string& path)
{
    size_t slash = path.find_last_of('/');
    return slash == std::string::npos ? path : path.substr(slash + 1);
}

std::string FileExtension(const std::string& path)
{
    const size_t slash = path.find_last_of('/');
    const size_t point = path.find_last_of('.');
    if (point == std::string::npos || (slash != std::string::npos && point < slash))
        return std::string();
    return path.substr(point);
}

std::string FolderOf(const std::string& path)
{
    size_t slash = path.find_last_of('/');
    if (slash == std::string::npos)
        return std::string();
    return slash == 0 ? std::string("/") : path.substr(0, slash);
}

std::string JoinPath(const std::string& folder, const std::string& name)
{
    if (folder.empty())
        return name;
    if (folder.back() == '/')
        return folder + name;
    return folder + "/" + name;
}

#if defined(__SANITIZE_ADDRESS__)
// glibc's newlocale keeps the search path it builds from LOCPATH; that leak is not ours to mend, so
// the leak checker of sanitizer builds is told to pass over it.
extern "C" __attribute__((visibility("default"))) const char* __lsan_default_suppressions()
{
    return "leak:__argz_add_sep\nleak:__argz_create_sep\n";
}
#endif

std::string LocaleDecimalSeparator()
{
    // The user's locale is the environment's (LC_ALL, else LC_NUMERIC, else LANG), asked for on its
    // own: the process keeps the "C" locale, on which number formatting everywhere else relies.
    auto variable = [](const char* name) {
        const char* value = std::getenv(name);
        return std::string(value ? value : "");
    };
    const std::string key = variable("LC_ALL") + '\n' + variable("LC_NUMERIC") + '\n' + variable("LANG") + '\n' +
                            variable("LOCPATH");
    thread_local std::string cachedKey = "\n"; // never a key, which holds three line feeds
    thread_local std::string cachedSeparator;
    if (key == cachedKey)
        return cachedSeparator;
    std::string separator;
    if (locale_t locale = ::newlocale(LC_NUMERIC_MASK, "", static_cast<locale_t>(nullptr))) {
        const char* radix = ::nl_langinfo_l(RADIXCHAR, locale);
        separator = radix ? radix : "";
        ::freelocale(locale);
    }
    cachedKey = key;
    cachedSeparator = separator;
    return separator;
}

std::string ModuleFolder(const void* address)
{
    Dl_info info {};
    if (address && ::dladdr(address, &info) && info.dli_fname) {
        char resolved[4096];
        if (::realpath(info.dli_fname, resolved))
            return FolderOf(resolved);
    }
    char exe[4096];
    ssize_t n = ::readlink("/proc/self/exe", exe, sizeof(exe) - 1);
    if (n <= 0)
        return std::string();
    exe[n] = '\0';
    return FolderOf(exe);
}

} // namespace sys
