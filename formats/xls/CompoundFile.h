#pragma once
// A reader of the compound-file container of .xls workbooks: the header, the allocation tables,
// the directory and the streams, every length and sector number checked against the file.
// Every failure throws AutomationError naming the file.
#include <cstdint>
#include <fstream>
#include <optional>
#include <string>
#include <vector>

namespace sheet {

class CompoundFile {
public:
    // Reads the header, the allocation tables and the directory; throws when they are damaged.
    explicit CompoundFile(const std::string& path);

    struct Entry {
        std::string name; // ASCII names only; other characters become '?'
        unsigned type = 0;
        std::uint32_t start = 0;
        std::uint64_t size = 0;
    };
    const std::vector<Entry>& Entries() const { return m_entries; }
    std::optional<Entry> Find(const std::string& name) const;

    // The bytes of a stream (from the mini stream when it is small); throws on a broken chain.
    std::vector<unsigned char> Read(const Entry& entry);

    // A stream read piece by piece, so that a large one is never held whole: where its bytes lie
    // in the file is found once, as runs of consecutive sectors. A stream small enough for the
    // mini stream is held whole. It reads through the CompoundFile, which must outlive it.
    class Stream {
    public:
        std::uint64_t Size() const { return m_size; }
        // Copies `size` bytes from `offset` of the stream to `out`; throws past its end.
        void ReadAt(std::uint64_t offset, unsigned char* out, std::size_t size);

    private:
        friend class CompoundFile;
        struct Run {
            std::uint64_t offset = 0;       // in the stream
            std::uint64_t filePosition = 0; // of that byte in the file
            std::uint64_t length = 0;
        };
        CompoundFile* m_file = nullptr;
        std::uint64_t m_size = 0;
        std::vector<Run> m_runs;
        std::vector<unsigned char> m_bytes; // a stream of the mini stream
    };
    // Throws on a broken chain, or one shorter than the stream's directory entry says.
    Stream Open(const Entry& entry);

private:
    void ReadAllocationTable(const std::vector<unsigned char>& header);
    bool ReadSector(std::uint32_t index, std::vector<unsigned char>& out);
    std::vector<unsigned char> ReadChain(std::uint32_t start, std::uint64_t size, const std::vector<std::uint32_t>& table,
                                         std::uint64_t unit, bool mini);
    std::vector<std::uint32_t> ReadTable(std::uint32_t start, std::uint32_t count);
    [[noreturn]] void Fail(const std::string& why) const;

    std::string m_path;
    std::ifstream m_in;
    std::uint64_t m_fileSize = 0;
    std::uint64_t m_sectorSize = 512;
    std::uint64_t m_sectorCount = 0;
    std::uint32_t m_miniCutoff = 4096;
    std::vector<std::uint32_t> m_fat;
    std::vector<std::uint32_t> m_miniFat;
    std::vector<Entry> m_entries;
    std::vector<unsigned char> m_miniStream;
    bool m_miniStreamRead = false;
};

} // namespace sheet
