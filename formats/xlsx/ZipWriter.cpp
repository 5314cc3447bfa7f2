#include "formats/xlsx/ZipWriter.h"

#include "checksums/Crc32.h"
#include "formats/workbook/LittleEndian.h"

#include <zlib.h>

#include <algorithm>
#include <cstring>
#include <ctime>

namespace sheet {

namespace {

constexpr std::uint64_t kZipLimit = 0xFFFFFFFFu;
constexpr size_t kStoredBlockHeaderBytes = 5;
constexpr std::uint16_t kVersionNeeded = 20; // deflate
constexpr std::uint16_t kDeflated = 8;

using sheet::Append16;
using sheet::Append32;

// Zip packages carry local wall-clock time in the MS-DOS form, to two seconds.
void DosNow(std::uint16_t& time, std::uint16_t& date)
{
    const std::time_t now = std::time(nullptr);
    std::tm local{};
    localtime_r(&now, &local);
    const int year = std::clamp(local.tm_year + 1900, 1980, 2107);
    time = static_cast<std::uint16_t>((local.tm_hour << 11) | (local.tm_min << 5) | (local.tm_sec / 2));
    date = static_cast<std::uint16_t>(((year - 1980) << 9) | ((local.tm_mon + 1) << 5) | local.tm_mday);
}

} // namespace

ZipWriter::ZipWriter(size_t bufferBytes) : m_file(bufferBytes), m_zip(std::make_unique<z_stream>()) {}

ZipWriter::~ZipWriter()
{
    if (m_zipReady)
        deflateEnd(m_zip.get());
}

sys::Status ZipWriter::Failed(sys::Status status)
{
    if (!status)
        m_failed = true;
    return status;
}

sys::Status ZipWriter::Fail(const std::string& message)
{
    return Failed(m_file.Fail(message));
}

sys::Status ZipWriter::Output(const void* data, size_t size)
{
    return Failed(m_file.Write(data, size));
}

sys::Status ZipWriter::WriteAt(std::uint64_t offset, const void* data, size_t size)
{
    return Failed(m_file.WriteAt(offset, data, size));
}

sys::Status ZipWriter::Open(const std::string& path)
{
    if (sys::Status opened = Failed(m_file.Open(path)); !opened)
        return opened;
    *m_zip = z_stream{};
    // Negative window bits: raw deflate, the zip entry carries its own CRC and sizes.
    if (deflateInit2(m_zip.get(), kLevel, Z_DEFLATED, -15, 8, Z_DEFAULT_STRATEGY) != Z_OK)
        return Fail("cannot start the compressor");
    m_zipReady = true;
    DosNow(m_dosTime, m_dosDate);
    return sys::Status::Ok();
}

sys::Status ZipWriter::AddEntry(const std::string& name, std::string_view data)
{
    if (sys::Status begun = BeginEntry(name); !begun)
        return begun;
    if (sys::Status appended = Append(data); !appended)
        return appended;
    return EndEntry();
}

sys::Status ZipWriter::BeginEntry(const std::string& name, std::string_view head)
{
    if (m_failed || !m_file.IsOpen())
        return Fail("the package is not open for writing");
    if (m_streaming)
        return Fail("the part " + m_current.name + " is still being written");
    if (head.size() > 0xFFFF || name.size() > 0xFFFF)
        return Fail("the part " + name + " has a name or head too long for a zip entry");
    m_current = Entry{name, m_file.Size()};
    m_streaming = true;
    m_head = head;
    m_restCrc = 0;
    if (deflateReset(m_zip.get()) != Z_OK)
        return Fail("cannot restart the compressor");
    if (sys::Status header = WriteLocalHeader(m_current); !header)
        return header;
    if (!head.empty()) {
        // A stored block that is not the last: its bytes appear in the file as they are.
        std::string block;
        block += '\0';
        Append16(block, static_cast<std::uint32_t>(head.size()));
        Append16(block, static_cast<std::uint32_t>(~head.size() & 0xFFFF));
        if (sys::Status out = Output(block.data(), block.size()); !out)
            return out;
        m_headOffset = m_file.Size();
        if (sys::Status out = Output(head.data(), head.size()); !out)
            return out;
    }
    return sys::Status::Ok();
}

sys::Status ZipWriter::Append(std::string_view data)
{
    if (m_failed || !m_streaming)
        return Fail("no part is open for writing");
    if (m_head.size() + m_zip->total_in + data.size() > kZipLimit)
        return Fail("the part " + m_current.name +
                    " passes 4 GiB, more than a zip package without 64-bit sizes holds");
    m_restCrc = checksum::Crc32(m_restCrc, data.data(), data.size());
    return Deflate(data, Z_NO_FLUSH);
}

sys::Status ZipWriter::Deflate(std::string_view data, int flush)
{
    // zlib counts input in 32-bit lengths.
    constexpr size_t kPiece = 1u << 30;
    size_t done = 0;
    for (;;) {
        const size_t piece = std::min(kPiece, data.size() - done);
        const bool last = done + piece == data.size();
        m_zip->next_in = reinterpret_cast<Bytef*>(const_cast<char*>(data.data() + done));
        m_zip->avail_in = static_cast<uInt>(piece);
        const int mode = last ? flush : Z_NO_FLUSH;
        int result = Z_OK;
        do {
            unsigned char* room = nullptr;
            size_t roomSize = 0;
            if (sys::Status free = Failed(m_file.Room(room, roomSize)); !free)
                return free;
            m_zip->next_out = room;
            m_zip->avail_out = static_cast<uInt>(roomSize);
            const size_t offered = m_zip->avail_out;
            result = deflate(m_zip.get(), mode);
            if (result == Z_STREAM_ERROR)
                return Fail("the compressor failed on the part " + m_current.name);
            m_file.Used(offered - m_zip->avail_out);
        } while (m_zip->avail_in > 0 || m_zip->avail_out == 0 || (mode == Z_FINISH && result != Z_STREAM_END));
        done += piece;
        if (last)
            return sys::Status::Ok();
    }
}

sys::Status ZipWriter::EndEntry(std::string_view finalHead)
{
    if (m_failed || !m_streaming)
        return Fail("no part is open for writing");
    if (!finalHead.empty() && finalHead.size() != m_head.size())
        return Fail("the head of the part " + m_current.name + " changed its length");
    if (sys::Status finished = Deflate({}, Z_FINISH); !finished)
        return finished;
    if (!finalHead.empty()) {
        if (sys::Status patched = WriteAt(m_headOffset, finalHead.data(), finalHead.size()); !patched)
            return patched;
        m_head = finalHead;
    }
    const std::uint32_t headCrc = checksum::Crc32(0, m_head.data(), m_head.size());
    m_current.crc = static_cast<std::uint32_t>(crc32_combine(headCrc, m_restCrc, static_cast<z_off_t>(m_zip->total_in)));
    m_current.size = m_head.size() + m_zip->total_in;
    m_current.packedSize = (m_head.empty() ? 0 : kStoredBlockHeaderBytes + m_head.size()) + m_zip->total_out;
    m_streaming = false;
    if (m_current.packedSize > kZipLimit || m_current.headerOffset > kZipLimit)
        return Fail("the package passes 4 GiB at the part " + m_current.name +
                    ", more than a zip package without 64-bit sizes holds");
    if (sys::Status patched = PatchLocalHeader(m_current); !patched)
        return patched;
    m_entries.push_back(m_current);
    return sys::Status::Ok();
}

sys::Status ZipWriter::WriteLocalHeader(const Entry& entry)
{
    std::string header;
    Append32(header, 0x04034b50);
    Append16(header, kVersionNeeded);
    Append16(header, 0); // flags: sizes are in this header, not in a descriptor after the data
    Append16(header, kDeflated);
    Append16(header, m_dosTime);
    Append16(header, m_dosDate);
    Append32(header, 0); // CRC and sizes, filled in by PatchLocalHeader
    Append32(header, 0);
    Append32(header, 0);
    Append16(header, static_cast<std::uint32_t>(entry.name.size()));
    Append16(header, 0);
    header += entry.name;
    return Output(header.data(), header.size());
}

sys::Status ZipWriter::PatchLocalHeader(const Entry& entry)
{
    unsigned char fields[12];
    sheet::Store32(fields, entry.crc);
    sheet::Store32(fields + 4, static_cast<std::uint32_t>(entry.packedSize));
    sheet::Store32(fields + 8, static_cast<std::uint32_t>(entry.size));
    return WriteAt(entry.headerOffset + 14, fields, sizeof fields);
}

sys::Status ZipWriter::Close()
{
    if (m_failed || !m_file.IsOpen())
        return Fail("the package is not open for writing");
    if (m_streaming)
        return Fail("the part " + m_current.name + " was not completed");
    const std::uint64_t directoryOffset = m_file.Size();
    std::string directory;
    for (const Entry& entry : m_entries) {
        Append32(directory, 0x02014b50);
        Append16(directory, kVersionNeeded); // made by: MS-DOS attributes, zip 2.0
        Append16(directory, kVersionNeeded);
        Append16(directory, 0);
        Append16(directory, kDeflated);
        Append16(directory, m_dosTime);
        Append16(directory, m_dosDate);
        Append32(directory, entry.crc);
        Append32(directory, static_cast<std::uint32_t>(entry.packedSize));
        Append32(directory, static_cast<std::uint32_t>(entry.size));
        Append16(directory, static_cast<std::uint32_t>(entry.name.size()));
        Append16(directory, 0); // extra
        Append16(directory, 0); // comment
        Append16(directory, 0); // disk
        Append16(directory, 0); // internal attributes
        Append32(directory, 0); // external attributes
        Append32(directory, static_cast<std::uint32_t>(entry.headerOffset));
        directory += entry.name;
    }
    if (m_entries.size() > 0xFFFF || directoryOffset + directory.size() > kZipLimit)
        return Fail("the package passes 4 GiB or 65,535 parts, more than a zip package without 64-bit sizes holds");
    std::string end;
    Append32(end, 0x06054b50);
    Append16(end, 0);
    Append16(end, 0);
    Append16(end, static_cast<std::uint32_t>(m_entries.size()));
    Append16(end, static_cast<std::uint32_t>(m_entries.size()));
    Append32(end, static_cast<std::uint32_t>(directory.size()));
    Append32(end, static_cast<std::uint32_t>(directoryOffset));
    Append16(end, 0);
    directory += end;
    if (sys::Status out = Output(directory.data(), directory.size()); !out)
        return out;
    return Failed(m_file.Close());
}

} // namespace sheet
