#pragma once
// Writes a compound file, the container of .xls workbooks, with 512-byte sectors. Its first stream
// is streamed: the bytes go straight into consecutive sectors after the header, and the streams
// given whole at the end, the directory, the allocation table and its DIFAT sectors follow once
// that stream's length is known; the header is written last. Memory stays the same for any length.
//
// Every stream is stored in regular sectors, at least 4096 bytes long (zeros fill a shorter one),
// so the file needs no mini stream.
#include "platform/system/BufferedFile.h"

#include <cstdint>
#include <string>
#include <string_view>
#include <vector>

namespace sheet {

class CompoundFileWriter {
public:
    sys::Status Open(const std::string& path);

    // Appends to the streamed stream.
    sys::Status Append(std::string_view bytes);
    // Replaces bytes of the streamed stream written before, from `offset` in the stream.
    sys::Status Patch(std::uint64_t offset, std::string_view bytes);
    std::uint64_t StreamSize() const { return m_file.Size() - kHeaderBytes; }

    struct Stream {
        std::string name; // ASCII, or "\x05" and ASCII as property set streams are named
        std::string bytes;
    };
    // Completes the file: the streamed stream under `name`, then `others`, each given whole.
    sys::Status Close(const std::string& name, const std::vector<Stream>& others = {});

    static constexpr std::uint64_t kHeaderBytes = 512;
    static constexpr std::uint64_t kSectorBytes = 512;
    // The largest stream the directory entry of a version 3 file can describe.
    static constexpr std::uint64_t kMaxStreamBytes = 0x7FFFFFFF;

private:
    // Where each part of the file lies, in sectors counted after the header.
    struct Layout {
        std::vector<std::uint32_t> streamStarts; // the streamed stream first, then the others
        std::vector<std::uint32_t> streamSectors;
        std::uint32_t directoryStart = 0, directorySectors = 0;
        std::uint32_t tableStart = 0, tableSectors = 0;
        std::uint32_t difatStart = 0, difatSectors = 0;
    };
    static Layout PlanLayout(const std::vector<std::uint64_t>& streamSizes, size_t directoryEntries);
    sys::Status PadStream(std::uint64_t start, std::uint64_t size);
    sys::Status WriteDirectory(const Layout& layout, const std::vector<std::string>& names,
                          const std::vector<std::uint64_t>& sizes);
    sys::Status WriteAllocationTable(const Layout& layout);
    sys::Status WriteDifat(const Layout& layout);
    sys::Status WriteHeader(const Layout& layout);

    sys::BufferedFile m_file;
};

} // namespace sheet
