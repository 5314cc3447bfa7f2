#pragma once
// Reading a text file line by line through one fixed buffer, counting lines from 1, as UTF-8 (a
// byte-order mark passed over, UTF-16 converted; see sys::TextFileInput). A line longer than the
// limit fails the read instead of growing memory without bound.
#include "platform/system/Status.h"
#include "platform/system/TextFileInput.h"

#include <cstdint>
#include <string>
#include <string_view>
#include <vector>

namespace converter {

class LineSource {
public:
    static constexpr size_t kDefaultBuffer = 256 * 1024;
    static constexpr size_t kMaxLineLength = sys::kLongestTextLine;
    // Bytes past the end of every line that may be read, so that a line can be scanned in wide
    // blocks; what they hold is unspecified.
    static constexpr size_t kReadableAfterLine = 64;

    LineSource() = default;
    LineSource(const LineSource&) = delete;
    LineSource& operator=(const LineSource&) = delete;

    sys::Status Open(const std::string& path);
    // The next line without its end ("\n" or "\r\n"); valid until the next call. False at the end
    // of the file or on an error (then status() says which).
    bool Next(std::string_view& line);

    long LineNumber() const { return m_lineNumber; }
    const sys::Status& status() const { return m_status; }
    std::uint64_t BytesConsumed() const { return m_consumed; }

private:
    bool Refill();
    size_t Capacity() const { return m_buffer.size() - kReadableAfterLine; }

    sys::TextFileInput m_input;
    bool m_open = false;
    std::string m_path;
    std::vector<char> m_buffer;
    size_t m_begin = 0; // first unread byte
    size_t m_end = 0;   // one past the last byte read
    bool m_eof = false;
    long m_lineNumber = 0;
    std::uint64_t m_consumed = 0;
    sys::Status m_status;
};

} // namespace converter
