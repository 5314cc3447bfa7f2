#pragma once
// Unpacks a zip package written by the converter, checking what a strict reader relies on: the end
// record, every directory entry against its local header, the inflated size and zlib's CRC-32.
#include <zlib.h>

#include <cstdint>
#include <map>
#include <string>

namespace convtest {

struct ZipContents {
    std::map<std::string, std::string> parts; // name -> unpacked data, in name order
    std::string error;                         // the first inconsistency; empty when none
};

inline std::uint32_t Le(const std::string& bytes, size_t at, int width)
{
    std::uint32_t value = 0;
    for (int i = width - 1; i >= 0; --i)
        value = (value << 8) | static_cast<unsigned char>(bytes.at(at + static_cast<size_t>(i)));
    return value;
}

inline std::string InflateRaw(const std::string& packed, size_t expected, std::string& error)
{
    z_stream zip{};
    inflateInit2(&zip, -15);
    std::string out(expected, '\0');
    zip.next_in = reinterpret_cast<Bytef*>(const_cast<char*>(packed.data()));
    zip.avail_in = static_cast<uInt>(packed.size());
    zip.next_out = reinterpret_cast<Bytef*>(out.data());
    zip.avail_out = static_cast<uInt>(out.size());
    const int result = inflate(&zip, Z_FINISH);
    if (result != Z_STREAM_END || zip.avail_in != 0 || zip.total_out != expected)
        error = "inflate ended with " + std::to_string(result) + " after " + std::to_string(zip.total_out) + " bytes";
    inflateEnd(&zip);
    return out;
}

inline ZipContents Unzip(const std::string& bytes)
{
    ZipContents contents;
    const size_t end = bytes.size() >= 22 ? bytes.size() - 22 : std::string::npos;
    if (end == std::string::npos || Le(bytes, end, 4) != 0x06054b50u) {
        contents.error = "no end record in the last 22 bytes";
        return contents;
    }
    const std::uint32_t count = Le(bytes, end + 10, 2);
    size_t at = Le(bytes, end + 16, 4);
    if (at + Le(bytes, end + 12, 4) != end) {
        contents.error = "the directory does not end where the end record starts";
        return contents;
    }
    for (std::uint32_t n = 0; n < count && contents.error.empty(); ++n) {
        if (Le(bytes, at, 4) != 0x02014b50u) {
            contents.error = "bad directory entry " + std::to_string(n);
            break;
        }
        const std::uint32_t crc = Le(bytes, at + 16, 4), packed = Le(bytes, at + 20, 4), size = Le(bytes, at + 24, 4);
        const std::uint32_t nameLength = Le(bytes, at + 28, 2), local = Le(bytes, at + 42, 4);
        const std::string name = bytes.substr(at + 46, nameLength);
        at += 46 + nameLength + Le(bytes, at + 30, 2) + Le(bytes, at + 32, 2);
        if (Le(bytes, local, 4) != 0x04034b50u || Le(bytes, local + 8, 2) != 8 ||
            bytes.substr(local + 30, Le(bytes, local + 26, 2)) != name) {
            contents.error = name + ": local header missing or not deflate";
            break;
        }
        if (Le(bytes, local + 14, 4) != crc || Le(bytes, local + 18, 4) != packed || Le(bytes, local + 22, 4) != size) {
            contents.error = name + ": local header and directory disagree";
            break;
        }
        const size_t data = local + 30 + Le(bytes, local + 26, 2) + Le(bytes, local + 28, 2);
        std::string error;
        std::string part = InflateRaw(bytes.substr(data, packed), size, error);
        if (!error.empty())
            contents.error = name + ": " + error;
        else if (crc32(0, reinterpret_cast<const Bytef*>(part.data()), static_cast<uInt>(part.size())) != crc)
            contents.error = name + ": CRC mismatch";
        contents.parts[name] = std::move(part);
    }
    return contents;
}

} // namespace convtest
