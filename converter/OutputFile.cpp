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

// The temporary files being written, as fixed buffers a signal handler may read. A writer claims a
// slot, writes the path, then publishes it; the handler reads published slots only.
constexpr int kSlots = 256;
constexpr size_t kPathBytes = 4096;
char g_paths[kSlots][kPathBytes];
std::atomic<bool> g_claimed[kSlots];
std::atomic<bool> g_published[kSlots];

void ReleaseSlot(int slot)
{
    if (slot < 0)
        return;
    g_published[slot].store(false);
    g_claimed[slot].store(false);
}

int TakeSlot(const std::string& path)
{
    if (path.size() >= kPathBytes)
        return -1;
    for (int slot = 0; slot < kSlots; ++slot) {
        bool expected = false;
        if (!g_claimed[slot].compare_exchange_strong(expected, true))
            continue;
        std::memcpy(g_paths[slot], path.c_str(), path.size() + 1);
        g_published[slot].store(true);
        return slot;
    }
    return -1;
}

} // namespace

OutputFile::OutputFile(std::string finalPath) : m_final(std::move(finalPath))
{
    const std::string name = "." + sys::FileTitle(m_final) + ".part-" + std::to_string(::getpid()) + "-" +
                             std::to_string(g_counter.fetch_add(1));
    const std::string folder = sys::FolderOf(m_final);
    m_temporary = folder.empty() ? name : sys::JoinPath(folder, name);
    m_slot = TakeSlot(m_temporary);
}

OutputFile::~OutputFile()
{
    ReleaseSlot(m_slot);
    if (!m_committed)
        std::remove(m_temporary.c_str());
}

void OutputFile::RemoveAllTemporaries()
{
    for (int slot = 0; slot < kSlots; ++slot)
        if (g_published[slot].load())
            ::unlink(g_paths[slot]);
}

Status OutputFile::Commit()
{
    if (std::rename(m_temporary.c_str(), m_final.c_str()) != 0)
        return Status::Fail(m_final, 0, std::string("cannot move the finished output into place: ") + std::strerror(errno));
    m_committed = true;
    ReleaseSlot(m_slot);
    m_slot = -1;
    return Status::Ok();
}

} // namespace converter
