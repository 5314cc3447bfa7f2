#pragma once
// Small text helpers shared by every layer. Strings are UTF-8 in std::string; "without regard to
// case" means ASCII case folding.
#include <string>
#include <string_view>

namespace text {

char ToLowerAscii(char c);
std::string ToLower(std::string_view s);
bool EqualsNoCase(std::string_view a, std::string_view b);
bool StartsWithNoCase(std::string_view s, std::string_view prefix);

// printf-style formatting into a std::string.
std::string Format(const char* format, ...) __attribute__((format(printf, 1, 2)));

// Reads a leading decimal integer the way "%d" scanning does: optional blanks, a sign, digits.
// Returns false when no digit follows; anything after the digits is ignored.
bool ScanInt(std::string_view s, int& value);
// atoi: the leading integer, 0 when there is none.
int AtoI(std::string_view s);

std::string Trim(std::string_view s);

// Appends the UTF-8 bytes of code point `c`.
void AppendUtf8(std::string& out, char32_t c);

// The longest start of `s` of at most `bytes` bytes that does not cut a UTF-8 sequence.
std::string CutUtf8(std::string_view s, size_t bytes);

// `s` with every control character written as an escape: \n, \r, \t, \0, else \xHH (DEL and the
// C1 controls in their UTF-8 form too). A file name or a cell's text then stays on one line of a
// log or a terminal and cannot pass for a line of its own.
std::string EscapeControls(std::string_view s);

} // namespace text
