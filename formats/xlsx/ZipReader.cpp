#include "formats/xlsx/ZipReader.h"

#include "formats/workbook/LittleEndian.h"

#include <zlib.h>

#include <algorithm>
#include <array>
#include <climits>

namespace sheet {

namespace {

constexpr std::uint32_t kLocalHeaderSignature = 0x04034b50u;
constexpr std::uint32_t kDirectorySignature = 0x02014b50u;
constexpr std::uint32_t kDirectoryEndSignature = 0x06054b50u;
constexpr std::size_t kDirectoryEndSize = 22;
constexpr std::size_t kLocalHeaderSize = 30;
constexpr std::size_t kChunk = 64 * 1024;

std::vector<unsigned char> ReadAt(std::ifstream& in, std::uint64_t offset, std::size_t length)
{
    std::vector<unsigned char> bytes(length);
    in.clear();
    in.seekg(static_cast<std::streamoff>(offset));
    in.read(reinterpret_cast<char*>(bytes.data()), static_cast<std::streamsize>(length));
    bytes.resize(static_cast<std::size_t>(in.gcount()));
    return bytes;
}

// Unpacks one part from its own handle on the file, so parts can be read side by side.
class Part : public ZipReader::PartStream {
public:
    Part(const std::string& path, const ZipReader::Entry& entry, std::uint64_t dataOffset)
        : m_path(path), m_entry(entry), m_in(path, std::ios::binary), m_left(entry.packedSize)
    {
        m_in.seekg(static_cast<std::streamoff>(dataOffset));
        if (!m_in)
            Fail("cannot be read");
        if (entry.method == 8 && inflateInit2(&m_zip, -MAX_WBITS) != Z_OK)
            Fail("cannot be unpacked (out of memory)");
    }

    ~Part() override
    {
        if (m_entry.method == 8)
            inflateEnd(&m_zip);
    }

    std::size_t Read(char* out, std::size_t capacity) override
    {
        if (m_done || capacity == 0)
            return 0;
        capacity = std::min<std::size_t>(capacity, UINT_MAX);
        std::size_t got = m_entry.method == 8 ? Inflate(out, capacity) : Copy(out, capacity);
        m_crc = crc32(m_crc, reinterpret_cast<const Bytef*>(out), static_cast<uInt>(got));
        m_unpacked += got;
        if (m_unpacked > m_entry.size)
            Fail("unpacks to more than the package says");
        if (got == 0)
            Finish();
        return got;
    }

private:
    std::size_t Copy(char* out, std::size_t capacity)
    {
        const std::size_t take = static_cast<std::size_t>(std::min<std::uint64_t>(capacity, m_left));
        if (take == 0)
            return 0;
        if (!m_in.read(out, static_cast<std::streamsize>(take)))
            Fail("is cut short");
        m_left -= take;
        return take;
    }

    std::size_t Inflate(char* out, std::size_t capacity)
    {
        m_zip.next_out = reinterpret_cast<Bytef*>(out);
        m_zip.avail_out = static_cast<uInt>(capacity);
        while (m_zip.avail_out > 0 && !m_streamEnded) {
            if (m_zip.avail_in == 0)
                Refill();
            const int status = inflate(&m_zip, Z_NO_FLUSH);
            if (status == Z_STREAM_END)
                m_streamEnded = true;
            else if (status == Z_BUF_ERROR && m_zip.avail_in == 0 && m_left == 0)
                Fail("is cut short");
            else if (status != Z_OK && status != Z_BUF_ERROR)
                Fail("holds damaged compressed data");
        }
        return capacity - m_zip.avail_out;
    }

    void Refill()
    {
        const std::size_t take = static_cast<std::size_t>(std::min<std::uint64_t>(m_input.size(), m_left));
        if (take > 0 && !m_in.read(reinterpret_cast<char*>(m_input.data()), static_cast<std::streamsize>(take)))
            Fail("is cut short");
        m_left -= take;
        m_zip.next_in = m_input.data();
        m_zip.avail_in = static_cast<uInt>(take);
    }

    void Finish()
    {
        m_done = true;
        if (m_unpacked != m_entry.size)
            Fail("unpacks to " + std::to_string(m_unpacked) + " bytes, not the " + std::to_string(m_entry.size) +
                 " the package says");
        if (m_crc != m_entry.crc)
            Fail("fails its checksum");
    }

    [[noreturn]] void Fail(const std::string& why) const
    {
        throw OpenError(m_path, "the zip package is damaged (the part " + m_entry.name + " " + why + ").");
    }

