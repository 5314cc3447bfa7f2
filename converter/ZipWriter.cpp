#include "converter/ZipWriter.h"

#include "platform/rbx/Crc32.h"

#include <zlib.h>

#include <algorithm>
#include <cerrno>
#include <cstring>
#include <ctime>
#include <fcntl.h>
#include <unistd.h>

namespace converter {

namespace {

constexpr std::uint64_t kZipLimit = 0xFFFFFFFFu;
constexpr size_t kLocalHeaderBytes = 30;
constexpr size_t kCentralHeaderBytes = 46;
constexpr size_t kStoredBlockHeaderBytes = 5;
constexpr std::uint16_t kVersionNeeded = 20; // deflate
constexpr std::uint16_t kDeflated = 8;

void Put16(std::string& out, std::uint32_t value)
{
    out += static_cast<char>(value & 0xFF);
    out += static_cast<char>((value >> 8) & 0xFF);
}

void Put32(std::string& out, std::uint32_t value)
{
    Put16(out, value & 0xFFFF);
    Put16(out, value >> 16);
}

void Put32At(unsigned char* out, std::uint32_t value)
{
    for (int i = 0; i < 4; ++i)
        out[i] = static_cast<unsigned char>(value >> (8 * i));
}

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

ZipWriter::ZipWriter(size_t bufferBytes) : m_zip(std::make_unique<z_stream>()), m_out(std::max<size_t>(bufferBytes, 1)) {}

ZipWriter::~ZipWriter()
{
    if (m_zipReady)
        deflateEnd(m_zip.get());
    if (m_fd >= 0)
        ::close(m_fd);
}

Status ZipWriter::Fail(const std::string& message)
{
    m_failed = true;
    return Status::Fail(m_path, 0, message);
}

Status ZipWriter::WriteError(const char* what)
{
    return Fail(std::string(what) + ": " + std::strerror(errno));
}

Status ZipWriter::Open(const std::string& path)
{
    m_path = path;
    m_fd = ::open(path.c_str(), O_WRONLY | O_CREAT | O_TRUNC | O_CLOEXEC, 0666);
    if (m_fd < 0)
        return WriteError("cannot create the file");
    *m_zip = z_stream{};
    // Negative window bits: raw deflate, the zip entry carries its own CRC and sizes.
    if (deflateInit2(m_zip.get(), kLevel, Z_DEFLATED, -15, 8, Z_DEFAULT_STRATEGY) != Z_OK)
        return Fail("cannot start the compressor");
    m_zipReady = true;
    DosNow(m_dosTime, m_dosDate);
    return Status::Ok();
}

Status ZipWriter::AddEntry(const std::string& name, std::string_view data)
{
    if (Status begun = BeginEntry(name); !begun)
        return begun;
    if (Status appended = Append(data); !appended)
        return appended;
    return EndEntry();
}

Status ZipWriter::BeginEntry(const std::string& name, std::string_view head)
{
    if (m_failed || m_fd < 0)
        return Fail("the package is not open for writing");
    if (m_streaming)
        return Fail("the part " + m_current.name + " is still being written");
    if (head.size() > 0xFFFF || name.size() > 0xFFFF)
        return Fail("the part " + name + " has a name or head too long for a zip entry");
    m_current = Entry{name, m_written};
    m_streaming = true;
    m_head = head;
    m_restCrc = 0;
    if (deflateReset(m_zip.get()) != Z_OK)
        return Fail("cannot restart the compressor");
    if (Status header = WriteLocalHeader(m_current); !header)
        return header;
    if (!head.empty()) {
        // A stored block that is not the last: its bytes appear in the file as they are.
        std::string block;
        block += '\0';
        Put16(block, static_cast<std::uint32_t>(head.size()));
        Put16(block, static_cast<std::uint32_t>(~head.size() & 0xFFFF));
        if (Status out = Output(block.data(), block.size()); !out)
            return out;
        m_headOffset = m_written;
        if (Status out = Output(head.data(), head.size()); !out)
            return out;
    }
    return Status::Ok();
}

Status ZipWriter::Append(std::string_view data)
{
    if (m_failed || !m_streaming)
        return Fail("no part is open for writing");
    if (m_head.size() + m_zip->total_in + data.size() > kZipLimit)
        return Fail("the part " + m_current.name +
                    " passes 4 GiB, more than a zip package without 64-bit sizes holds");
    m_restCrc = rbx::Crc32(m_restCrc, data.data(), data.size());
    return Deflate(data, Z_NO_FLUSH);
}

Status ZipWriter::Deflate(std::string_view data, int flush)
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
            if (m_outUsed == m_out.size())
                if (Status flushed = FlushOutput(); !flushed)
                    return flushed;
            m_zip->next_out = m_out.data() + m_outUsed;
            m_zip->avail_out = static_cast<uInt>(m_out.size() - m_outUsed);
            result = deflate(m_zip.get(), mode);
            if (result == Z_STREAM_ERROR)
                return Fail("the compressor failed on the part " + m_current.name);
            const size_t produced = m_out.size() - m_outUsed - m_zip->avail_out;
            m_outUsed += produced;
            m_written += produced;
        } while (m_zip->avail_in > 0 || m_zip->avail_out == 0 || (mode == Z_FINISH && result != Z_STREAM_END));
        done += piece;
        if (last)
            return Status::Ok();
    }
}

