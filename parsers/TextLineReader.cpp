#include "parsers/TextLineReader.h"

#include "parsers/FileException.h"
#include "platform/system/Text.h"

#include <cstring>

CTextLineReader::CTextLineReader(const CString& path) : m_strPath(path), m_buffer(1 << 16)
{
    if (!m_input.Open(path))
        Refuse(m_input.Error());
}

void CTextLineReader::Refuse(const CString& reason, long line) const { throw CFileException(m_strPath, reason, line); }

bool CTextLineReader::Fill()
{
    m_nBegin = 0;
    m_nEnd = m_input.Read(m_buffer.data(), m_buffer.size());
    if (m_nEnd == 0 && !m_input.Error().empty())
        Refuse(m_input.Error(), m_nLine + 1);
    return m_nEnd > 0;
}

bool CTextLineReader::Walk(CString* line, size_t keep)
{
    bool readAny = false;
    size_t length = 0;
    while (m_nBegin < m_nEnd || Fill()) {
        readAny = true;
        const char* begin = m_buffer.data() + m_nBegin;
        const auto* newline = static_cast<const char*>(std::memchr(begin, '\n', m_nEnd - m_nBegin));
        const size_t piece = newline ? static_cast<size_t>(newline - begin) : m_nEnd - m_nBegin;
        length += piece;
        if (length >= sys::kLongestTextLine)
            Refuse(text::Format("no line break within %zu bytes; this is not a delimited text file",
                                sys::kLongestTextLine),
                   m_nLine + 1);
        if (line && line->size() < keep)
            line->append(begin, std::min(piece, keep - line->size()));
        m_nBegin += piece + (newline ? 1 : 0);
        if (newline)
            break;
    }
    if (readAny)
        ++m_nLine;
    m_nLastLength = length;
    return readAny;
}

bool CTextLineReader::ReadLine(CString& line, size_t keep)
{
    line.clear();
    if (!Walk(&line, keep))
        return false;
    if (line.size() < m_nLastLength)
        text::DropPartialCharacter(line); // keep what was kept well-formed
    else if (!line.empty() && line.back() == '\r')
        line.pop_back();
    return true;
}

bool CTextLineReader::SkipLine() { return Walk(nullptr, 0); }
