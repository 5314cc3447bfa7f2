#include "platform/system/TextLineReader.h"

#include "platform/system/Text.h"

#include <algorithm>
#include <cstring>

namespace sys {

TextLineReader::TextLineReader(OverlongLine wording, size_t firstBuffer) : m_wording(wording), m_firstBuffer(firstBuffer)
{
}

Status TextLineReader::Open(const std::string& path)
{
    m_path = path;
    m_status = m_input.Open(path);
    m_open = m_status.ok();
    if (m_open)
        m_buffer.resize(m_firstBuffer + kReadableAfterLine);
    return m_status;
}

bool TextLineReader::Fail(const std::string& message)
{
    m_status = Status::Fail(m_path, m_lineNumber + 1, message);
    return false;
}

std::string TextLineReader::OverlongMessage() const
{
    const std::string limit = std::to_string(kLongestTextLine);
    if (m_wording == OverlongLine::NoLineBreak)
        return "no line break within " + limit + " bytes; this is not a delimited text file";
    return "the line is longer than " + limit + " bytes; this is not a delimited text file";
}

bool TextLineReader::Refill()
{
    if (m_eof)
        return false;
    if (m_begin > 0) {
        std::memmove(m_buffer.data(), m_buffer.data() + m_begin, m_end - m_begin);
        m_end -= m_begin;
        m_begin = 0;
    }
    if (m_end == Capacity()) {
        if (Capacity() >= kLongestTextLine)
            return Fail(OverlongMessage());
        m_buffer.resize(std::min(Capacity() * 2, kLongestTextLine) + kReadableAfterLine);
    }
    const size_t got = m_input.Read(m_buffer.data() + m_end, Capacity() - m_end);
    if (got == 0) {
        m_eof = true;
        if (const Status input = m_input.status(); !input)
            return Fail(input.problem().message);
        return false;
    }
    m_end += got;
    return true;
}

bool TextLineReader::Next(std::string_view& line)
{
    if (!m_open || !m_status)
        return false;
    // The line runs from m_begin to `lineEnd`; the next one starts at `next`.
    auto take = [&](size_t lineEnd, size_t next) {
        size_t end = lineEnd;
        if (end > m_begin && m_buffer[end - 1] == '\r')
            --end;
        line = std::string_view(m_buffer.data() + m_begin, end - m_begin);
        m_consumed += next - m_begin;
        m_begin = next;
        ++m_lineNumber;
        return true;
    };
    size_t searched = m_begin;
    while (true) {
        const void* found = std::memchr(m_buffer.data() + searched, '\n', m_end - searched);
        if (found) {
            const size_t newline = static_cast<size_t>(static_cast<const char*>(found) - m_buffer.data());
            return take(newline, newline + 1);
        }
        const size_t pending = m_end - m_begin;
        if (!Refill()) {
            if (!m_status || m_end == m_begin)
                return false;
            return take(m_end, m_end); // the last line has no line end
        }
        searched = m_begin + pending;
    }
}

bool TextLineReader::Walk(std::string* line, size_t keep, size_t& length)
{
    length = 0;
    if (!m_open || !m_status)
        return false;
    bool readAny = false;
    while (m_begin < m_end || Refill()) {
        readAny = true;
        const char* begin = m_buffer.data() + m_begin;
        const auto* newline = static_cast<const char*>(std::memchr(begin, '\n', m_end - m_begin));
        const size_t piece = newline ? static_cast<size_t>(newline - begin) : m_end - m_begin;
        length += piece;
        if (length >= kLongestTextLine)
            return Fail(OverlongMessage());
        if (line && line->size() < keep)
            line->append(begin, std::min(piece, keep - line->size()));
        const size_t taken = piece + (newline ? 1 : 0);
        m_begin += taken;
        m_consumed += taken;
        if (newline)
            break;
    }
    if (!m_status)
        return false;
    if (readAny)
        ++m_lineNumber;
    return readAny;
}

bool TextLineReader::Read(std::string& line, size_t keep)
{
    line.clear();
    size_t length = 0;
    if (!Walk(&line, keep, length))
        return false;
    if (line.size() < length)
        text::DropPartialCharacter(line); // keep what was kept well-formed
    else if (!line.empty() && line.back() == '\r')
        line.pop_back();
    return true;
}

bool TextLineReader::Skip()
{
    size_t length = 0;
    return Walk(nullptr, 0, length);
}

} // namespace sys
