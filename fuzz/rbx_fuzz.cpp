// Feeds arbitrary bytes to the rbx0 reader and the rbx calls. With the first byte odd, the checksums
// are repaired first, so that mutations get past them into the header and data checks.
#include "platform/rbx/Rbx.h"
#include "platform/rbx/RbxReader.h"
#include "tests/support/RbxChecksums.h"
#include "tests/support/ScratchFile.h"

#include <cstdint>
#include <cstdio>
#include <cstring>
#include <string>
#include <vector>

namespace {

void ReadWithTheReader(const std::string& path, rbx::VerifyChecksum verify)
{
    rbx::CRbxReader reader;
    if (!reader.Open(path, verify))
        return;
    if (reader.Header().axis.steps == 0)
        return;
    // A step's values fit in the file, so this stays as small as the input.
    const std::size_t valueCount = reader.Header().ValueCount();
    std::vector<double> times(4), values(4 * valueCount);
    std::size_t got = 1;
    while (got > 0 && reader.ReadSteps(4, times.data(), values.data(), got)) {
    }
}

void ReadWithTheCalls(const std::string& path)
{
    rbxHeader* header = nullptr;
    rbxFile* file = nullptr;
    if (rbxFileRead(path.c_str(), &header, &file) != 0)
        return;
    std::size_t largest = 8;
    for (int i = 1; i <= rbxGetNoOfItems(header); ++i) {
        int dataType = 0;
        rbxGetItemInfo(rbxItemD(header, i), nullptr, nullptr, nullptr, nullptr, nullptr, &dataType);
        largest = std::max(largest, 8 * static_cast<std::size_t>(rbxGetItemElementCount(rbxItemD(header, i))));
    }
    std::vector<unsigned char> value(largest);
    double time = 0;
    for (int n = 0; n < 100000 && rbxReadItemTimeStep(header, file, &time, value.data()) == 0; ++n) {
    }
    rbxFileClose(header, file);
    rbxHeaderDestroy(header);
}

} // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size)
{
    if (size == 0)
        return 0;
    std::vector<unsigned char> bytes(data + 1, data + size);
    if (data[0] & 1)
        testsupport::RepairRbxChecksums(bytes);
    const testsupport::ScratchFile input("velmora-rbx-fuzz", ".rbx0", bytes.data(), bytes.size());
    if (input.Path().empty())
        return 0;
    const std::string& path = input.Path();
    ReadWithTheReader(path, (data[0] & 2) ? rbx::VerifyChecksum::AtOpen : rbx::VerifyChecksum::AtEnd);
    ReadWithTheCalls(path);
    return 0;
}
