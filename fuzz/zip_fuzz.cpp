// Feeds arbitrary bytes to the zip package reader as a file and unpacks every part it lists,
// in odd-sized chunks, under small limits so hostile sizes are refused quickly.
#include "formats/xlsx/ZipReader.h"

#include <cstdint>
#include <cstdio>
#include <string>
#include <unistd.h>

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size)
{
    char path[] = "/tmp/velmora_zip_fuzz_XXXXXX";
    int fd = mkstemp(path);
    if (fd < 0)
        return 0;
    bool complete = write(fd, data, size) == static_cast<ssize_t>(size);
    close(fd);
    if (complete) {
        sheet::ImportLimits limits;
        limits.maxEntryBytes = 8 << 20;
        limits.maxUncompressedBytes = 16 << 20;
        try {
            sheet::ZipReader package(path, limits);
            char buffer[997];
            for (const sheet::ZipReader::Entry& entry : package.Entries()) {
                auto part = package.Open(entry);
                while (part->Read(buffer, sizeof buffer) > 0) {
                }
            }
        } catch (const sheet::AutomationError&) {
        }
    }
    unlink(path);
    return 0;
}
