#include "platform/system/BufferedFile.h"

#include <algorithm>
#include <cerrno>
#include <cstring>
#include <fcntl.h>
#include <unistd.h>

namespace sys {

BufferedFile::BufferedFile(size_t bufferBytes) : m_buffer(std::max<size_t>(bufferBytes, 1)) {}

BufferedFile::~BufferedFile()
{
    if (m_fd >= 0)
        ::close(m_fd);
}

sys::Status BufferedFile::SystemError(const char* what) const
{
    return Fail(std::string(what) + ": " + std::strerror(errno));
}

sys::Status BufferedFile::Open(const std::string& path)
{
    m_path = path;
    m_used = 0;
    m_written = 0;
    m_fd = ::open(path.c_str(), O_WRONLY | O_CREAT | O_TRUNC | O_CLOEXEC, 0666);
    if (m_fd < 0)
        return SystemError("cannot create the file");
    return sys::Status::Ok();
}

sys::Status BufferedFile::Write(const void* data, size_t size)
{
    const auto* bytes = static_cast<const unsigned char*>(data);
    while (size > 0) {
        unsigned char* at = nullptr;
        size_t room = 0;
        if (sys::Status free = Room(at, room); !free)
            return free;
        const size_t piece = std::min(size, room);
        std::memcpy(at, bytes, piece);
        Used(piece);
        bytes += piece;
        size -= piece;
    }
    return sys::Status::Ok();
}

sys::Status BufferedFile::Room(unsigned char*& at, size_t& size)
{
    if (m_fd < 0)
        return Fail("the file is not open for writing");
    if (m_used == m_buffer.size())
        if (sys::Status flushed = Flush(); !flushed)
            return flushed;
    at = m_buffer.data() + m_used;
    size = m_buffer.size() - m_used;
    return sys::Status::Ok();
}

void BufferedFile::Used(size_t size)
{
    m_used += size;
    m_written += size;
}

sys::Status BufferedFile::Flush()
{
    size_t done = 0;
    while (done < m_used) {
        const ssize_t wrote = ::write(m_fd, m_buffer.data() + done, m_used - done);
        if (wrote < 0 && errno == EINTR)
            continue;
        if (wrote <= 0)
            return SystemError("write error");
        done += static_cast<size_t>(wrote);
    }
    m_used = 0;
    return sys::Status::Ok();
}

sys::Status BufferedFile::WriteAt(std::uint64_t offset, const void* data, size_t size)
{
    if (m_fd < 0)
        return Fail("the file is not open for writing");
    if (offset + size > m_written)
        return Fail("a write goes past the end of what was written");
    // Bytes before the buffer are in the file already; the rest are still in the buffer.
    const std::uint64_t flushed = m_written - m_used;
    const auto* bytes = static_cast<const unsigned char*>(data);
    size_t done = 0;
    while (offset + done < flushed && done < size) {
        const size_t piece = static_cast<size_t>(std::min<std::uint64_t>(size - done, flushed - offset - done));
        const ssize_t wrote = ::pwrite(m_fd, bytes + done, piece, static_cast<off_t>(offset + done));
        if (wrote < 0 && errno == EINTR)
            continue;
        if (wrote <= 0)
            return SystemError("write error");
        done += static_cast<size_t>(wrote);
    }
    if (done < size)
        std::memcpy(m_buffer.data() + (offset + done - flushed), bytes + done, size - done);
    return sys::Status::Ok();
}

sys::Status BufferedFile::Close()
{
    if (m_fd < 0)
        return Fail("the file is not open for writing");
    sys::Status flushed = Flush();
    const int fd = m_fd;
    m_fd = -1;
    if (::close(fd) != 0 && flushed)
        return SystemError("write error");
    return flushed;
}

} // namespace sys
