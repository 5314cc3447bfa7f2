#pragma once
// Unsigned integers stored least significant byte first, as both workbook containers (compound
// files and zip packages) store them.
#include <cstdint>

namespace sheet {

inline std::uint16_t Load16(const unsigned char* p) { return static_cast<std::uint16_t>(p[0] | p[1] << 8); }

inline std::uint32_t Load32(const unsigned char* p)
{
    return static_cast<std::uint32_t>(Load16(p)) | static_cast<std::uint32_t>(Load16(p + 2)) << 16;
}

} // namespace sheet
