#include "converter/AsciiSeriesWriter.h"

#include "converter/NumberText.h"
#include "converter/StampText.h"
#include "platform/system/Text.h"

#include <cerrno>
#include <cstring>

namespace converter {

namespace {
constexpr size_t kBufferSize = 256 * 1024;
constexpr size_t kLongestValue = 40; // a tab and the longest shortest-form double
} // namespace

AsciiSeriesWriter::~AsciiSeriesWriter()
{
    if (m_file)
        std::fclose(m_file);
}

std::string AsciiSeriesWriter::CleanField(const std::string& text)
{
    // The file is UTF-8 whatever the input's texts were (text::ToUtf8). Tabs and line ends would
    // split the field; a double quote would start a quoted field.
    std::string clean = text::ToUtf8(text);
    for (char& c : clean)
        if (c == '\t' || c == '\n' || c == '\r')
            c = ' ';
        else if (c == '"')
            c = '\'';
    return clean;
}

sys::Status AsciiSeriesWriter::Begin(const std::string& path, const SeriesHeader& header, const std::string&)
{
    m_path = path;
    m_file = std::fopen(path.c_str(), "wb");
    if (!m_file)
        return sys::Status::Fail(path, 0, std::string("cannot create the file: ") + std::strerror(errno));
    m_buffer.resize(kBufferSize);

    std::string head;
    for (size_t i = 0; i < header.items.size(); ++i) {
        const ItemInfo& item = header.items[i];
        // Empty metadata would not read back: the item type must be one the catalogue knows.
        const std::string type = item.type.empty() ? "Undefined" : item.type;
        const std::string valueType = item.valueType.empty() ? "Instantaneous" : item.valueType;
        // Brackets and colons separate the three parts, so they cannot stand inside them.
        auto part = [](std::string text, const char* forbidden) {
            for (char& c : text)
                if (std::strchr(forbidden, c))
                    c = ' ';
            return CleanField(text);
        };
        if (i > 0)
            head += '\t';
        // "[]" would read back as the text after it, so an empty unit is written as "Undefined".
        const std::string unit = item.unit.empty() ? "Undefined" : item.unit;
        head += part(type, "[]:") + "[" + part(unit, "[]:") + "]:" + part(valueType, "[]:");
    }
    head += '\n';
    head += CleanField(header.timeTitle.empty() ? "Date/time" : header.timeTitle);
    for (const ItemInfo& item : header.items)
        head += '\t' + CleanField(item.name);
    head += '\n';
    if (std::fwrite(head.data(), 1, head.size(), m_file) != head.size())
        return sys::Status::Fail(path, 0, std::string("write error: ") + std::strerror(errno));
    return sys::Status::Ok();
}

sys::Status AsciiSeriesWriter::Flush()
{
    if (m_used > 0 && std::fwrite(m_buffer.data(), 1, m_used, m_file) != m_used)
        return sys::Status::Fail(m_path, 0, std::string("write error: ") + std::strerror(errno));
    m_used = 0;
    return sys::Status::Ok();
}

sys::Status AsciiSeriesWriter::Write(const Row& row)
{
    const size_t needed = 21 + row.values.size() * kLongestValue;
    if (m_used + needed > m_buffer.size()) {
        if (sys::Status flushed = Flush(); !flushed)
            return flushed;
        if (needed > m_buffer.size())
            m_buffer.resize(needed);
    }
    char* out = m_buffer.data() + m_used;
    char* const begin = out;
    out = m_stamps.Write(row.stamp, out);
    for (double value : row.values) {
        *out++ = '\t';
        out = FormatValue(value, out);
    }
    *out++ = '\n';
    m_used += static_cast<size_t>(out - begin);
    return sys::Status::Ok();
}

sys::Status AsciiSeriesWriter::Finish()
{
    sys::Status status = Flush();
    if (std::fclose(m_file) != 0 && status)
        status = sys::Status::Fail(m_path, 0, std::string("write error: ") + std::strerror(errno));
    m_file = nullptr;
    return status;
}

} // namespace converter