    std::string m_path;
    ZipReader::Entry m_entry;
    std::ifstream m_in;
    std::uint64_t m_left; // packed bytes not read yet
    std::uint64_t m_unpacked = 0;
    uLong m_crc = crc32(0, nullptr, 0);
    z_stream m_zip{};
    std::array<Bytef, kChunk> m_input{};
    bool m_streamEnded = false;
    bool m_done = false;
};

} // namespace

ZipReader::ZipReader(const std::string& path, const ImportLimits& limits)
    : m_path(path), m_limits(limits), m_in(path, std::ios::binary | std::ios::ate)
{
    if (!m_in)
        throw OpenError(path, "the file cannot be read.");
    m_fileSize = static_cast<std::uint64_t>(m_in.tellg());
    if (m_fileSize > limits.maxFileBytes)
        throw OpenError(path, "the file is larger than " + std::to_string(limits.maxFileBytes >> 20) + " MiB.");
    ReadDirectory();
}

ZipReader::~ZipReader() = default;

void ZipReader::Fail(const std::string& why) const
{
    throw OpenError(m_path, "the zip package is damaged (" + why + ").");
}

void ZipReader::ReadDirectory()
{
    // The end-of-directory record sits in the last 22 bytes plus at most a 64 KiB comment.
    const std::uint64_t tailLength = std::min<std::uint64_t>(m_fileSize, kDirectoryEndSize + 65535);
    std::vector<unsigned char> tail = ReadAt(m_in, m_fileSize - tailLength, static_cast<std::size_t>(tailLength));
    long end = -1;
    for (long i = static_cast<long>(tail.size()) - static_cast<long>(kDirectoryEndSize); i >= 0; --i)
        if (Load32(&tail[static_cast<std::size_t>(i)]) == kDirectoryEndSignature) {
            end = i;
            break;
        }
    if (end < 0)
        Fail("no central directory");
    const unsigned char* eocd = &tail[static_cast<std::size_t>(end)];
    const std::uint32_t count = Load16(eocd + 10);
    const std::uint32_t directorySize = Load32(eocd + 12);
    const std::uint32_t directoryOffset = Load32(eocd + 16);
    if (count == 0xFFFF || directoryOffset == 0xFFFFFFFFu)
        throw OpenError(m_path, "the zip package uses 64-bit sizes; workbooks that large are not read.");
    if (static_cast<std::uint64_t>(directoryOffset) + directorySize > m_fileSize)
        Fail("its directory lies outside the file");

    std::vector<unsigned char> directory = ReadAt(m_in, directoryOffset, directorySize);
    std::uint64_t total = 0;
    std::size_t at = 0;
    for (std::uint32_t n = 0; n < count; ++n) {
        if (at + 46 > directory.size() || Load32(&directory[at]) != kDirectorySignature)
            Fail("bad directory entry " + std::to_string(n + 1));
        const unsigned char* record = &directory[at];
        const std::size_t nameLength = Load16(record + 28);
        const std::size_t extra = static_cast<std::size_t>(Load16(record + 30)) + Load16(record + 32);
        if (at + 46 + nameLength > directory.size())
            Fail("bad directory entry " + std::to_string(n + 1));
        Entry entry;
        entry.name.assign(reinterpret_cast<const char*>(record + 46), nameLength);
        entry.method = Load16(record + 10);
        entry.crc = Load32(record + 16);
        entry.headerOffset = Load32(record + 42);
        // The directory's sizes are the ones unpacking trusts (a part's own header may leave them
        // to a descriptor after the data); the own header's must still fit the file and limits.
        std::vector<unsigned char> local = ReadAt(m_in, entry.headerOffset, kLocalHeaderSize);
        if (local.size() < kLocalHeaderSize || Load32(local.data()) != kLocalHeaderSignature)
            throw OpenError(m_path, "the zip package is damaged (the part " + entry.name + " is missing).");
        entry.packedSize = Load32(record + 20);
        entry.size = Load32(record + 24);
        const std::uint64_t packed = std::max<std::uint64_t>(entry.packedSize, Load32(local.data() + 18));
        const std::uint64_t unpacked = std::max<std::uint64_t>(entry.size, Load32(local.data() + 22));
        if (packed > m_fileSize - entry.headerOffset)
            Fail("the part " + entry.name + " runs past the end of the file");
        if (unpacked > m_limits.maxEntryBytes ||
            (unpacked > (16u << 20) && unpacked > packed * m_limits.maxCompressionRatio))
            throw OpenError(m_path, "the part " + entry.name + " would unpack to " + std::to_string(unpacked >> 20) +
                                        " MiB, beyond what a workbook preview reads (a zip bomb?).");
        total += unpacked;
        if (total > m_limits.maxUncompressedBytes)
            throw OpenError(m_path, "the package would unpack to more than " +
                                        std::to_string(m_limits.maxUncompressedBytes >> 20) + " MiB.");
        m_entries.push_back(std::move(entry));
        at += 46 + nameLength + extra;
    }
}

const ZipReader::Entry* ZipReader::Find(std::string_view name) const
{
    for (const Entry& entry : m_entries)
        if (entry.name == name)
            return &entry;
    return nullptr;
}

std::unique_ptr<ZipReader::PartStream> ZipReader::Open(const Entry& entry)
{
    if (entry.method != 0 && entry.method != 8)
        throw OpenError(m_path, "the part " + entry.name + " is packed with method " + std::to_string(entry.method) +
                                    ", which is not read.");
    std::vector<unsigned char> local = ReadAt(m_in, entry.headerOffset, kLocalHeaderSize);
    if (local.size() < kLocalHeaderSize || Load32(local.data()) != kLocalHeaderSignature)
        throw OpenError(m_path, "the zip package is damaged (the part " + entry.name + " is missing).");
    if (Load16(local.data() + 6) & 1)
        throw OpenError(m_path, "the part " + entry.name + " is encrypted.");
    const std::uint64_t dataOffset = entry.headerOffset + kLocalHeaderSize + Load16(local.data() + 26) + Load16(local.data() + 28);
    if (dataOffset > m_fileSize || entry.packedSize > m_fileSize - dataOffset)
        Fail("the part " + entry.name + " runs past the end of the file");
    return std::make_unique<Part>(m_path, entry, dataOffset);
}

std::string ZipReader::ReadAll(const Entry& entry)
{
    std::unique_ptr<PartStream> part = Open(entry);
    std::string text(static_cast<std::size_t>(entry.size), '\0');
    std::size_t at = 0;
    while (at < text.size()) {
        const std::size_t got = part->Read(text.data() + at, text.size() - at);
        if (got == 0)
            break;
        at += got;
    }
    char probe;
    if (part->Read(&probe, 1) != 0 || at != text.size()) // reaches the end, where size and CRC are checked
        Fail("the part " + entry.name + " unpacks to other than the package says");
    return text;
}

} // namespace sheet
