// Feeds arbitrary bytes to the zip package reader as a file and unpacks every part it lists,
// in odd-sized chunks, under small limits so hostile sizes are refused quickly.
#include "formats/xlsx/ZipReader.h"

#include "tests/support/ScratchFile.h"

#include <cstdint>

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size)
{
    const testsupport::ScratchFile input("velmora-zip-fuzz", "", data, size);
    if (!input.Path().empty()) {
        sheet::ImportLimits limits;
        limits.maxEntryBytes = 8 << 20;
        limits.maxUncompressedBytes = 16 << 20;
        try {
            sheet::ZipReader package(input.Path(), limits);
            char buffer[997];
            for (const sheet::ZipReader::Entry& entry : package.Entries()) {
                auto part = package.Open(entry);
                while (part->Read(buffer, sizeof buffer) > 0) {
                }
            }
        } catch (const sheet::AutomationError&) {
        }
    }
    return 0;
}
