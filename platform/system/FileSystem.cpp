#include "platform/system/FileSystem.h"

#include <cerrno>
#include <climits>
#include <clocale>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <dirent.h>
#include <dlfcn.h>
#include <fcntl.h>
#include <filesystem>
#include <sys/stat.h>
#include <unistd.h>

namespace sys {

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

std::string LocaleDecimalSeparator()
{
    const std::lconv* conv = std::localeconv();
    if (!conv || !conv->decimal_point || !*conv->decimal_point)
        return std::string();
    return conv->decimal_point;
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
