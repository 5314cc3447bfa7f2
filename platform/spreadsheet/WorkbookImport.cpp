#include "platform/spreadsheet/WorkbookImport.h"

#include "platform/system/FileSystem.h"

#include <algorithm>
#include <array>
#include <cstring>
#include <fstream>

namespace sheet {

namespace {

constexpr std::array<unsigned char, 4> kZipMagic = {'P', 'K', 3, 4};
constexpr std::array<unsigned char, 8> kCompoundFileMagic = {0xD0, 0xCF, 0x11, 0xE0, 0xA1, 0xB1, 0x1A, 0xE1};

std::uint32_t Read32(const unsigned char* p)
{
    return static_cast<std::uint32_t>(p[0]) | static_cast<std::uint32_t>(p[1]) << 8 |
           static_cast<std::uint32_t>(p[2]) << 16 | static_cast<std::uint32_t>(p[3]) << 24;
}

std::uint16_t Read16(const unsigned char* p)
{
    return static_cast<std::uint16_t>(p[0] | p[1] << 8);
}

std::vector<unsigned char> ReadAt(std::ifstream& in, std::uint64_t offset, size_t length)
{
    std::vector<unsigned char> bytes(length);
    in.clear();
    in.seekg(static_cast<std::streamoff>(offset));
    in.read(reinterpret_cast<char*>(bytes.data()), static_cast<std::streamsize>(length));
    bytes.resize(static_cast<size_t>(in.gcount()));
    return bytes;
}

} // namespace

AutomationError OpenError(const std::string& path, const std::string& why)
{
    return AutomationError("Cannot open " + path + ": " + why);
}

StyleTable::StyleTable()
{
    Clear();
}

const NumberFormat& StyleTable::Format(unsigned style) const
{
    return style < m_formats.size() ? m_formats[style] : m_formats[0];
}

unsigned StyleTable::Add(NumberFormat format)
{
    m_formats.push_back(std::move(format));
    return static_cast<unsigned>(m_formats.size() - 1);
}

void StyleTable::Set(unsigned index, NumberFormat format)
{
    if (index >= m_formats.size())
        m_formats.resize(static_cast<size_t>(index) + 1);
    m_formats[index] = std::move(format);
}

void StyleTable::Clear()
{
    m_formats.assign(1, NumberFormat());
}

WorkbookKind DetectWorkbookKind(const std::string& path)
{
    std::ifstream in(path, std::ios::binary);
    if (!in)
        throw OpenError(path, "the file cannot be read.");
    std::array<unsigned char, 8> head{};
    in.read(reinterpret_cast<char*>(head.data()), head.size());
    size_t got = static_cast<size_t>(in.gcount());
    if (got == 0)
        throw OpenError(path, "the file is empty.");
    if (got >= kZipMagic.size() && std::memcmp(head.data(), kZipMagic.data(), kZipMagic.size()) == 0)
        return WorkbookKind::Xlsx;
    if (got == kCompoundFileMagic.size() && head == kCompoundFileMagic)
        return WorkbookKind::Xls;
    throw OpenError(path, "the file is not a workbook (neither an .xlsx zip package nor an .xls compound file).");
}

void CheckZipDirectory(const std::string& path, const ImportLimits& limits)
{
    std::ifstream in(path, std::ios::binary | std::ios::ate);
    if (!in)
        throw OpenError(path, "the file cannot be read.");
    const std::uint64_t size = static_cast<std::uint64_t>(in.tellg());
    if (size > limits.maxFileBytes)
        throw OpenError(path, "the file is larger than " + std::to_string(limits.maxFileBytes >> 20) + " MiB.");

    // The end-of-directory record sits in the last 22 bytes plus at most a 64 KiB comment.
    const std::uint64_t tailLength = std::min<std::uint64_t>(size, 22 + 65535);
    std::vector<unsigned char> tail = ReadAt(in, size - tailLength, static_cast<size_t>(tailLength));
    long end = -1;
    for (long i = static_cast<long>(tail.size()) - 22; i >= 0; --i)
        if (Read32(&tail[static_cast<size_t>(i)]) == 0x06054b50u) {
            end = i;
            break;
        }
    if (end < 0)
        throw OpenError(path, "the zip package is damaged (no central directory).");
    const unsigned char* eocd = &tail[static_cast<size_t>(end)];
    const std::uint32_t entries = Read16(eocd + 10);
    const std::uint32_t directorySize = Read32(eocd + 12);
    const std::uint32_t directoryOffset = Read32(eocd + 16);
    if (entries == 0xFFFF || directoryOffset == 0xFFFFFFFFu)
        throw OpenError(path, "the zip package uses 64-bit sizes; workbooks that large are not read.");
    if (static_cast<std::uint64_t>(directoryOffset) + directorySize > size)
        throw OpenError(path, "the zip package is damaged (its directory lies outside the file).");

    std::vector<unsigned char> directory = ReadAt(in, directoryOffset, directorySize);
    std::uint64_t total = 0;
    bool hasWorkbookPart = false;
    size_t at = 0;
    for (std::uint32_t n = 0; n < entries; ++n) {
        if (at + 46 > directory.size() || Read32(&directory[at]) != 0x02014b50u)
            throw OpenError(path, "the zip package is damaged (bad directory entry " + std::to_string(n + 1) + ").");
        const unsigned char* entry = &directory[at];
        const size_t nameLength = Read16(entry + 28);
        const size_t extra = static_cast<size_t>(Read16(entry + 30)) + Read16(entry + 32);
        if (at + 46 + nameLength > directory.size())
            throw OpenError(path, "the zip package is damaged (bad directory entry " + std::to_string(n + 1) + ").");
        std::string name(reinterpret_cast<const char*>(entry + 46), nameLength);
        // The unpacking trusts the sizes of the directory entry and of the part's own header
        // alike: both must fit the file and the limits.
        const std::uint64_t localOffset = Read32(entry + 42);
        std::vector<unsigned char> local = ReadAt(in, localOffset, 30);
        if (local.size() < 30 || Read32(local.data()) != 0x04034b50u)
            throw OpenError(path, "the zip package is damaged (the part " + name + " is missing).");
        const std::uint64_t compressed = std::max<std::uint64_t>(Read32(entry + 20), Read32(local.data() + 18));
        const std::uint64_t uncompressed = std::max<std::uint64_t>(Read32(entry + 24), Read32(local.data() + 22));
        if (compressed > size - localOffset)
            throw OpenError(path, "the zip package is damaged (the part " + name + " runs past the end of the file).");
        if (name == "xl/workbook.xml")
            hasWorkbookPart = true;
        if (uncompressed > limits.maxEntryBytes ||
            (uncompressed > (16u << 20) && uncompressed > compressed * limits.maxCompressionRatio))
            throw OpenError(path, "the part " + name + " would unpack to " + std::to_string(uncompressed >> 20) +
                                      " MiB, beyond what a workbook preview reads (a zip bomb?).");
        total += uncompressed;
        if (total > limits.maxUncompressedBytes)
            throw OpenError(path, "the package would unpack to more than " +
                                      std::to_string(limits.maxUncompressedBytes >> 20) + " MiB.");
        at += 46 + nameLength + extra;
    }
    if (!hasWorkbookPart)
        throw OpenError(path, "the zip package holds no workbook (xl/workbook.xml is missing).");
}

void ImportWorkbook(const std::string& path, ImportSink& sink, StyleTable& styles, const ImportLimits& limits)
{
    if (!sys::IsRegularFile(path))
        throw OpenError(path, "the file does not exist.");
    styles.Clear();
    if (DetectWorkbookKind(path) == WorkbookKind::Xlsx)
        ImportXlsx(path, sink, styles, limits);
    else
        ImportXls(path, sink, styles, limits);
}

} // namespace sheet
