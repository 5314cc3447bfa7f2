#include "formats/xls/BiffStream.h"

#include "formats/workbook/LittleEndian.h"
#include "formats/workbook/WorkbookImport.h"
#include "platform/system/Text.h"

#include <algorithm>
#include <cstdio>
#include <cstring>
#include <utility>

namespace sheet {

namespace {

constexpr unsigned kContinue = 0x003C;
constexpr unsigned kLongestBody = 8224;
// The part of the stream held at a time; a record with its header always fits.
constexpr std::size_t kWindowBytes = 256 * 1024;

// Code pages whose bytes read as Windows-1252: itself, US-ASCII, Latin-1, and the UTF-16 that
// BIFF8 workbooks declare (their byte texts are Latin-1).
bool ReadsAsWindows1252(unsigned codePage)
{
    return codePage == 1252 || codePage == 367 || codePage == 28591 || codePage == 1200 || codePage == 0;
}

// Surrogate pairs join; a lone surrogate becomes U+FFFD rather than invalid UTF-8.
std::string Utf8Of(const std::u16string& units)
{
    std::string out;
    out.reserve(units.size());
    for (std::size_t i = 0; i < units.size(); ++i) {
        char32_t c = units[i];
        if (c >= 0xD800 && c < 0xDC00 && i + 1 < units.size() && units[i + 1] >= 0xDC00 && units[i + 1] < 0xE000)
            c = 0x10000 + ((c - 0xD800) << 10) + (units[++i] - 0xDC00);
        else if (c >= 0xD800 && c < 0xE000)
            c = 0xFFFD;
        text::AppendUtf8(out, c);
    }
    return out;
}

std::string Hex(unsigned value)
{
    char text[8];
    std::snprintf(text, sizeof text, "0x%04X", value & 0xFFFFu);
    return text;
}

} // namespace

BiffCursor::BiffCursor(std::vector<std::span<const unsigned char>> segments) : m_segments(std::move(segments)) {}

BiffCursor::BiffCursor(std::vector<std::vector<unsigned char>> bodies) : m_owned(std::move(bodies))
{
    for (const std::vector<unsigned char>& body : m_owned)
        m_segments.emplace_back(body.data(), body.size());
}

bool BiffCursor::NextSegment()
{
    if (m_segment + 1 >= m_segments.size())
        return false;
    ++m_segment;
    m_at = 0;
    return true;
}

bool BiffCursor::AtEnd()
{
    while (m_at >= m_segments[m_segment].size())
        if (!NextSegment())
            return true;
    return false;
}

void BiffCursor::ReadBytes(unsigned char* out, std::size_t count)
{
    while (count > 0) {
        if (AtEnd())
            throw Short{};
        const std::span<const unsigned char> segment = m_segments[m_segment];
        const std::size_t take = std::min(count, segment.size() - m_at);
        std::memcpy(out, segment.data() + m_at, take);
        out += take, count -= take, m_at += take;
    }
}

std::uint8_t BiffCursor::U8()
{
    unsigned char b = 0;
    ReadBytes(&b, 1);
    return b;
}

std::uint16_t BiffCursor::U16()
{
    unsigned char b[2];
    ReadBytes(b, 2);
    return static_cast<std::uint16_t>(b[0] | b[1] << 8);
}

std::uint32_t BiffCursor::U32()
{
    const std::uint32_t low = U16();
    return low | static_cast<std::uint32_t>(U16()) << 16;
}

double BiffCursor::F64()
{
    unsigned char b[8];
    ReadBytes(b, 8);
    std::uint64_t bits = 0;
    for (int i = 7; i >= 0; --i)
        bits = bits << 8 | b[i];
    double value;
    std::memcpy(&value, &bits, sizeof value);
    return value;
}

void BiffCursor::Skip(std::uint64_t count)
{
    while (count > 0) {
        if (AtEnd())
            throw Short{};
        const std::uint64_t take = std::min<std::uint64_t>(count, m_segments[m_segment].size() - m_at);
        m_at += static_cast<std::size_t>(take);
        count -= take;
    }
}

// Characters that run on into a CONTINUE record start it with a fresh option byte, whose bit 0
// says whether they go on one byte or two each (the width may change there).
void BiffCursor::ReadCharacters(unsigned count, bool wide, bool continuedWithOptions, std::u16string& units)
{
    while (count > 0) {
        if (m_at >= m_segments[m_segment].size()) {
            if (!NextSegment())
                throw Short{true};
            if (continuedWithOptions)
                wide = (U8() & 1) != 0;
            continue;
        }
        const std::span<const unsigned char> segment = m_segments[m_segment];
        const std::size_t width = wide ? 2 : 1;
        const std::size_t available = (segment.size() - m_at) / width;
        if (available == 0) // half a character before the record's end
            throw Short{true};
        const std::size_t take = std::min<std::size_t>(count, available);
        for (std::size_t i = 0; i < take; ++i, m_at += width)
            units.push_back(wide ? static_cast<char16_t>(segment[m_at] | segment[m_at + 1] << 8) : segment[m_at]);
        count -= static_cast<unsigned>(take);
    }
}

void BiffCursor::ReadCodePageBytes(unsigned count, unsigned codePage, std::u16string& units)
{
    const std::size_t first = units.size();
    ReadCharacters(count, false, false, units);
    for (std::size_t i = first; i < units.size(); ++i) {
        char16_t& c = units[i];
        if (c < 0x80)
            continue;
        if (!ReadsAsWindows1252(codePage))
            throw ForeignCodePage{codePage};
        c = static_cast<char16_t>(text::Windows1252Character(static_cast<unsigned char>(c)));
    }
}

std::string BiffCursor::Text(const BiffTextForm& form, unsigned countBytes)
{
    try {
        const unsigned count = countBytes == 1 ? U8() : U16();
        std::u16string units;
        if (!form.biff8) {
            ReadCodePageBytes(count, form.codePage, units);
            return Utf8Of(units);
        }
        const std::uint8_t options = U8();
        const unsigned runs = (options & 0x08) ? U16() : 0;
        const std::uint32_t phonetic = (options & 0x04) ? U32() : 0;
        ReadCharacters(count, (options & 0x01) != 0, true, units);
        Skip(4ull * runs + phonetic); // formatting runs and phonetic data: not shown
        return Utf8Of(units);
    } catch (const Short&) {
        throw Short{true};
    }
}

BiffStream::BiffStream(std::string path, std::uint64_t size, Source read)
    : m_path(std::move(path)), m_size(size), m_read(std::move(read)), m_window(kWindowBytes)
{
}

const unsigned char* BiffStream::Bytes(std::uint64_t offset, std::size_t count)
{
    if (offset < m_windowStart || offset + count > m_windowStart + m_windowBytes) {
        m_windowStart = offset;
        m_windowBytes = static_cast<std::size_t>(std::min<std::uint64_t>(m_window.size(), m_size - offset));
        m_read(offset, m_window.data(), m_windowBytes);
    }
    return m_window.data() + (offset - m_windowStart);
}

bool BiffStream::Seek(std::uint64_t offset)
{
    if (offset > m_size || m_size - offset < 4)
        return false;
    m_at = offset;
    return true;
}

bool BiffStream::Next(BiffRecord& record)
{
    if (m_at > m_size || m_size - m_at < 4)
        return false;
    record.offset = m_at;
    const unsigned char* header = Bytes(m_at, 4);
    record.id = Load16(header);
    const std::size_t length = Load16(header + 2);
    if (length > kLongestBody)
        Fail(record, "is longer than a record may be");
    if (m_size - m_at - 4 < length)
        Fail(record, "is cut short");
    record.body = std::span<const unsigned char>(Bytes(m_at + 4, length), length);
    m_at += 4 + length;
    return true;
}

BiffCursor BiffStream::Continued(const BiffRecord& record)
{
    // Reading on moves the window: the bodies are copied out of it.
    std::vector<std::vector<unsigned char>> bodies{{record.body.begin(), record.body.end()}};
    BiffRecord next;
    std::uint64_t before = m_at;
    while (Next(next) && next.id == kContinue) {
        bodies.emplace_back(next.body.begin(), next.body.end());
        before = m_at;
    }
    m_at = before;
    return BiffCursor(std::move(bodies));
}

void BiffStream::Fail(const BiffRecord& record, const std::string& why) const
{
    Fail("the record " + Hex(record.id) + " at byte " + std::to_string(record.offset) + " " + why);
}

void BiffStream::Fail(const std::string& why) const
{
    throw OpenError(m_path, "the workbook stream is damaged (" + why + ").");
}

const char* BiffErrorText(unsigned code)
{
    switch (code) {
    case 0x00: return "#NULL!";
    case 0x07: return "#DIV/0!";
    case 0x0F: return "#VALUE!";
    case 0x17: return "#REF!";
    case 0x1D: return "#NAME?";
    case 0x24: return "#NUM!";
    default: return "#N/A";
    }
}

double RkValue(std::uint32_t rk)
{
    double value;
    if (rk & 2) {
        value = static_cast<double>(static_cast<std::int32_t>(rk) >> 2);
    } else {
        const std::uint64_t bits = static_cast<std::uint64_t>(rk & 0xFFFFFFFCu) << 32;
        std::memcpy(&value, &bits, sizeof value);
    }
    return (rk & 1) ? value / 100 : value;
}

} // namespace sheet
