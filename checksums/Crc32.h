#pragma once
// CRC-32 (the polynomial of zip and PNG). Where the processor multiplies without carries it folds
// 64 bytes a round, else it goes eight bytes at a time from tables, so checking a file costs far
// less than reading it.
#include <cstddef>
#include <cstdint>

namespace checksum {

// Continues `crc` (0 to start) over `size` bytes.
std::uint32_t Crc32(std::uint32_t crc, const void* data, std::size_t size);

// The same from tables alone, whatever the processor offers.
std::uint32_t TableCrc32(std::uint32_t crc, const void* data, std::size_t size);

} // namespace checksum
