#include "formats/xls/CompoundFileWriter.h"

#include "formats/workbook/LittleEndian.h"

#include <algorithm>
#include <cctype>

namespace sheet {

namespace {

using sheet::Store16;
using sheet::Store32;

constexpr std::uint32_t kFreeSector = 0xFFFFFFFF;
constexpr std::uint32_t kEndOfChain = 0xFFFFFFFE;
constexpr std::uint32_t kTableSector = 0xFFFFFFFD;
constexpr std::uint32_t kDifatSector = 0xFFFFFFFC;
constexpr std::uint32_t kNoEntry = 0xFFFFFFFF;
constexpr std::uint64_t kMinStreamBytes = 4096; // shorter streams would belong in the mini stream
constexpr std::uint32_t kEntriesPerTableSector = 128;
constexpr std::uint32_t kHeaderTableSectors = 109;
constexpr std::uint32_t kTableSectorsPerDifat = 127;
constexpr size_t kDirectoryEntryBytes = 128;

std::uint32_t SectorsFor(std::uint64_t bytes)
{
    return static_cast<std::uint32_t>((bytes + CompoundFileWriter::kSectorBytes - 1) / CompoundFileWriter::kSectorBytes);
}

std::uint64_t StoredSize(std::uint64_t bytes) { return std::max(bytes, kMinStreamBytes); }

std::uint32_t DifatSectorsFor(std::uint32_t tableSectors)
{
    return tableSectors <= kHeaderTableSectors
               ? 0
               : (tableSectors - kHeaderTableSectors + kTableSectorsPerDifat - 1) / kTableSectorsPerDifat;
}

// Directory entries are ordered by name length, then by their upper-case letters.
bool EntryNameBefore(const std::string& a, const std::string& b)
{
    if (a.size() != b.size())
        return a.size() < b.size();
    for (size_t i = 0; i < a.size(); ++i) {
        const int x = std::toupper(static_cast<unsigned char>(a[i]));
        const int y = std::toupper(static_cast<unsigned char>(b[i]));
        if (x != y)
            return x < y;
    }
    return false;
}

struct DirectoryEntry {
    std::string name;
    unsigned char type = 0; // 2 stream, 5 root
    std::uint32_t left = kNoEntry, right = kNoEntry, child = kNoEntry;
    std::uint32_t start = kEndOfChain;
    std::uint64_t size = 0;
};

// Links entries[order[first..last)] as a balanced search tree; gives the index of its root.
std::uint32_t LinkTree(std::vector<DirectoryEntry>& entries, const std::vector<std::uint32_t>& order, size_t first,
                       size_t last)
{
    if (first >= last)
        return kNoEntry;
    const size_t middle = first + (last - first) / 2;
    DirectoryEntry& node = entries[order[middle]];
    node.left = LinkTree(entries, order, first, middle);
    node.right = LinkTree(entries, order, middle + 1, last);
    return order[middle];
}

std::string EntryBytes(const DirectoryEntry& entry)
{
    std::string bytes(kDirectoryEntryBytes, '\0');
    auto* p = reinterpret_cast<unsigned char*>(bytes.data());
    if (entry.type != 0) {
        for (size_t i = 0; i < entry.name.size() && i < 31; ++i)
            Store16(p + 2 * i, static_cast<unsigned char>(entry.name[i]));
        Store16(p + 64, static_cast<std::uint32_t>(2 * (std::min<size_t>(entry.name.size(), 31) + 1)));
    }
    p[66] = entry.type;
    p[67] = 1; // black: the tree is balanced, its colours are not checked by readers
    Store32(p + 68, entry.left);
    Store32(p + 72, entry.right);
    Store32(p + 76, entry.child);
    Store32(p + 116, entry.start);
    Store32(p + 120, static_cast<std::uint32_t>(entry.size));
    return bytes;
}

} // namespace

sys::Status CompoundFileWriter::Open(const std::string& path)
{
    if (sys::Status opened = m_file.Open(path); !opened)
        return opened;
    const std::string placeholder(kHeaderBytes, '\0'); // the header, once the layout is known
    return m_file.Write(placeholder.data(), placeholder.size());
}

sys::Status CompoundFileWriter::Append(std::string_view bytes)
{
    if (StreamSize() + bytes.size() > kMaxStreamBytes)
        return m_file.Fail("the stream passes the 2 GiB a compound file's directory can describe");
    return m_file.Write(bytes.data(), bytes.size());
}

sys::Status CompoundFileWriter::Patch(std::uint64_t offset, std::string_view bytes)
{
    return m_file.WriteAt(kHeaderBytes + offset, bytes.data(), bytes.size());
}

// Fills the sectors of a stream that began at `start` (after the header) and holds `size` bytes.
sys::Status CompoundFileWriter::PadStream(std::uint64_t start, std::uint64_t size)
{
    const std::uint64_t end = start + static_cast<std::uint64_t>(SectorsFor(StoredSize(size))) * kSectorBytes;
    const std::string zeros(static_cast<size_t>(end - (m_file.Size() - kHeaderBytes)), '\0');
    return m_file.Write(zeros.data(), zeros.size());
}

CompoundFileWriter::Layout CompoundFileWriter::PlanLayout(const std::vector<std::uint64_t>& streamSizes,
                                                          size_t directoryEntries)
{
    Layout layout;
    std::uint32_t next = 0;
    for (std::uint64_t size : streamSizes) {
        layout.streamStarts.push_back(next);
        layout.streamSectors.push_back(SectorsFor(StoredSize(size)));
        next += layout.streamSectors.back();
    }
    layout.directoryStart = next;
    layout.directorySectors = SectorsFor(directoryEntries * kDirectoryEntryBytes);
    next += layout.directorySectors;
    // The table describes every sector, its own and the DIFAT's included.
    std::uint32_t tableSectors = (next + kEntriesPerTableSector - 1) / kEntriesPerTableSector;
    while (static_cast<std::uint64_t>(tableSectors) * kEntriesPerTableSector <
           static_cast<std::uint64_t>(next) + tableSectors + DifatSectorsFor(tableSectors))
        ++tableSectors;
    layout.tableStart = next;
    layout.tableSectors = tableSectors;
    layout.difatStart = next + tableSectors;
    layout.difatSectors = DifatSectorsFor(tableSectors);
    return layout;
}

sys::Status CompoundFileWriter::Close(const std::string& name, const std::vector<Stream>& others)
{
    std::vector<std::string> names{name};
    std::vector<std::uint64_t> sizes{StreamSize()};
    if (sys::Status padded = PadStream(0, sizes[0]); !padded)
        return padded;
    for (const Stream& stream : others) {
        const std::uint64_t start = m_file.Size() - kHeaderBytes;
        names.push_back(stream.name);
        sizes.push_back(stream.bytes.size());
        if (sys::Status written = m_file.Write(stream.bytes.data(), stream.bytes.size()); !written)
            return written;
        if (sys::Status padded = PadStream(start, stream.bytes.size()); !padded)
            return padded;
    }
    const Layout layout = PlanLayout(sizes, names.size() + 1);
    if (sys::Status directory = WriteDirectory(layout, names, sizes); !directory)
        return directory;
    if (sys::Status table = WriteAllocationTable(layout); !table)
        return table;
    if (sys::Status difat = WriteDifat(layout); !difat)
        return difat;
    if (sys::Status header = WriteHeader(layout); !header)
        return header;
    return m_file.Close();
}

sys::Status CompoundFileWriter::WriteDirectory(const Layout& layout, const std::vector<std::string>& names,
                                          const std::vector<std::uint64_t>& sizes)
{
    std::vector<DirectoryEntry> entries(1);
    entries[0].name = "Root Entry";
    entries[0].type = 5;
    std::vector<std::uint32_t> order;
    for (size_t i = 0; i < names.size(); ++i) {
        DirectoryEntry entry;
        entry.name = names[i];
        entry.type = 2;
        entry.start = layout.streamStarts[i];
        entry.size = StoredSize(sizes[i]);
        entries.push_back(entry);
        order.push_back(static_cast<std::uint32_t>(i + 1));
    }
    std::sort(order.begin(), order.end(),
              [&](std::uint32_t a, std::uint32_t b) { return EntryNameBefore(entries[a].name, entries[b].name); });
    entries[0].child = LinkTree(entries, order, 0, order.size());
    std::string bytes;
    for (const DirectoryEntry& entry : entries)
        bytes += EntryBytes(entry);
    bytes.resize(static_cast<size_t>(layout.directorySectors) * kSectorBytes, '\0');
    // Unused entries still carry "no sibling, no child".
    for (size_t at = entries.size() * kDirectoryEntryBytes; at < bytes.size(); at += kDirectoryEntryBytes)
        bytes.replace(at, kDirectoryEntryBytes, EntryBytes(DirectoryEntry()));
    return m_file.Write(bytes.data(), bytes.size());
}

// The table is written one sector at a time from the layout, so it is never held whole.
sys::Status CompoundFileWriter::WriteAllocationTable(const Layout& layout)
{
    std::vector<std::pair<std::uint32_t, std::uint32_t>> chains; // first sector, sector count
    for (size_t i = 0; i < layout.streamStarts.size(); ++i)
        chains.emplace_back(layout.streamStarts[i], layout.streamSectors[i]);
    chains.emplace_back(layout.directoryStart, layout.directorySectors);
    auto entryOf = [&](std::uint32_t sector) {
        for (const auto& [first, count] : chains)
            if (sector >= first && sector < first + count)
                return sector + 1 < first + count ? sector + 1 : kEndOfChain;
        if (sector >= layout.tableStart && sector < layout.tableStart + layout.tableSectors)
            return kTableSector;
        if (sector >= layout.difatStart && sector < layout.difatStart + layout.difatSectors)
            return kDifatSector;
        return kFreeSector;
    };
    unsigned char sector[kSectorBytes];
    for (std::uint32_t t = 0; t < layout.tableSectors; ++t) {
        for (std::uint32_t k = 0; k < kEntriesPerTableSector; ++k)
            Store32(sector + 4 * k, entryOf(t * kEntriesPerTableSector + k));
        if (sys::Status written = m_file.Write(sector, sizeof sector); !written)
            return written;
    }
    return sys::Status::Ok();
}

// The table sectors past the header's 109, 127 to a DIFAT sector, each ending with the next.
sys::Status CompoundFileWriter::WriteDifat(const Layout& layout)
{
    unsigned char sector[kSectorBytes];
    for (std::uint32_t d = 0; d < layout.difatSectors; ++d) {
        for (std::uint32_t k = 0; k < kTableSectorsPerDifat; ++k) {
            const std::uint32_t table = kHeaderTableSectors + d * kTableSectorsPerDifat + k;
            Store32(sector + 4 * k, table < layout.tableSectors ? layout.tableStart + table : kFreeSector);
        }
        Store32(sector + 4 * kTableSectorsPerDifat,
                d + 1 < layout.difatSectors ? layout.difatStart + d + 1 : kEndOfChain);
        if (sys::Status written = m_file.Write(sector, sizeof sector); !written)
            return written;
    }
    return sys::Status::Ok();
}

sys::Status CompoundFileWriter::WriteHeader(const Layout& layout)
{
    unsigned char header[kHeaderBytes] = {0xD0, 0xCF, 0x11, 0xE0, 0xA1, 0xB1, 0x1A, 0xE1};
    Store16(header + 24, 0x003E); // minor version
    Store16(header + 26, 3);      // major version: 512-byte sectors
    Store16(header + 28, 0xFFFE); // little-endian
    Store16(header + 30, 9);      // sector size 2^9
    Store16(header + 32, 6);      // mini sector size 2^6
    Store32(header + 44, layout.tableSectors);
    Store32(header + 48, layout.directoryStart);
    Store32(header + 56, kMinStreamBytes);
    Store32(header + 60, kEndOfChain); // no mini table
    Store32(header + 68, layout.difatSectors > 0 ? layout.difatStart : kEndOfChain);
    Store32(header + 72, layout.difatSectors);
    for (std::uint32_t i = 0; i < kHeaderTableSectors; ++i)
        Store32(header + 76 + 4 * i, i < layout.tableSectors ? layout.tableStart + i : kFreeSector);
    return m_file.WriteAt(0, header, sizeof header);
}

} // namespace sheet
