#include "converter/LineSource.h"

#include <cerrno>
#include <cstring>

namespace converter {

sys::Status LineSource::Open(const std::string& path)
{
    m_path = path;
    m_open = m_input.Open(path);
    if (!m_open)
        return m_status = sys::Status::Fail(path, 0, m_input.Error());
    m_buffer.resize(kDefaultBuffer + kReadableAfterLine);
    return m_status;
}

bool LineSource::Refill()
{
    if (m_eof)
        return false;
    if (m_begin > 0) {
        std::memmove(m_buffer.data(), m_buffer.data() + m_begin, m_end - m_begin);
        m_end -= m_begin;
        m_begin = 0;
    }
    if (m_end == Capacity()) {
        if (Capacity() >= kMaxLineLength) {
            m_status = sys::Status::Fail(m_path, m_lineNumber + 1,
                                    "the line is longer than " + std::to_string(kMaxLineLength) +
                                        " bytes; this is not a delimited text file");
            return false;
        }
        m_buffer.resize(Capacity() * 2 + kReadableAfterLine);
    }
    const size_t got = m_input.Read(m_buffer.data() + m_end, Capacity() - m_end);
    if (got == 0) {
        if (!m_input.Error().empty())
            m_status = sys::Status::Fail(m_path, m_lineNumber + 1, m_input.Error());
        m_eof = true;
        return false;
    }
    m_end += got;
    return true;
}

bool LineSource::Next(std::string_view& line)
{
    if (!m_open || !m_status)
        return false;
    size_t searched = m_begin;
    while (true) {
        const void* found = std::memchr(m_buffer.data() + searched, '\n', m_end - searched);
        if (found) {
            const size_t newline = static_cast<size_t>(static_cast<const char*>(found) - m_buffer.data());
            size_t end = newline;
            if (end > m_begin && m_buffer[end - 1] == '\r')
                --end;
            line = std::string_view(m_buffer.data() + m_begin, end - m_begin);
            m_consumed += newline + 1 - m_begin;
            m_begin = newline + 1;
            ++m_lineNumber;
            return true;
        }
        const size_t pending = m_end - m_begin;
        if (!Refill()) {
            if (!m_status || pending == 0 || m_end == m_begin)
                return false;
            // The last line has no line end.
            size_t end = m_end;
            if (end > m_begin && m_buffer[end - 1] == '\r')
                --end;
            line = std::string_view(m_buffer.data() + m_begin, end - m_begin);
            m_consumed += m_end - m_begin;
            m_begin = m_end;
            ++m_lineNumber;
            return true;
        }
        searched = m_begin + pending;
    }
}

} // namespace converter
