#include "converter/OutputText.h"

namespace converter {

namespace {

// Length of the valid UTF-8 sequence at `p` (at most `left` bytes), or 0.
size_t Utf8Length(const unsigned char* p, size_t left)
{
    auto continuation = [&](size_t i, unsigned char low = 0x80, unsigned char high = 0xBF) {
        return i < left && p[i] >= low && p[i] <= high;
    };
    const unsigned char c = p[0];
    if (c >= 0xC2 && c <= 0xDF)
        return continuation(1) ? 2 : 0;
    if (c >= 0xE0 && c <= 0xEF) {
        // No overlong forms (E0 needs A0 and up) and no surrogates (ED stops at 9F).
        const unsigned char low = c == 0xE0 ? 0xA0 : 0x80;
        const unsigned char high = c == 0xED ? 0x9F : 0xBF;
        return continuation(1, low, high) && continuation(2) ? 3 : 0;
    }
    if (c >= 0xF0 && c <= 0xF4) {
        const unsigned char low = c == 0xF0 ? 0x90 : 0x80;
        const unsigned char high = c == 0xF4 ? 0x8F : 0xBF;
        return continuation(1, low, high) && continuation(2) && continuation(3) ? 4 : 0;
    }
    return 0;
}

} // namespace

char32_t NextTextCharacter(std::string_view text, size_t& at)
{
    const auto* p = reinterpret_cast<const unsigned char*>(text.data()) + at;
    const size_t length = p[0] < 0x80 ? 1 : Utf8Length(p, text.size() - at);
    if (length <= 1) {
        ++at; // ASCII, or a byte of a Latin-1 text
        return p[0];
    }
    at += length;
    char32_t c = p[0] & (length == 2 ? 0x1F : length == 3 ? 0x0F : 0x07);
    for (size_t i = 1; i < length; ++i)
        c = (c << 6) | (p[i] & 0x3F);
    return c;
}

} // namespace converter
