#pragma once
// Whole files as bytes, for tests that write inputs and read back what a program wrote.
#include <string>
#include <string_view>

namespace testsupport {

// The bytes of the file; empty when it cannot be read.
std::string ReadFile(const std::string& path);
// Replaces the file's content with `bytes`.
void WriteFile(const std::string& path, std::string_view bytes);
bool Contains(std::string_view text, std::string_view part);

} // namespace testsupport