Status ZipWriter::EndEntry(std::string_view finalHead)
{
    if (m_failed || !m_streaming)
        return Fail("no part is open for writing");
    if (!finalHead.empty() && finalHead.size() != m_head.size())
        return Fail("the head of the part " + m_current.name + " changed its length");
    if (Status finished = Deflate({}, Z_FINISH); !finished)
        return finished;
    if (!finalHead.empty()) {
        if (Status patched = WriteAt(m_headOffset, finalHead.data(), finalHead.size()); !patched)
            return patched;
        m_head = finalHead;
    }
    const std::uint32_t headCrc = rbx::Crc32(0, m_head.data(), m_head.size());
    m_current.crc = static_cast<std::uint32_t>(crc32_combine(headCrc, m_restCrc, static_cast<z_off_t>(m_zip->total_in)));
    m_current.size = m_head.size() + m_zip->total_in;
    m_current.packedSize = (m_head.empty() ? 0 : kStoredBlockHeaderBytes + m_head.size()) + m_zip->total_out;
    m_streaming = false;
    if (m_current.packedSize > kZipLimit || m_current.headerOffset > kZipLimit)
        return Fail("the package passes 4 GiB at the part " + m_current.name +
                    ", more than a zip package without 64-bit sizes holds");
    if (Status patched = PatchLocalHeader(m_current); !patched)
        return patched;
    m_entries.push_back(m_current);
    return Status::Ok();
}

Status ZipWriter::WriteLocalHeader(const Entry& entry)
{
    std::string header;
    Put32(header, 0x04034b50);
    Put16(header, kVersionNeeded);
    Put16(header, 0); // flags: sizes are in this header, not in a descriptor after the data
    Put16(header, kDeflated);
    Put16(header, m_dosTime);
    Put16(header, m_dosDate);
    Put32(header, 0); // CRC and sizes, filled in by PatchLocalHeader
    Put32(header, 0);
    Put32(header, 0);
    Put16(header, static_cast<std::uint32_t>(entry.name.size()));
    Put16(header, 0);
    header += entry.name;
    return Output(header.data(), header.size());
}

Status ZipWriter::PatchLocalHeader(const Entry& entry)
{
    unsigned char fields[12];
    Put32At(fields, entry.crc);
    Put32At(fields + 4, static_cast<std::uint32_t>(entry.packedSize));
    Put32At(fields + 8, static_cast<std::uint32_t>(entry.size));
    return WriteAt(entry.headerOffset + 14, fields, sizeof fields);
}

