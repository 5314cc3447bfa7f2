#include "platform/rbx/RbxWriter.h"

#include "checksums/Crc32.h"
#include "platform/rbx/RbxHeaderCodec.h"
#include "platform/rbx/RbxValueCodec.h"
#include "platform/system/Text.h"
#include "platform/units/Units.h"

#include <algorithm>
#include <cerrno>
#include <cmath>
#include <cstring>

namespace rbx {
namespace {

constexpr std::size_t kFlushBytes = 1u << 20;
// Steps that differ by less than this share of the first step still count as equal: times made
// from calendar stamps carry rounding noise.
constexpr double kStepTolerance = 1e-9;

struct FileCloser {
    void operator()(std::FILE* f) const { std::fclose(f); }
};

bool SameDeleteValue(double a, double b) { return a == b || (std::isnan(a) && std::isnan(b)); }

int ChooseFileType(const std::vector<ItemInfo>& items)
{
    for (const ItemInfo& item : items)
        if (!SameDeleteValue(item.deleteValue, items.front().deleteValue))
            return kPerItemDeleteValue;
    return kSharedDeleteValue;
}

CString CheckItem(const ItemInfo& item)
{
    if (!IsValidDataType(item.dataType))
        return text::Format("unknown data type %d", item.dataType);
    if (item.axisType == kScalarItem && item.elementCount != 1)
        return "a scalar item has exactly one value per step";
    if (item.axisType == kProfileItem && (item.elementCount < 1 || item.elementCount > kMaxElementsPerItem))
        return text::Format("a profile item has 1 to %u values per step", kMaxElementsPerItem);
    if (item.axisType != kScalarItem && item.axisType != kProfileItem)
        return text::Format("unknown item axis type %d", item.axisType);
    if (item.name.size() > kMaxTextLength || item.itemTypeText.size() > kMaxTextLength
        || item.unitText.size() > kMaxTextLength)
        return "a text is longer than 65535 bytes";
    unsigned char scratch[8];
    if (!std::isnan(item.deleteValue) && !EncodeValue(item.dataType, item.deleteValue, scratch))
        return text::Format("the delete value %g does not fit the data type %d", item.deleteValue, item.dataType);
    if (std::isnan(item.deleteValue) && item.dataType != kFloat32 && item.dataType != kFloat64)
        return "an integer or character item needs a numeric delete value";
    return {};
}

} // namespace

struct CRbxWriter::State {
    std::unique_ptr<std::FILE, FileCloser> file;
    CString path;
    FileHeader header;
    std::vector<unsigned char> headerBytes;
    // Records waiting to be written: `used` bytes of room for kFlushBytes and one record more.
    std::unique_ptr<unsigned char[]> buffer;
    std::size_t used = 0;
    std::vector<unsigned char> packed;
    // Every item is 64-bit floating point, so a step's values go into the record as they are,
    // each gap as its item's delete value (one per value).
    bool allFloat64 = false;
    std::vector<double> deleteValues;
    std::uint32_t crc = 0;
    std::uint64_t steps = 0;
    double firstTime = 0.0;
    double lastTime = 0.0;
    double firstStep = 0.0;
    bool equidistant = true;
    bool calendar = false;
    std::optional<COleDateTime> calendarStart;
    double secondsPerUnit = 1.0;
    bool failed = false;
};

CRbxWriter::CRbxWriter() = default;

CRbxWriter::~CRbxWriter()
{
    if (IsOpen())
        Close();
}

bool CRbxWriter::IsOpen() const { return m_state && m_state->file; }
std::size_t CRbxWriter::ValueCount() const { return m_state ? m_state->header.ValueCount() : 0; }
std::uint32_t CRbxWriter::RecordSize() const { return m_state ? m_state->header.recordSize : 0; }
std::uint64_t CRbxWriter::StepCount() const { return m_state ? m_state->steps : 0; }

bool CRbxWriter::Fail(const CString& what)
{
    m_status = sys::Status::Fail(m_state ? m_state->path : CString(), 0, what);
    if (m_state)
        m_state->failed = true;
    return false;
}

sys::Status CRbxWriter::Open(const CString& path, const FileDefinition& definition)
{
    if (IsOpen())
        Close();
    m_status = sys::Status::Ok();
    OpenFile(path, definition);
    return m_status;
}

bool CRbxWriter::OpenFile(const CString& path, const FileDefinition& definition)
{
    m_state = std::make_unique<State>();
    m_state->path = path;
    State& s = *m_state;

    for (std::size_t i = 0; i < definition.items.size(); ++i) {
        const CString problem = CheckItem(definition.items[i]);
        if (!problem.empty())
            return Fail(text::Format("item %zu: ", i + 1) + problem);
    }
    if (definition.title.size() > kMaxTextLength || definition.timeUnitText.size() > kMaxTextLength)
        return Fail("a text is longer than 65535 bytes");
    if (!std::isfinite(definition.startOffset))
        return Fail("the start offset is not a number");
    s.calendar = definition.calendar;
    if (s.calendar && !units::Convert(definition.timeUnitKey, 1.0, units::kUnitSecond, s.secondsPerUnit))
        return Fail(text::Format("the time unit %d is not a unit of time", definition.timeUnitKey));
    if (definition.calendarStart && !definition.calendarStart->IsValid())
        return Fail("the calendar start is not a valid date and time");

    FileHeader& h = s.header;
    h.title = definition.title;
    h.items = definition.items;
    h.fileType = h.items.empty() ? kSharedDeleteValue : ChooseFileType(h.items);
    h.deleteValue = h.items.empty() ? ItemInfo{}.deleteValue : h.items.front().deleteValue;
    h.dataType = CommonDataType(h.items);
    h.recordSize = ComputeRecordSize(h.items);
    if (h.recordSize == 0)
        return Fail("the items need more than 256 MiB per step");
    h.axis.type = s.calendar ? kEquidistantCalendar : kEquidistantRelative;
    h.axis.unitKey = definition.timeUnitKey;
    h.axis.unitText = definition.timeUnitText;
    h.axis.startOffset = definition.startOffset;
    h.axis.startIndex = definition.startIndex;
    s.calendarStart = definition.calendarStart;
    if (s.calendar) {
        // Stands in the header until the first step settles the start.
        const COleDateTime start = s.calendarStart.value_or(COleDateTime(0.0));
        h.axis.startDate = start.Format("%Y-%m-%d");
        h.axis.startTime = start.Format("%H:%M:%S");
    }
    s.headerBytes = EncodeHeader(h);
    s.packed.resize(h.recordSize - 8);
    s.buffer = std::make_unique_for_overwrite<unsigned char[]>(kFlushBytes + h.recordSize);
    s.allFloat64 = std::all_of(h.items.begin(), h.items.end(), [](const ItemInfo& item) { return item.dataType == kFloat64; });
    if (s.allFloat64)
        for (const ItemInfo& item : h.items)
            s.deleteValues.insert(s.deleteValues.end(), item.elementCount, item.deleteValue);

    s.file.reset(std::fopen(path.c_str(), "wb"));
    if (!s.file)
        return Fail(std::string("cannot create the file: ") + std::strerror(errno));
    if (std::fwrite(s.headerBytes.data(), 1, s.headerBytes.size(), s.file.get()) != s.headerBytes.size())
        return Fail(std::string("cannot write the header: ") + std::strerror(errno));
    return true;
}

bool CRbxWriter::CheckTime(double time)
{
    State& s = *m_state;
    if (!std::isfinite(time))
        return Fail(text::Format("the time of step %llu is not a number", static_cast<unsigned long long>(s.steps + 1)));
    if (s.steps == 0) {
        s.firstTime = time;
        return true;
    }
    const double step = time - s.lastTime;
    if (!(step > 0.0))
        return Fail(text::Format("the time %.17g of step %llu does not come after the time %.17g before it", time,
                                 static_cast<unsigned long long>(s.steps + 1), s.lastTime));
    if (s.steps == 1)
        s.firstStep = step;
    else if (std::fabs(step - s.firstStep) > kStepTolerance * s.firstStep)
        s.equidistant = false;
    return true;
}

bool CRbxWriter::PackValues(const double* values)
{
    State& s = *m_state;
    unsigned char* out = s.packed.data();
    for (const ItemInfo& item : s.header.items) {
        if (item.dataType == kFloat64) {
            // Doubles are stored as they are: no range to check, only gaps to mark.
            for (std::uint32_t e = 0; e < item.elementCount; ++e, ++values, out += sizeof(double)) {
                const double value = std::isnan(*values) ? item.deleteValue : *values;
                std::memcpy(out, &value, sizeof(double));
            }
            continue;
        }
        const std::size_t width = DataTypeSize(item.dataType);
        for (std::uint32_t e = 0; e < item.elementCount; ++e) {
            const double value = std::isnan(*values) ? item.deleteValue : *values;
            if (!EncodeValue(item.dataType, value, out))
                return Fail(text::Format("the value %g of item \"%s\" at step %llu does not fit its data type %d", value,
                                         item.name.c_str(), static_cast<unsigned long long>(s.steps + 1), item.dataType));
            ++values;
            out += width;
        }
    }
    return true;
}

bool CRbxWriter::AppendRecord(double time)
{
    State& s = *m_state;
    unsigned char* const record = s.buffer.get() + s.used;
    std::memcpy(record, &time, sizeof time);
    std::memcpy(record + sizeof time, s.packed.data(), s.packed.size());
    return RecordAppended(time);
}

bool CRbxWriter::RecordAppended(double time)
{
    State& s = *m_state;
    s.used += s.header.recordSize;
    s.lastTime = time;
    ++s.steps;
    return s.used < kFlushBytes || FlushBuffer();
}

bool CRbxWriter::FlushBuffer()
{
    State& s = *m_state;
    if (s.used == 0)
        return true;
    s.crc = checksum::Crc32(s.crc, s.buffer.get(), s.used);
    const bool ok = std::fwrite(s.buffer.get(), 1, s.used, s.file.get()) == s.used;
    s.used = 0;
    return ok || Fail(std::string("cannot write the data: ") + std::strerror(errno));
}

bool CRbxWriter::WriteStep(double time, const double* values)
{
    if (!IsOpen() || m_state->failed || !CheckTime(time))
        return false;
    State& s = *m_state;
    if (!s.allFloat64)
        return PackValues(values) && AppendRecord(time);
    unsigned char* record = s.buffer.get() + s.used;
    std::memcpy(record, &time, sizeof time);
    record += sizeof time;
    const std::size_t count = s.deleteValues.size();
    for (std::size_t i = 0; i < count; ++i) {
        const double value = std::isnan(values[i]) ? s.deleteValues[i] : values[i];
        std::memcpy(record + i * sizeof value, &value, sizeof value);
    }
    return RecordAppended(time);
}

bool CRbxWriter::WriteRawStep(double time, const void* packedValues)
{
    if (!IsOpen() || m_state->failed)
        return false;
    if (!CheckTime(time))
        return false;
    std::memcpy(m_state->packed.data(), packedValues, m_state->packed.size());
    return AppendRecord(time);
}

bool CRbxWriter::WriteStepAt(const COleDateTime& stamp, const double* values)
{
    if (!IsOpen() || m_state->failed)
        return false;
    State& s = *m_state;
    if (!s.calendar)
        return Fail("a file with a relative time axis takes plain times, not calendar stamps");
    if (!stamp.IsValid())
        return Fail(text::Format("the stamp of step %llu is not a valid date and time", static_cast<unsigned long long>(s.steps + 1)));
    if (!s.calendarStart) {
        s.calendarStart = stamp;
        s.header.axis.startDate = stamp.Format("%Y-%m-%d");
        s.header.axis.startTime = stamp.Format("%H:%M:%S");
    }
    const double millis = std::round((stamp.LinearDays() - s.calendarStart->LinearDays()) * 86400000.0);
    return WriteStep(millis / 1000.0 / s.secondsPerUnit, values);
}

bool CRbxWriter::PatchHeader()
{
    State& s = *m_state;
    TimeAxis& axis = s.header.axis;
    axis.steps = s.steps;
    if (s.equidistant) {
        axis.type = s.calendar ? kEquidistantCalendar : kEquidistantRelative;
        axis.step = s.steps >= 2 ? s.firstStep : 0.0;
    } else {
        axis.type = s.calendar ? kNonEquidistantCalendar : kNonEquidistantRelative;
        axis.step = s.lastTime - s.firstTime;
    }
    s.header.dataChecksum = s.crc;
    rbx::PatchHeader(s.headerBytes, s.header);
    if (std::fseek(s.file.get(), 0, SEEK_SET) != 0
        || std::fwrite(s.headerBytes.data(), 1, s.headerBytes.size(), s.file.get()) != s.headerBytes.size())
        return Fail(std::string("cannot complete the header: ") + std::strerror(errno));
    return true;
}

sys::Status CRbxWriter::Close()
{
    if (!IsOpen())
        return sys::Status::Fail(CString(), 0, "no file is open");
    CloseFile();
    return m_status;
}

bool CRbxWriter::CloseFile()
{
    State& s = *m_state;
    bool ok = !s.failed && FlushBuffer() && PatchHeader();
    if (std::fclose(s.file.release()) != 0 && ok)
        ok = Fail(std::string("cannot close the file: ") + std::strerror(errno));
    if (!ok)
        std::remove(s.path.c_str()); // a half-written file would only mislead its readers
    return ok;
}

} // namespace rbx
