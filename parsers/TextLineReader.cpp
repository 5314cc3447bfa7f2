#include "parsers/TextLineReader.h"

#include "parsers/FileException.h"

#include <cerrno>
#include <cstring>

CTextLineReader::CTextLineReader(const CString& path)
    : m_strPath(path), m_file(std::fopen(path.c_str(), "rb")), m_buffer(1 << 16)
{
    if (!m_file)
        throw CFileException(path, std::strerror(errno));
}

bool CTextLineReader::Fill()
{
    m_nBegin = 0;
    m_nEnd = std::fread(m_buffer.data(), 1, m_buffer.size(), m_file.get());
    if (m_nEnd == 0 && std::ferror(m_file.get()))
        throw CFileException(m_strPath, std::strerror(errno ? errno : EIO));
    return m_nEnd > 0;
}

bool CTextLineReader::ReadLine(CString& line)
{
    line.clear();
    bool readAny = false;
    while (m_nBegin < m_nEnd || Fill()) {
        readAny = true;
        const char* begin = m_buffer.data() + m_nBegin;
        const auto* newline = static_cast<const char*>(std::memchr(begin, '\n', m_nEnd - m_nBegin));
        if (newline) {
            line.append(begin, newline);
            m_nBegin += static_cast<size_t>(newline - begin) + 1;
            break;
        }
        line.append(begin, m_nEnd - m_nBegin);
        m_nBegin = m_nEnd;
    }
    if (!readAny)
        return false;
    if (!line.empty() && line.back() == '\r')
        line.pop_back();
    return true;
}

bool CTextLineReader::SkipLine()
{
    bool readAny = false;
    while (m_nBegin < m_nEnd || Fill()) {
        readAny = true;
        const char* begin = m_buffer.data() + m_nBegin;
        const auto* newline = static_cast<const char*>(std::memchr(begin, '\n', m_nEnd - m_nBegin));
        if (newline) {
            m_nBegin += static_cast<size_t>(newline - begin) + 1;
            return true;
        }
        m_nBegin = m_nEnd;
    }
    return readAny;
}
