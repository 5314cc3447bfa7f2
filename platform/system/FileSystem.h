#pragma once
// The system services the plug-in asks for: temporary folder, file attributes, folder listing,
// file titles, deletion and the locale's decimal separator.
#include <cstdint>
#include <cstdio>
#include <optional>
#include <string>
#include <vector>

namespace sys {

// Writes the temporary-files folder, ending in "/", into `folder` when it fits `bufferLength`
// characters (the terminating zero included) and returns its length; returns the needed length
// without filling `folder` when it does not fit, and 0 on failure. $TMPDIR, else /tmp.
unsigned GetTempPath(unsigned bufferLength, std::string& folder);

struct FileAttributes {
    bool directory = false;
    bool hidden = false;    // the name starts with a dot
    bool temporary = false; // never set on Linux; kept so callers read like the Windows rules
    bool readable = false;  // the current user may read it
};
// The attributes of `path`, or nothing when it cannot be examined.
std::optional<FileAttributes> GetAttributes(const std::string& path);

bool FileExists(const std::string& path);      // exists, of any kind
// Opens `path` for reading when it is a regular file, never waiting on a FIFO (a FIFO or a device
// could keep a reader waiting or feed it without end); null with `error` saying why otherwise. The
// caller closes the file.
std::FILE* OpenRegularFile(const std::string& path, std::string& error);
bool IsRegularFile(const std::string& path);
bool IsDirectory(const std::string& path);
std::optional<std::int64_t> FileSize(const std::string& path);
bool DeleteFile(const std::string& path);

// What stands at a path, links not followed.
enum class EntryKind { Missing, Regular, Folder, Link, Pipe, Device, Socket };
EntryKind KindOf(const std::string& path);
// "a regular file", "a folder", "a symbolic link", "a named pipe (FIFO)", "a device", "a socket",
// "nothing".
const char* Describe(EntryKind kind);

// Who a path names, to tell whether two spellings name one file: an existing file by its device
// and inode (links followed), one that does not exist yet by its absolute path with the links of
// its folders resolved. Equal keys name the same file.
std::string IdentityKey(const std::string& path);
// The same for a path known not to exist, given its folder already resolved (ResolvedFolder).
std::string IdentityKeyIn(const std::string& resolvedFolder, const std::string& name);
// `folder` made absolute with its links resolved, as far as it exists.
std::string ResolvedFolder(const std::string& folder);

// Empty when the user running this (effective ids) may write to `path`; else the system's reason.
// For a folder this means creating and removing entries in it.
std::string WhyNotWritable(const std::string& path);
// The longest file name the folder's file system takes.
size_t MaxNameLength(const std::string& folder);

// The entries of a folder (names only, without "." and ".."), in the order the system gives them;
// nothing when the folder cannot be read.
std::optional<std::vector<std::string>> ListFolder(const std::string& folder);

// The display title of a file: its name without the folder.
std::string FileTitle(const std::string& path);
// The extension of a path: from the last point of its last element, point included; empty when
// that element has none.
std::string FileExtension(const std::string& path);
// The folder part of a path, without the trailing "/"; empty for a bare name.
std::string FolderOf(const std::string& path);
// `folder` joined with `name`, with exactly one "/" between.
std::string JoinPath(const std::string& folder, const std::string& name);

// The decimal separator of the user's locale as the environment names it (LC_ALL, LC_NUMERIC, LANG),
// or empty when that locale cannot be had. The process's own locale is neither used nor changed.
std::string LocaleDecimalSeparator();

// The folder of the running executable or of the shared object containing `address`.
std::string ModuleFolder(const void* address);

} // namespace sys