Status ZipWriter::Close()
{
    if (m_failed || m_fd < 0)
        return Fail("the package is not open for writing");
    if (m_streaming)
        return Fail("the part " + m_current.name + " was not completed");
    const std::uint64_t directoryOffset = m_written;
    std::string directory;
    for (const Entry& entry : m_entries) {
        Put32(directory, 0x02014b50);
        Put16(directory, kVersionNeeded); // made by: MS-DOS attributes, zip 2.0
        Put16(directory, kVersionNeeded);
        Put16(directory, 0);
        Put16(directory, kDeflated);
        Put16(directory, m_dosTime);
        Put16(directory, m_dosDate);
        Put32(directory, entry.crc);
        Put32(directory, static_cast<std::uint32_t>(entry.packedSize));
        Put32(directory, static_cast<std::uint32_t>(entry.size));
        Put16(directory, static_cast<std::uint32_t>(entry.name.size()));
        Put16(directory, 0); // extra
        Put16(directory, 0); // comment
        Put16(directory, 0); // disk
        Put16(directory, 0); // internal attributes
        Put32(directory, 0); // external attributes
        Put32(directory, static_cast<std::uint32_t>(entry.headerOffset));
        directory += entry.name;
    }
    if (m_entries.size() > 0xFFFF || directoryOffset + directory.size() > kZipLimit)
        return Fail("the package passes 4 GiB or 65,535 parts, more than a zip package without 64-bit sizes holds");
    std::string end;
    Put32(end, 0x06054b50);
    Put16(end, 0);
    Put16(end, 0);
    Put16(end, static_cast<std::uint32_t>(m_entries.size()));
    Put16(end, static_cast<std::uint32_t>(m_entries.size()));
    Put32(end, static_cast<std::uint32_t>(directory.size()));
    Put32(end, static_cast<std::uint32_t>(directoryOffset));
    Put16(end, 0);
    directory += end;
    if (Status out = Output(directory.data(), directory.size()); !out)
        return out;
    if (Status flushed = FlushOutput(); !flushed)
        return flushed;
    const int fd = m_fd;
    m_fd = -1;
    if (::close(fd) != 0)
        return WriteError("write error");
    return Status::Ok();
}

Status ZipWriter::Output(const void* data, size_t size)
{
    const auto* bytes = static_cast<const unsigned char*>(data);
    while (size > 0) {
        if (m_outUsed == m_out.size())
            if (Status flushed = FlushOutput(); !flushed)
                return flushed;
        const size_t piece = std::min(size, m_out.size() - m_outUsed);
        std::memcpy(m_out.data() + m_outUsed, bytes, piece);
        m_outUsed += piece;
        m_written += piece;
        bytes += piece;
        size -= piece;
    }
    return Status::Ok();
}

Status ZipWriter::FlushOutput()
{
    size_t done = 0;
    while (done < m_outUsed) {
        const ssize_t wrote = ::write(m_fd, m_out.data() + done, m_outUsed - done);
        if (wrote < 0 && errno == EINTR)
            continue;
        if (wrote <= 0)
            return WriteError("write error");
        done += static_cast<size_t>(wrote);
    }
    m_outUsed = 0;
    return Status::Ok();
}

Status ZipWriter::WriteAt(std::uint64_t offset, const void* data, size_t size)
{
    // Bytes before the buffer are in the file already; the rest are still in the buffer.
    const std::uint64_t buffered = m_written - m_outUsed;
    const auto* bytes = static_cast<const unsigned char*>(data);
    size_t done = 0;
    while (offset + done < buffered && done < size) {
        const size_t piece = static_cast<size_t>(std::min<std::uint64_t>(size - done, buffered - offset - done));
        const ssize_t wrote = ::pwrite(m_fd, bytes + done, piece, static_cast<off_t>(offset + done));
        if (wrote < 0 && errno == EINTR)
            continue;
        if (wrote <= 0)
            return WriteError("write error");
        done += static_cast<size_t>(wrote);
    }
    if (done < size)
        std::memcpy(m_out.data() + (offset + done - buffered), bytes + done, size - done);
    return Status::Ok();
}

} // namespace converter
