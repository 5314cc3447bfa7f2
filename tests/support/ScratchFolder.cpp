#include "tests/support/ScratchFolder.h"
#include "tests/support/Files.h"

#include <cstdlib>
#include <filesystem>
#include <stdexcept>

namespace testsupport {

namespace fs = std::filesystem;

ScratchFolder::ScratchFolder(std::string_view prefix)
{
    std::string pattern = (fs::temp_directory_path() / (std::string(prefix) + "-XXXXXX")).string();
    if (!::mkdtemp(pattern.data()))
        throw std::runtime_error("cannot create a scratch folder from " + pattern);
    m_path = pattern;
}

ScratchFolder::~ScratchFolder()
{
    std::error_code ignored;
    // Tests take permissions away to make writes fail; give them back so everything can go.
    fs::permissions(m_path, fs::perms::owner_all, fs::perm_options::add, ignored);
    for (auto entry = fs::recursive_directory_iterator(m_path, ignored); entry != fs::recursive_directory_iterator();
         entry.increment(ignored))
        if (entry->is_directory(ignored) && !entry->is_symlink(ignored))
            fs::permissions(entry->path(), fs::perms::owner_all, fs::perm_options::add, ignored);
    fs::remove_all(m_path, ignored);
}

std::string ScratchFolder::File(std::string_view name) const { return (fs::path(m_path) / name).string(); }

std::string ScratchFolder::Write(std::string_view name, std::string_view bytes) const
{
    const fs::path path = File(name);
    fs::create_directories(path.parent_path());
    WriteFile(path.string(), bytes);
    return path.string();
}

std::string ScratchFolder::MakeFolder(std::string_view name) const
{
    const std::string path = File(name);
    fs::create_directories(path);
    return path;
}

std::string ProgramScratchFile(std::string_view name)
{
    static const ScratchFolder folder("velmora-program");
    return folder.File(name);
}

} // namespace testsupport
