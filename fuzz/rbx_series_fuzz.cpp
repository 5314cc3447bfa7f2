// Feeds arbitrary bytes to the conversion's rbx0 row reader, which takes values straight from the
// stored records. The first byte: bit 0 repairs the checksums (so mutations reach the header and
// data checks), bits 1-7 pick the items to select (none: every item; else out of order, repeated
// and past the last item).
#include "checksums/Crc32.h"
#include "converter/RbxSeriesReader.h"
#include "platform/rbx/RbxHeaderCodec.h"

#include <cstdint>
#include <cstdio>
#include <cstring>
#include <string>
#include <unistd.h>
#include <vector>

namespace {

void RepairChecksums(std::vector<unsigned char>& bytes)
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

} // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size)
{
    if (size == 0)
        return 0;
    std::vector<unsigned char> bytes(data + 1, data + size);
    if (data[0] & 1)
        RepairChecksums(bytes);
    static const std::string path = "/tmp/rbx_series_fuzz_" + std::to_string(getpid()) + ".rbx0";
    if (std::FILE* f = std::fopen(path.c_str(), "wb")) {
        std::fwrite(bytes.data(), 1, bytes.size(), f);
        std::fclose(f);
    }
    converter::RbxSeriesReader reader;
    if (!reader.Open(path))
        return 0;
    if (const unsigned pick = data[0] >> 1; pick != 0) {
        const size_t items = reader.Header().items.size();
        reader.Select({pick % (items + 2), 0, pick % (items + 1), items});
    }
    converter::Row row;
    for (int n = 0; n < 100000 && reader.Next(row); ++n) {
    }
    return 0;
}
