#pragma once
// UTF-16 bytes of a UTF-8 text, for tests that write UTF-16 files.
#include <string>
#include <string_view>

namespace testsupport {

inline std::string Utf16(std::string_view utf8, bool bigEndian)
{
    std::string bytes;
    auto put = [&](char32_t unit) {
        const char high = static_cast<char>(unit >> 8), low = static_cast<char>(unit & 0xFF);
        bytes += bigEndian ? high : low;
        bytes += bigEndian ? low : high;
    };
    for (size_t i = 0; i < utf8.size();) {
        const auto lead = static_cast<unsigned char>(utf8[i]);
        const size_t length = lead < 0x80 ? 1 : lead < 0xE0 ? 2 : lead < 0xF0 ? 3 : 4;
        char32_t c = length == 1 ? lead : lead & (0x7F >> length);
        for (size_t k = 1; k < length; ++k)
            c = (c << 6) | (static_cast<unsigned char>(utf8[i + k]) & 0x3F);
        i += length;
        if (c < 0x10000) {
            put(c);
        } else {
            put(0xD800 + ((c - 0x10000) >> 10));
            put(0xDC00 + ((c - 0x10000) & 0x3FF));
        }
    }
    return bytes;
}

// The same, after a byte-order mark when `mark` is set.
inline std::string Utf16(std::string_view utf8, bool bigEndian, bool mark)
{
    const std::string bom = !mark ? "" : bigEndian ? "\xFE\xFF" : "\xFF\xFE";
    return bom + Utf16(utf8, bigEndian);
}

} // namespace testsupport
