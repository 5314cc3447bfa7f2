// Feeds arbitrary bytes to the conversion's rbx0 row reader, which takes values straight from the
// stored records. The first byte: bit 0 repairs the checksums (so mutations reach the header and
// data checks), bits 1-7 pick the items to select (none: every item; else out of order, repeated
// and past the last item).
#include "checksums/Crc32.h"
#include "converter/RbxSeriesReader.h"
#include "tests/support/RbxChecksums.h"
#include "tests/support/ScratchFile.h"

#include <cstdint>
#include <cstdio>
#include <cstring>
#include <string>
#include <vector>

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size)
{
    if (size == 0)
        return 0;
    std::vector<unsigned char> bytes(data + 1, data + size);
    if (data[0] & 1)
        testsupport::RepairRbxChecksums(bytes);
    const testsupport::ScratchFile input("velmora-rbx-series-fuzz", ".rbx0", bytes.data(), bytes.size());
    if (input.Path().empty())
        return 0;
    const std::string& path = input.Path();
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
