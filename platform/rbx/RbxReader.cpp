#include "platform/rbx/RbxReader.h"

#include "checksums/Crc32.h"
#include "platform/rbx/RbxBytes.h"
#include "platform/rbx/RbxHeaderCodec.h"
#include "platform/system/FileSystem.h"
#include "platform/system/Text.h"

#include <algorithm>
#include <cerrno>
#include <cmath>
#include <cstring>
#include <sys/stat.h>
#include <vector>

namespace rbx {
namespace {

constexpr std::size_t kBlockBytes = 1u << 20;

struct FileCloser {
    void operator()(std::FILE* f) const { std::fclose(f); }
};

// Where one value column lies in a record.
struct Column {
    std::size_t offset;
    int dataType;
};

template <typename T>
void DecodeUniform(const unsigned char* record, std::size_t count, double* out)
{
    const unsigned char* p = record + 8;
    for (std::size_t v = 0; v < count; ++v, p += sizeof(T)) {
        T value;
        std::memcpy(&value, p, sizeof(T));
        out[v] = static_cast<double>(value);
    }
}

} // namespace

struct CRbxReader::State {
    std::unique_ptr<std::FILE, FileCloser> file;
    CString path;
    std::uint64_t fileSize = 0;
    std::uint32_t headerSize = 0;
    FileHeader header;
    std::vector<Column> columns;
    std::vector<unsigned char> block;
    std::uint64_t stepsRead = 0;
    bool verifyAtEnd = false;
    std::uint32_t crc = 0;
    bool hasLastTime = false;
    double lastTime = 0.0;
};

CRbxReader::CRbxReader() = default;
CRbxReader::~CRbxReader() = default;

bool CRbxReader::IsOpen() const { return m_state && m_state->file; }

const FileHeader& CRbxReader::Header() const
{
    static const FileHeader empty;
    return m_state ? m_state->header : empty;
}

std::uint64_t CRbxReader::StepsRead() const { return m_state ? m_state->stepsRead : 0; }

bool CRbxReader::AtEnd() const { return !IsOpen() || m_state->stepsRead >= m_state->header.axis.steps; }

void CRbxReader::Close() { m_state.reset(); }

bool CRbxReader::Fail(const CString& what)
{
    m_status = sys::Status::Fail(m_state ? m_state->path : CString(), 0, what);
    if (m_state)
        m_state->file.reset();
    return false;
}

sys::Status CRbxReader::Open(const CString& path, VerifyChecksum verify)
{
    m_status = sys::Status::Ok();
    OpenFile(path, verify);
    return m_status;
}

bool CRbxReader::OpenFile(const CString& path, VerifyChecksum verify)
{
    m_state = std::make_unique<State>();
    m_state->path = path;
    State& s = *m_state;
    std::string problem;
    s.file.reset(sys::OpenRegularFile(path, problem));
    struct stat info {};
    if (!s.file)
        return Fail(problem);
    if (fstat(fileno(s.file.get()), &info) != 0)
        return Fail("cannot examine the file");
    s.fileSize = static_cast<std::uint64_t>(info.st_size);
    return ReadHeader(verify);
}

bool CRbxReader::ReadHeader(VerifyChecksum verify)
{
    State& s = *m_state;
    CString problem;
    unsigned char fixed[kFixedHeaderSize];
    const std::size_t got = std::fread(fixed, 1, sizeof fixed, s.file.get());
    if (!DecodeFixedPart(fixed, got, s.headerSize, problem))
        return Fail(problem);
    if (s.headerSize > s.fileSize)
        return Fail(text::Format("the file is truncated inside its header (%u header bytes, %llu in the file)", s.headerSize,
                                 static_cast<unsigned long long>(s.fileSize)));
    std::vector<unsigned char> bytes(s.headerSize);
    std::memcpy(bytes.data(), fixed, kFixedHeaderSize);
    const std::size_t rest = s.headerSize - kFixedHeaderSize;
    if (std::fread(bytes.data() + kFixedHeaderSize, 1, rest, s.file.get()) != rest)
        return Fail("cannot read the header");
    if (!DecodeHeader(bytes.data(), bytes.size(), s.fileSize, s.header, problem))
        return Fail(problem);

    std::size_t offset = 8;
    for (const ItemInfo& item : s.header.items) {
        for (std::uint32_t e = 0; e < item.elementCount; ++e, offset += DataTypeSize(item.dataType))
            s.columns.push_back({offset, item.dataType});
    }
    const std::uint64_t dataBytes = s.fileSize - s.headerSize;
    const bool atOpen = verify == VerifyChecksum::AtOpen || (verify == VerifyChecksum::Auto && dataBytes <= kVerifyAtOpenLimit);
    if (atOpen || dataBytes == 0)
        return VerifyDataChecksum();
    s.verifyAtEnd = true;
    return true;
}

bool CRbxReader::VerifyDataChecksum()
{
    State& s = *m_state;
    std::vector<unsigned char> chunk(std::min<std::uint64_t>(kBlockBytes, s.fileSize - s.headerSize));
    std::uint32_t crc = 0;
    std::uint64_t left = s.fileSize - s.headerSize;
    while (left > 0) {
        const std::size_t n = static_cast<std::size_t>(std::min<std::uint64_t>(left, chunk.size()));
        if (std::fread(chunk.data(), 1, n, s.file.get()) != n)
            return Fail("cannot read the data");
        crc = checksum::Crc32(crc, chunk.data(), n);
        left -= n;
    }
    if (crc != s.header.dataChecksum)
        return Fail("the data checksum does not match (the data are damaged)");
    if (std::fseek(s.file.get(), static_cast<long>(s.headerSize), SEEK_SET) != 0)
        return Fail("cannot return to the first time step");
    return true;
}

bool CRbxReader::CheckTimes(const unsigned char* records, std::size_t count)
{
    State& s = *m_state;
    const std::uint32_t size = s.header.recordSize;
    for (std::size_t i = 0; i < count; ++i) {
        const double time = bytes::Get<double>(records + i * size);
        if (!std::isfinite(time) || (s.hasLastTime && !(time > s.lastTime))) {
            const std::uint64_t step = s.stepsRead + i;
            return Fail(text::Format("the time of step %llu (offset %llu) is %s", static_cast<unsigned long long>(step + 1),
                                     static_cast<unsigned long long>(s.headerSize + step * size),
                                     std::isfinite(time) ? "not after the time before it" : "not a number"));
        }
        s.lastTime = time;
        s.hasLastTime = true;
    }
    return true;
}

bool CRbxReader::ReadRecords(std::size_t count, unsigned char* records)
{
    State& s = *m_state;
    const std::size_t bytesWanted = count * s.header.recordSize;
    if (std::fread(records, 1, bytesWanted, s.file.get()) != bytesWanted)
        return Fail(text::Format("the file ends early at step %llu", static_cast<unsigned long long>(s.stepsRead + 1)));
    if (!CheckTimes(records, count))
        return false;
    s.stepsRead += count;
    if (s.verifyAtEnd) {
        s.crc = checksum::Crc32(s.crc, records, bytesWanted);
        if (s.stepsRead == s.header.axis.steps && s.crc != s.header.dataChecksum)
            return Fail("the data checksum does not match (the data are damaged)");
    }
    return true;
}

bool CRbxReader::ReadRawSteps(std::size_t maxSteps, unsigned char* records, std::size_t& stepsRead)
{
    stepsRead = 0;
    if (!IsOpen())
        return false;
    const std::uint64_t left = m_state->header.axis.steps - m_state->stepsRead;
    const auto count = static_cast<std::size_t>(std::min<std::uint64_t>(maxSteps, left));
    if (count == 0)
        return true;
    if (!ReadRecords(count, records))
        return false;
    stepsRead = count;
    return true;
}

bool CRbxReader::ReadSteps(std::size_t maxSteps, double* times, double* values, std::size_t& stepsRead)
{
    stepsRead = 0;
    if (!IsOpen())
        return false;
    State& s = *m_state;
    const std::uint32_t size = s.header.recordSize;
    const std::size_t valueCount = s.columns.size();
    const std::size_t blockSteps = std::max<std::size_t>(1, kBlockBytes / size);
    const int uniformType = s.header.dataType;
    while (stepsRead < maxSteps) {
        std::size_t got = 0;
        const std::size_t want = std::min(blockSteps, maxSteps - stepsRead);
        s.block.resize(std::min<std::uint64_t>(want, s.header.axis.steps - s.stepsRead) * size);
        if (!ReadRawSteps(want, s.block.data(), got))
            return false;
        if (got == 0)
            break;
        for (std::size_t i = 0; i < got; ++i) {
            const unsigned char* record = s.block.data() + i * size;
            double* out = values + (stepsRead + i) * valueCount;
            times[stepsRead + i] = bytes::Get<double>(record);
            if (uniformType == kFloat32)
                DecodeUniform<float>(record, valueCount, out);
            else if (uniformType == kFloat64)
                DecodeUniform<double>(record, valueCount, out);
            else
                for (std::size_t v = 0; v < valueCount; ++v)
                    out[v] = DecodeValue(s.columns[v].dataType, record + s.columns[v].offset);
        }
        stepsRead += got;
    }
    return true;
}

} // namespace rbx
