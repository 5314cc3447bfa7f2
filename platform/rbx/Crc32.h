#pragma once
// CRC-32 (the polynomial of zip and PNG), computed eight bytes at a time so that checking a file
// costs far less than reading it.
#include <cstddef>
#include <cstdint>

namespace rbx {

// Continues `crc` (0 to start) over `size` bytes.
std::uint32_t Crc32(std::uint32_t crc, const void* data, std::size_t size);

} // namespace rbx
