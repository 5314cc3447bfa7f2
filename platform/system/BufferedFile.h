#pragma once
// A new file written front to back through a buffer, where bytes written before can still be
// replaced in place (sizes and counts known only at the end). The writers of zip packages and of
// compound files build on it.
#include "platform/system/Status.h"

#include <cstdint>
#include <string>
#include <vector>

namespace sys {

class BufferedFile {
public:
    explicit BufferedFile(size_t bufferBytes = 256 * 1024);
    ~BufferedFile(); // closes the file if Close was not reached; the caller removes what it left
    BufferedFile(const BufferedFile&) = delete;
    BufferedFile& operator=(const BufferedFile&) = delete;

    // Creates (or empties) `path`.
    sys::Status Open(const std::string& path);
    bool IsOpen() const { return m_fd >= 0; }
    const std::string& Path() const { return m_path; }

    sys::Status Write(const void* data, size_t size);
    // Free room at the end of the buffer to write into directly (flushed first when full);
    // Used tells how much of it was filled.
    sys::Status Room(unsigned char*& at, size_t& size);
    void Used(size_t size);
    // Replaces bytes written before, in the file or still in the buffer.
    sys::Status WriteAt(std::uint64_t offset, const void* data, size_t size);
    // Bytes written so far, those in the buffer included: the offset of the next byte.
    std::uint64_t Size() const { return m_written; }

    // Writes what the buffer holds and closes the file.
    sys::Status Close();

    // A failed Status naming the file.
    sys::Status Fail(const std::string& message) const { return sys::Status::Fail(m_path, 0, message); }

private:
    sys::Status Flush();
    sys::Status SystemError(const char* what) const;

    std::string m_path;
    int m_fd = -1;
    std::vector<unsigned char> m_buffer;
    size_t m_used = 0;
    std::uint64_t m_written = 0;
};

} // namespace sys
