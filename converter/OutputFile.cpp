#include "converter/OutputFile.h"

#include "platform/system/FileSystem.h"

#include <atomic>
#include <cerrno>
#include <cstdio>
#include <cstring>
#include <unistd.h>

namespace converter {

namespace {
std::atomic<unsigned> g_counter{0};
}

OutputFile::OutputFile(std::string finalPath) : m_final(std::move(finalPath))
{
    const std::string name = "." + sys::FileTitle(m_final) + ".part-" + std::to_string(::getpid()) + "-" +
                             std::to_string(g_counter.fetch_add(1));
    const std::string folder = sys::FolderOf(m_final);
    m_temporary = folder.empty() ? name : sys::JoinPath(folder, name);
}

OutputFile::~OutputFile()
{
    if (!m_committed)
        std::remove(m_temporary.c_str());
}

Status OutputFile::Commit()
{
    if (std::rename(m_temporary.c_str(), m_final.c_str()) != 0)
        return Status::Fail(m_final, 0, std::string("cannot move the finished output into place: ") + std::strerror(errno));
    m_committed = true;
    return Status::Ok();
}

} // namespace converter
