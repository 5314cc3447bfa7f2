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

// Reads a leading decimal integer the way "%d" scanning does: optional blanks, a sign, digits (a
// number beyond an int saturates).
// Returns false when no digit follows; anything after the digits is ignored.
bool ScanInt(std::string_view s, int& value);
// atoi: the leading integer, 0 when there is none.
int AtoI(std::string_view s);

std::string Trim(std::string_view s);

// Appends the UTF-8 bytes of code point `c`.
void AppendUtf8(std::string& out, char32_t c);

// Length of the well-formed UTF-8 sequence at `s[i]` (1 to 4), 0 when there is none there: overlong
// forms, surrogates and values past U+10FFFF are not well formed.
size_t Utf8SequenceLength(std::string_view s, size_t i);
bool IsUtf8(std::string_view s);
// Removes a UTF-8 sequence that was cut short at the end of `s`.
void DropPartialCharacter(std::string& s);
// Shortens `s` to at most `length` bytes without leaving the start of a UTF-8 sequence at its end.
void CutToLength(std::string& s, size_t length);

// The character a Windows-1252 byte stands for. Its five unassigned bytes (0x81, 0x8D, 0x8F, 0x90,
// 0x9D) keep their value, as Windows itself reads them.
char32_t Windows1252Character(unsigned char byte);

// How 8-bit text from a file becomes text, everywhere: the bytes as they are when they are
// well-formed UTF-8, else every byte read as Windows-1252, the ANSI code page of the systems that
// write such files. The result is always well-formed UTF-8.
std::string ToUtf8(std::string_view bytes);
// The code point of the well-formed UTF-8 sequence at `s[at]` (`at` moves past it). Writers walk
// the characters of `ToUtf8`'s result with it.
char32_t NextUtf8Character(std::string_view s, size_t& at);

// Converts the whole UTF-16 code units at the start of `bytes` (in the byte order given) onto `out`
// as UTF-8 and returns how many bytes it used. An odd last byte, or a high surrogate at the end
// whose partner may still follow, is left unused. An unpaired surrogate stops the conversion there
// and sets `unpairedAt` to its offset (else it is std::string_view::npos).
size_t AppendUtf16AsUtf8(std::string_view bytes, bool bigEndian, std::string& out, size_t& unpairedAt);

// Appends `s` as a JSON string literal, made UTF-8 by ToUtf8 first.
void AppendJsonString(std::string& out, std::string_view s);

// The longest start of `s` of at most `bytes` bytes that does not cut a UTF-8 sequence.
std::string CutUtf8(std::string_view s, size_t bytes);

// `s` with every control character written as an escape: \n, \r, \t, \0, else \xHH (DEL and the
// C1 controls in their UTF-8 form too). A file name or a cell's text then stays on one line of a
// log or a terminal and cannot pass for a line of its own.
std::string EscapeControls(std::string_view s);

} // namespace text
