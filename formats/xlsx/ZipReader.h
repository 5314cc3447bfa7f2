#pragma once
// Reading the parts of a zip package (.xlsx) one chunk at a time, so a sheet part of any size
// streams through a fixed buffer. The central directory is read and checked when the package
// opens: each part's sizes must fit the file and the limits (a zip bomb is refused before any
// unpacking). Failures throw AutomationError naming the file.
#include "formats/workbook/WorkbookImport.h"

#include <cstdint>
#include <fstream>
#include <memory>
#include <string>
#include <string_view>
#include <vector>

namespace sheet {

class ZipReader {
public:
    struct Entry {
        std::string name;
        unsigned method = 0; // 0 stored, 8 deflated
        std::uint32_t crc = 0;
        std::uint64_t packedSize = 0;
        std::uint64_t size = 0;
        std::uint64_t headerOffset = 0; // of the part's own (local) header
    };

    // A part being unpacked. Read gives up to `capacity` more bytes and 0 at the part's end,
    // after checking its size and CRC; damaged data throws.
    class PartStream {
    public:
        virtual ~PartStream() = default;
        virtual std::size_t Read(char* out, std::size_t capacity) = 0;
    };

    ZipReader(const std::string& path, const ImportLimits& limits);
    ~ZipReader();

    const std::vector<Entry>& Entries() const { return m_entries; }
    // The part of that name (exact, case-sensitive), or null.
    const Entry* Find(std::string_view name) const;

    std::unique_ptr<PartStream> Open(const Entry& entry);
    // The whole part, for the small ones (workbook, relationships, styles).
    std::string ReadAll(const Entry& entry);

private:
    void ReadDirectory();
    [[noreturn]] void Fail(const std::string& why) const;

    std::string m_path;
    ImportLimits m_limits;
    std::ifstream m_in;
    std::uint64_t m_fileSize = 0;
    std::vector<Entry> m_entries;
};

} // namespace sheet
