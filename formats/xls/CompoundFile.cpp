#include "formats/xls/CompoundFile.h"

#include "formats/workbook/LittleEndian.h"
#include "formats/workbook/WorkbookImport.h"

#include <algorithm>
#include <set>

namespace sheet {

namespace {

constexpr std::uint32_t kLastRegularSector = 0xFFFFFFF9u;
constexpr std::uint32_t kFreeSector = 0xFFFFFFFFu;
constexpr std::uint32_t kEndOfChain = 0xFFFFFFFEu;
// The header lists the first 109 sectors of the allocation table; further table sectors are
// listed in a chain of DIFAT sectors.
constexpr unsigned kHeaderTableSectors = 109;

} // namespace

void CompoundFile::Fail(const std::string& why) const
{
    throw OpenError(m_path, "the compound file is damaged (" + why + ").");
}

CompoundFile::CompoundFile(const std::string& path) : m_path(path), m_in(path, std::ios::binary | std::ios::ate)
{
    if (!m_in)
        throw OpenError(path, "the file cannot be read.");
    m_fileSize = static_cast<std::uint64_t>(m_in.tellg());
    std::vector<unsigned char> header(512);
    m_in.seekg(0);
    if (!m_in.read(reinterpret_cast<char*>(header.data()), 512))
        Fail("its header is cut short");
    const unsigned shift = Load16(&header[30]);
    if (shift != 9 && shift != 12)
        Fail("sector size 2^" + std::to_string(shift));
    m_sectorSize = 1ull << shift;
    m_sectorCount = m_fileSize > m_sectorSize ? (m_fileSize - m_sectorSize) / m_sectorSize : 0;
    m_miniCutoff = Load32(&header[56]);

    ReadAllocationTable(header);

    const std::uint32_t directoryStart = Load32(&header[48]);
    if (directoryStart >= m_sectorCount)
        Fail("its directory lies outside the file");
    std::vector<unsigned char> directory = ReadChain(directoryStart, m_fileSize, m_fat, m_sectorSize, false);
    for (std::uint64_t at = 0; at + 128 <= directory.size(); at += 128) {
        const unsigned char* e = &directory[at];
        const unsigned nameLength = Load16(e + 64);
        Entry entry;
        entry.type = e[66];
        if (nameLength > 64 || nameLength % 2 != 0 || entry.type > 5)
            Fail("bad directory entry");
        for (unsigned i = 0; i + 2 < nameLength; i += 2) // the length counts the closing zero
            entry.name.push_back(e[i + 1] == 0 && e[i] >= 0x20 && e[i] < 0x7F ? static_cast<char>(e[i]) : '?');
        entry.start = Load32(e + 116);
        entry.size = Load32(e + 120);
        m_entries.push_back(entry);
    }
    if (m_entries.empty() || m_entries[0].type != 5)
        Fail("no root entry");
    m_miniFat = ReadTable(Load32(&header[60]), Load32(&header[64]));
}

// The allocation table is made of the sectors the header lists, then of those the DIFAT chain
// lists, each DIFAT sector ending with the number of the next. The chain may neither loop nor
// leave the file, and the table may not claim more sectors than the file has. (The header's count
// of DIFAT sectors is not needed to follow the chain and is not relied on.)
void CompoundFile::ReadAllocationTable(const std::vector<unsigned char>& header)
{
    const std::uint32_t tableSectors = Load32(&header[44]);
    if (tableSectors > m_sectorCount)
        Fail("its allocation table claims " + std::to_string(tableSectors) + " sectors of the file's " +
             std::to_string(m_sectorCount));
    std::vector<std::uint32_t> tableSectorNumbers;
    tableSectorNumbers.reserve(tableSectors);
    for (unsigned i = 0; i < kHeaderTableSectors && tableSectorNumbers.size() < tableSectors; ++i)
        tableSectorNumbers.push_back(Load32(&header[76 + 4 * i]));

    const std::uint64_t perDifatSector = m_sectorSize / 4 - 1;
    std::set<std::uint32_t> difatSeen;
    std::vector<unsigned char> sector;
    for (std::uint32_t next = Load32(&header[68]); tableSectorNumbers.size() < tableSectors;) {
        if (next == kEndOfChain || next == kFreeSector)
            Fail("its DIFAT chain ends after " + std::to_string(tableSectorNumbers.size()) + " of " +
                 std::to_string(tableSectors) + " allocation table sectors");
        if (!difatSeen.insert(next).second)
            Fail("its DIFAT chain comes back to sector " + std::to_string(next));
        if (!ReadSector(next, sector))
            Fail("its DIFAT chain leaves the file at sector " + std::to_string(next));
        for (std::uint64_t k = 0; k < perDifatSector && tableSectorNumbers.size() < tableSectors; ++k)
            tableSectorNumbers.push_back(Load32(&sector[4 * k]));
        next = Load32(&sector[4 * perDifatSector]);
    }

    m_fat.reserve(static_cast<std::size_t>(tableSectors) * (m_sectorSize / 4));
    for (std::uint32_t number : tableSectorNumbers) {
        if (!ReadSector(number, sector))
            Fail("its allocation table lies outside the file");
        for (std::uint64_t k = 0; k + 4 <= m_sectorSize; k += 4)
            m_fat.push_back(Load32(&sector[k]));
    }
}

std::optional<CompoundFile::Entry> CompoundFile::Find(const std::string& name) const
{
    for (const Entry& entry : m_entries)
        if (entry.type == 2 && entry.name == name)
            return entry;
    return std::nullopt;
}

std::vector<unsigned char> CompoundFile::Read(const Entry& entry)
{
    if (entry.size > m_fileSize)
        Fail("the stream " + entry.name + " is larger than the file");
    if (entry.size >= m_miniCutoff)
        return ReadChain(entry.start, entry.size, m_fat, m_sectorSize, false);
    if (!m_miniStreamRead) {
        m_miniStream = ReadChain(m_entries[0].start, m_entries[0].size, m_fat, m_sectorSize, false);
        m_miniStreamRead = true;
    }
    return ReadChain(entry.start, entry.size, m_miniFat, 64, true);
}

CompoundFile::Stream CompoundFile::Open(const Entry& entry)
{
    if (entry.size > m_fileSize)
        Fail("the stream " + entry.name + " is larger than the file");
    Stream stream;
    stream.m_file = this;
    stream.m_size = entry.size;
    if (entry.size < m_miniCutoff) {
        stream.m_bytes = Read(entry);
        return stream;
    }
    std::uint64_t offset = 0;
    std::uint32_t next = entry.start;
    for (std::uint64_t steps = 0; offset < entry.size; ++steps) {
        if (next > kLastRegularSector)
            Fail("a stream is shorter than its directory entry says");
        if (steps > m_sectorCount || next >= m_sectorCount)
            Fail("a sector chain is broken");
        const std::uint64_t position = (next + 1ull) * m_sectorSize;
        std::vector<Stream::Run>& runs = stream.m_runs;
        if (runs.empty() || runs.back().filePosition + runs.back().length != position)
            runs.push_back({offset, position, 0});
        const std::uint64_t length = std::min(m_sectorSize, entry.size - offset);
        runs.back().length += length;
        offset += length;
        next = next < m_fat.size() ? m_fat[next] : kEndOfChain;
    }
    return stream;
}

void CompoundFile::Stream::ReadAt(std::uint64_t offset, unsigned char* out, std::size_t size)
{
    if (offset > m_size || size > m_size - offset)
        m_file->Fail("a read runs past the end of a stream");
    if (m_runs.empty()) {
        std::copy_n(m_bytes.begin() + static_cast<std::ptrdiff_t>(offset), size, out);
        return;
    }
    auto run = std::upper_bound(m_runs.begin(), m_runs.end(), offset,
                                [](std::uint64_t at, const Run& r) { return at < r.offset; }) - 1;
    while (size > 0) {
        const std::uint64_t within = offset - run->offset;
        const std::size_t piece = static_cast<std::size_t>(std::min<std::uint64_t>(size, run->length - within));
        std::ifstream& in = m_file->m_in;
        in.clear();
        in.seekg(static_cast<std::streamoff>(run->filePosition + within));
        if (!in.read(reinterpret_cast<char*>(out), static_cast<std::streamsize>(piece)))
            m_file->Fail("a sector cannot be read");
        out += piece, offset += piece, size -= piece;
        ++run;
    }
}

bool CompoundFile::ReadSector(std::uint32_t index, std::vector<unsigned char>& out)
{
    out.assign(m_sectorSize, 0);
    if (index >= m_sectorCount)
        return false;
    m_in.clear();
    m_in.seekg(static_cast<std::streamoff>((index + 1ull) * m_sectorSize));
    return static_cast<bool>(m_in.read(reinterpret_cast<char*>(out.data()), static_cast<std::streamsize>(m_sectorSize)));
}

std::vector<std::uint32_t> CompoundFile::ReadTable(std::uint32_t start, std::uint32_t count)
{
    std::vector<std::uint32_t> table;
    if (start > kLastRegularSector || count == 0)
        return table;
    std::vector<unsigned char> bytes = ReadChain(start, static_cast<std::uint64_t>(count) * m_sectorSize, m_fat, m_sectorSize, false);
    for (size_t k = 0; k + 4 <= bytes.size(); k += 4)
        table.push_back(Load32(&bytes[k]));
    return table;
}

// Follows a chain through `table`; stops at its end or after `size` bytes, and fails on a chain
// that leaves the file, loops, or ends before `size` bytes (when `size` is a stream's size).
std::vector<unsigned char> CompoundFile::ReadChain(std::uint32_t start, std::uint64_t size,
                                                   const std::vector<std::uint32_t>& table, std::uint64_t unit, bool mini)
{
    std::vector<unsigned char> out;
    std::vector<unsigned char> sector;
    const std::uint64_t limit = mini ? m_miniStream.size() / unit : m_sectorCount;
    std::uint32_t next = start;
    for (std::uint64_t steps = 0; next <= kLastRegularSector && out.size() < size; ++steps) {
        if (steps > limit || next >= limit)
            Fail("a sector chain is broken");
        if (mini) {
            out.insert(out.end(), m_miniStream.begin() + static_cast<std::ptrdiff_t>(next * unit),
                       m_miniStream.begin() + static_cast<std::ptrdiff_t>((next + 1) * unit));
        } else {
            if (!ReadSector(next, sector))
                Fail("a sector lies outside the file");
            out.insert(out.end(), sector.begin(), sector.end());
        }
        next = next < table.size() ? table[next] : kEndOfChain;
    }
    if (size != m_fileSize && out.size() < size && size <= m_fileSize)
        Fail("a stream is shorter than its directory entry says");
    if (out.size() > size)
        out.resize(static_cast<size_t>(size));
    return out;
}

} // namespace sheet
