#pragma once
// How the writers take the bytes of a text that came from an input file (item names, units,
// titles): as UTF-8 where the bytes are valid UTF-8, else each byte as the Latin-1 character it
// stands for.
#include <string_view>

namespace converter {

// The character whose bytes start at `at`; `at` moves past them.
char32_t NextTextCharacter(std::string_view text, size_t& at);

} // namespace converter
