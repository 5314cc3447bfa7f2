#pragma once
// Unsigned integers stored least significant byte first, as both workbook containers (compound
// files and zip packages) and the records of .xls workbooks store them: read, and written.
#include <cstdint>
#include <string>

namespace sheet {

inline std::uint16_t Load16(const unsigned char* p) { return static_cast<std::uint16_t>(p[0] | p[1] << 8); }

inline std::uint32_t Load32(const unsigned char* p)
{
    return static_cast<std::uint32_t>(Load16(p)) | static_cast<std::uint32_t>(Load16(p + 2)) << 16;
}

inline void Store16(unsigned char* p, std::uint32_t value)
{
    p[0] = static_cast<unsigned char>(value);
    p[1] = static_cast<unsigned char>(value >> 8);
}

inline void Store32(unsigned char* p, std::uint32_t value)
{
    Store16(p, value & 0xFFFF);
    Store16(p + 2, value >> 16);
}

inline void Append16(std::string& out, std::uint32_t value)
{
    out += static_cast<char>(value & 0xFF);
    out += static_cast<char>((value >> 8) & 0xFF);
}

inline void Append32(std::string& out, std::uint32_t value)
{
    Append16(out, value & 0xFFFF);
    Append16(out, value >> 16);
}

} // namespace sheet
