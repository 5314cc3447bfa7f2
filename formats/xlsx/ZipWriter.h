#pragma once
// Writes a zip package front to back: small entries given whole, and one streamed entry at a time
// whose data arrive in pieces. Entries are raw deflate; sizes and CRCs go into each local header
// by seeking back once the entry is complete, so no data descriptors are needed.
//
// No 64-bit extensions: an entry or the package that would pass 4 GiB fails with a message
// instead (the workbook reader does not take 64-bit packages either).
#include "platform/system/BufferedFile.h"
#include "platform/system/Status.h"

#include <cstdint>
#include <memory>
#include <string>
#include <string_view>
#include <vector>

typedef struct z_stream_s z_stream;

namespace sheet {

class ZipWriter {
public:
    // `bufferBytes`: how much packed output is gathered before each write to the file.
    explicit ZipWriter(size_t bufferBytes = 256 * 1024);
    ~ZipWriter(); // closes the file if Close was not reached; the caller removes what it left
    ZipWriter(const ZipWriter&) = delete;
    ZipWriter& operator=(const ZipWriter&) = delete;

    sys::Status Open(const std::string& path);

    // One entry with all of its data.
    sys::Status AddEntry(const std::string& name, std::string_view data);

    // Starts a streamed entry. `head` opens its data and is kept uncompressed in the package (a
    // stored block ahead of the deflated rest), so EndEntry can still replace it by a text of the
    // same length once the rest is known. At most 65,535 bytes.
    sys::Status BeginEntry(const std::string& name, std::string_view head = {});
    // Appends to the streamed entry; give large pieces, each is deflated as it comes.
    sys::Status Append(std::string_view data);
    // Completes the streamed entry. `finalHead`, when given, replaces the head of BeginEntry.
    sys::Status EndEntry(std::string_view finalHead = {});

    // Writes the central directory and closes the file.
    sys::Status Close();

    // The deflate level: 1 packs a worksheet to about a tenth for a small part of the CPU time
    // that higher levels take.
    static constexpr int kLevel = 1;

private:
    struct Entry {
        std::string name;
        std::uint64_t headerOffset = 0;
        std::uint32_t crc = 0;
        std::uint64_t packedSize = 0;
        std::uint64_t size = 0;
    };

    sys::Status WriteLocalHeader(const Entry& entry);
    sys::Status Deflate(std::string_view data, int flush);
    sys::Status PatchLocalHeader(const Entry& entry);
    // Each marks the package failed when the file refuses the bytes.
    sys::Status Output(const void* data, size_t size);
    sys::Status WriteAt(std::uint64_t offset, const void* data, size_t size);
    sys::Status Failed(sys::Status status);
    sys::Status Fail(const std::string& message);

    sys::BufferedFile m_file;
    std::unique_ptr<z_stream> m_zip;
    bool m_zipReady = false;
    std::vector<Entry> m_entries;
    bool m_streaming = false;
    Entry m_current;
    std::string m_head;          // the stored head of the streamed entry
    std::uint64_t m_headOffset = 0; // where its bytes sit in the file
    std::uint32_t m_restCrc = 0; // CRC of the streamed data after the head
    std::uint16_t m_dosTime = 0;
    std::uint16_t m_dosDate = 0;
    bool m_failed = false;
};

} // namespace sheet
