#include "tests/support/RbxChecksums.h"
#include "checksums/Crc32.h"
#include "platform/rbx/RbxHeaderCodec.h"

#include <cstdint>
#include <cstring>

namespace testsupport {

void RepairRbxChecksums(std::vector<unsigned char>& bytes)
{
    if (bytes.size() < rbx::kFixedHeaderSize)
        return;
    std::uint32_t headerSize = 0;
    std::memcpy(&headerSize, bytes.data() + rbx::layout::kHeaderSize, 4);
    if (headerSize < rbx::kFixedHeaderSize || headerSize > bytes.size())
        return;
    const std::uint32_t dataCrc = checksum::Crc32(0, bytes.data() + headerSize, bytes.size() - headerSize);
    std::memcpy(bytes.data() + rbx::layout::kDataChecksum, &dataCrc, 4);
    std::memset(bytes.data() + rbx::layout::kHeaderChecksum, 0, 4);
    const std::uint32_t headerCrc = checksum::Crc32(0, bytes.data(), headerSize);
    std::memcpy(bytes.data() + rbx::layout::kHeaderChecksum, &headerCrc, 4);
}

} // namespace testsupport
