#include "platform/system/FileSystem.h"

#include <clocale>
#include <cstdio>
#include <cstdlib>
#include <dirent.h>
#include <dlfcn.h>
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
