#include "platform/system/TextFileInput.h"

#include "platform/system/FileSystem.h"
#include "platform/system/Text.h"

#include <algorithm>
#include <cerrno>
#include <cstring>

namespace sys {

namespace {

bool StartsWith(const std::string& bytes, std::string_view prefix)
{
    return bytes.size() >= prefix.size() && std::string_view(bytes).substr(0, prefix.size()) == prefix;
}


} // namespace

TextFileInput::~TextFileInput()
{
    if (m_file)
        std::fclose(m_file);
}

Status TextFileInput::Open(const std::string& path)
{
    m_path = path;
    m_file = OpenRegularFile(path, m_error);
    if (m_file)
        TellEncoding();
    return status();
}

size_t TextFileInput::ReadFile(char* out, size_t length)
{
    const size_t got = std::fread(out, 1, length, m_file);
    m_fileBytes += got;
    if (got < length) {
        m_atEnd = true;
        if (std::ferror(m_file))
            m_error = std::string("read error: ") + std::strerror(errno ? errno : EIO);
    }
    return got;
}

bool TextFileInput::TellEncoding()
{
    using namespace std::string_view_literals;
    char head[4];
    m_pending.assign(head, ReadFile(head, sizeof head));
    if (!m_error.empty())
        return false;
    const std::string& b = m_pending;
    const bool utf32 = StartsWith(b, "\xFF\xFE\0\0"sv) || StartsWith(b, "\0\0\xFE\xFF"sv) ||
                       (b.size() == 4 && b[0] != 0 && b[1] == 0 && b[2] == 0 && b[3] == 0) ||
                       (b.size() == 4 && b[0] == 0 && b[1] == 0 && b[2] == 0 && b[3] != 0);
    if (utf32) {
        m_error = "the file is UTF-32 text, which is not read; save it as UTF-8 or UTF-16";
        return false;
    }
    if (StartsWith(b, "\xEF\xBB\xBF"sv)) {
        m_pending.erase(0, 3);
    } else if (StartsWith(b, "\xFF\xFE"sv)) {
        m_encoding = Encoding::Utf16LittleEndian;
        m_pending.erase(0, 2);
    } else if (StartsWith(b, "\xFE\xFF"sv)) {
        m_encoding = Encoding::Utf16BigEndian;
        m_pending.erase(0, 2);
    } else if (b.size() >= 2 && b[0] != 0 && b[1] == 0) {
        m_encoding = Encoding::Utf16LittleEndian; // no mark, but a text file never starts with a zero byte
    } else if (b.size() >= 2 && b[0] == 0 && b[1] != 0) {
        m_encoding = Encoding::Utf16BigEndian;
    }
    return true;
}

size_t TextFileInput::Read(char* out, size_t capacity)
{
    if (!m_file)
        return 0;
    return m_encoding == Encoding::Utf8 ? ReadUtf8(out, capacity) : ReadUtf16(out, capacity);
}

size_t TextFileInput::ReadUtf8(char* out, size_t capacity)
{
    if (!m_error.empty())
        return 0;
    const size_t carried = std::min(m_pending.size(), capacity);
    std::memcpy(out, m_pending.data(), carried);
    m_pending.erase(0, carried);
    if (m_atEnd || carried == capacity)
        return carried;
    return carried + ReadFile(out + carried, capacity - carried);
}

size_t TextFileInput::ReadUtf16(char* out, size_t capacity)
{
    while (m_decodedAt == m_decoded.size()) {
        m_decoded.clear();
        m_decodedAt = 0;
        if (!m_error.empty())
            return 0;
        if (m_atEnd) {
            if (!m_pending.empty())
                m_error = m_pending.size() % 2 ? "the UTF-16 text ends inside a character (an odd number of bytes)"
                                               : "the UTF-16 text ends with an unpaired surrogate";
            return 0;
        }
        constexpr size_t kChunk = 64 * 1024;
        const size_t carried = m_pending.size();
        m_pending.resize(carried + kChunk);
        m_pending.resize(carried + ReadFile(m_pending.data() + carried, kChunk));
        DecodePending();
    }
    const size_t handed = std::min(capacity, m_decoded.size() - m_decodedAt);
    std::memcpy(out, m_decoded.data() + m_decodedAt, handed);
    m_decodedAt += handed;
    return handed;
}

void TextFileInput::DecodePending()
{
    size_t unpairedAt = 0;
    const size_t used =
        text::AppendUtf16AsUtf8(m_pending, m_encoding == Encoding::Utf16BigEndian, m_decoded, unpairedAt);
    if (unpairedAt != std::string_view::npos)
        m_error = text::Format("the UTF-16 text holds an unpaired surrogate at byte %llu",
                               static_cast<unsigned long long>(m_fileBytes - m_pending.size() + unpairedAt));
    m_pending.erase(0, used);
}

} // namespace sys
