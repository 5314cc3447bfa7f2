#include "platform/system/Text.h"

#include <algorithm>
#include <charconv>
#include <cstdarg>
#include <cstdio>
#include <limits>

namespace text {

char ToLowerAscii(char c) { return (c >= 'A' && c <= 'Z') ? static_cast<char>(c - 'A' + 'a') : c; }

std::string ToLower(std::string_view s)
{
    std::string out(s);
    for (char& c : out)
        c = ToLowerAscii(c);
    return out;
}

bool EqualsNoCase(std::string_view a, std::string_view b)
{
    if (a.size() != b.size())
        return false;
    for (size_t i = 0; i < a.size(); ++i)
        if (ToLowerAscii(a[i]) != ToLowerAscii(b[i]))
            return false;
    return true;
}

bool StartsWithNoCase(std::string_view s, std::string_view prefix)
{
    return s.size() >= prefix.size() && EqualsNoCase(s.substr(0, prefix.size()), prefix);
}

std::string Format(const char* format, ...)
{
    va_list args;
    va_start(args, format);
    va_list copy;
    va_copy(copy, args);
    int needed = std::vsnprintf(nullptr, 0, format, copy);
    va_end(copy);
    std::string out;
    if (needed > 0) {
        out.resize(static_cast<size_t>(needed));
        std::vsnprintf(out.data(), out.size() + 1, format, args);
    }
    va_end(args);
    return out;
}

bool ScanInt(std::string_view s, int& value)
{
    size_t i = 0;
    while (i < s.size() && (s[i] == ' ' || s[i] == '\t' || s[i] == '\n' || s[i] == '\r' || s[i] == '\v' || s[i] == '\f'))
        ++i;
    bool negative = false;
    if (i < s.size() && (s[i] == '+' || s[i] == '-')) {
        negative = s[i] == '-';
        ++i;
    }
    // The digits; a run too long for any int saturates instead of failing.
    constexpr unsigned long long kBeyondInt = static_cast<unsigned long long>(std::numeric_limits<int>::max()) + 1;
    unsigned long long magnitude = 0;
    const char* const digits = s.data() + i;
    const auto [end, error] = std::from_chars(digits, s.data() + s.size(), magnitude);
    if (end == digits)
        return false;
    if (error == std::errc::result_out_of_range || magnitude > kBeyondInt)
        magnitude = kBeyondInt;
    const long long v = negative ? -static_cast<long long>(magnitude) : static_cast<long long>(magnitude);
    value = v > std::numeric_limits<int>::max() ? std::numeric_limits<int>::max() : static_cast<int>(v);
    return true;
}

int AtoI(std::string_view s)
{
    int v = 0;
    return ScanInt(s, v) ? v : 0;
}

std::string Trim(std::string_view s)
{
    size_t b = 0, e = s.size();
    while (b < e && (s[b] == ' ' || s[b] == '\t' || s[b] == '\r' || s[b] == '\n'))
        ++b;
    while (e > b && (s[e - 1] == ' ' || s[e - 1] == '\t' || s[e - 1] == '\r' || s[e - 1] == '\n'))
        --e;
    return std::string(s.substr(b, e - b));
}

void AppendUtf8(std::string& out, char32_t c)
{
    if (c < 0x80) {
        out += static_cast<char>(c);
    } else if (c < 0x800) {
        out += static_cast<char>(0xC0 | (c >> 6));
        out += static_cast<char>(0x80 | (c & 0x3F));
    } else if (c < 0x10000) {
        out += static_cast<char>(0xE0 | (c >> 12));
        out += static_cast<char>(0x80 | ((c >> 6) & 0x3F));
        out += static_cast<char>(0x80 | (c & 0x3F));
    } else {
        out += static_cast<char>(0xF0 | (c >> 18));
        out += static_cast<char>(0x80 | ((c >> 12) & 0x3F));
        out += static_cast<char>(0x80 | ((c >> 6) & 0x3F));
        out += static_cast<char>(0x80 | (c & 0x3F));
    }
}

size_t Utf8SequenceLength(std::string_view s, size_t i)
{
    auto byte = [&](size_t k) { return static_cast<unsigned char>(s[k]); };
    const unsigned char lead = byte(i);
    if (lead < 0x80)
        return 1;
    const size_t length = lead >= 0xF0 ? 4 : lead >= 0xE0 ? 3 : lead >= 0xC2 ? 2 : 0;
    if (length == 0 || lead > 0xF4 || i + length > s.size())
        return 0;
    for (size_t k = 1; k < length; ++k)
        if ((byte(i + k) & 0xC0) != 0x80)
            return 0;
    const unsigned char second = byte(i + 1);
    if ((lead == 0xE0 && second < 0xA0) || (lead == 0xED && second > 0x9F) || (lead == 0xF0 && second < 0x90) ||
        (lead == 0xF4 && second > 0x8F))
        return 0;
    return length;
}

char32_t NextUtf8Character(std::string_view s, size_t& at)
{
    const size_t length = std::max<size_t>(Utf8SequenceLength(s, at), 1);
    const auto lead = static_cast<unsigned char>(s[at]);
    char32_t c = length == 1 ? lead : lead & (length == 2 ? 0x1F : length == 3 ? 0x0F : 0x07);
    for (size_t k = 1; k < length; ++k)
        c = (c << 6) | (static_cast<unsigned char>(s[at + k]) & 0x3F);
    at += length;
    return c;
}

bool IsUtf8(std::string_view s)
{
    for (size_t i = 0; i < s.size();) {
        if (static_cast<unsigned char>(s[i]) < 0x80) {
            ++i;
            continue;
        }
        const size_t length = Utf8SequenceLength(s, i);
        if (length == 0)
            return false;
        i += length;
    }
    return true;
}

void DropPartialCharacter(std::string& s)
{
    // Back over the continuation bytes at the end to the sequence's first byte.
    size_t start = s.size();
    while (start > 0 && s.size() - start < 3 && (static_cast<unsigned char>(s[start - 1]) & 0xC0) == 0x80)
        --start;
    if (start > 0 && static_cast<unsigned char>(s[start - 1]) >= 0x80 && Utf8SequenceLength(s, start - 1) == 0)
        s.resize(start - 1);
}

void CutToLength(std::string& s, size_t length)
{
    if (s.size() <= length)
        return;
    s.resize(length);
    DropPartialCharacter(s);
}

char32_t Windows1252Character(unsigned char byte)
{
    static constexpr char16_t kHigh[32] = {
        0x20AC, 0x0081, 0x201A, 0x0192, 0x201E, 0x2026, 0x2020, 0x2021, 0x02C6, 0x2030, 0x0160,
        0x2039, 0x0152, 0x008D, 0x017D, 0x008F, 0x0090, 0x2018, 0x2019, 0x201C, 0x201D, 0x2022,
        0x2013, 0x2014, 0x02DC, 0x2122, 0x0161, 0x203A, 0x0153, 0x009D, 0x017E, 0x0178};
    return byte >= 0x80 && byte < 0xA0 ? kHigh[byte - 0x80] : byte;
}

std::string ToUtf8(std::string_view bytes)
{
    if (IsUtf8(bytes))
        return std::string(bytes);
    std::string out;
    out.reserve(bytes.size() + bytes.size() / 2);
    for (char c : bytes)
        AppendUtf8(out, Windows1252Character(static_cast<unsigned char>(c)));
    return out;
}

size_t AppendUtf16AsUtf8(std::string_view bytes, bool bigEndian, std::string& out, size_t& unpairedAt)
{
    auto unit = [&](size_t i) -> char32_t {
        const auto first = static_cast<unsigned char>(bytes[i]);
        const auto second = static_cast<unsigned char>(bytes[i + 1]);
        return bigEndian ? (first << 8 | second) : (second << 8 | first);
    };
    auto isHigh = [](char32_t c) { return c >= 0xD800 && c <= 0xDBFF; };
    auto isLow = [](char32_t c) { return c >= 0xDC00 && c <= 0xDFFF; };
    unpairedAt = std::string_view::npos;
    size_t i = 0;
    while (i + 2 <= bytes.size()) {
        const char32_t first = unit(i);
        if (isHigh(first) && i + 4 > bytes.size())
            break; // its partner may come later
        if (isHigh(first) && isLow(unit(i + 2))) {
            AppendUtf8(out, 0x10000 + ((first - 0xD800) << 10) + (unit(i + 2) - 0xDC00));
            i += 4;
            continue;
        }
        if (isHigh(first) || isLow(first)) {
            unpairedAt = i;
            break;
        }
        AppendUtf8(out, first);
        i += 2;
    }
    return i;
}

void AppendJsonString(std::string& out, std::string_view s)
{
    if (!IsUtf8(s)) {
        AppendJsonString(out, ToUtf8(s));
        return;
    }
    out += '"';
    for (char ch : s) {
        const auto c = static_cast<unsigned char>(ch);
        switch (c) {
        case '"': out += "\\\""; break;
        case '\\': out += "\\\\"; break;
        case '\n': out += "\\n"; break;
        case '\t': out += "\\t"; break;
        case '\r': out += "\\r"; break;
        default:
            if (c < 0x20)
                out += Format("\\u%04x", c);
            else
                out += ch;
        }
    }
    out += '"';
}

std::string CutUtf8(std::string_view s, size_t bytes)
{
    std::string cut(s.substr(0, std::min(s.size(), bytes + 3)));
    CutToLength(cut, bytes);
    return cut;
}

std::string EscapeControls(std::string_view s)
{
    std::string out;
    out.reserve(s.size());
    for (size_t i = 0; i < s.size(); ++i) {
        const unsigned char c = static_cast<unsigned char>(s[i]);
        const bool c1 = c == 0xC2 && i + 1 < s.size() && static_cast<unsigned char>(s[i + 1]) >= 0x80 &&
                        static_cast<unsigned char>(s[i + 1]) <= 0x9F;
        if (c >= 0x20 && c != 0x7F && !c1) {
            out += static_cast<char>(c);
            continue;
        }
        switch (c) {
        case '\n': out += "\\n"; break;
        case '\r': out += "\\r"; break;
        case '\t': out += "\\t"; break;
        case '\0': out += "\\0"; break;
        default:
            out += Format("\\x%02X", c);
            if (c1)
                out += Format("\\x%02X", static_cast<unsigned char>(s[++i]));
        }
    }
    return out;
}

} // namespace text
