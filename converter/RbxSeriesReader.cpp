#include "converter/RbxSeriesReader.h"

#include "converter/StampText.h"
#include "platform/rbx/RbxBytes.h"
#include "platform/rbx/RbxReader.h"
#include "platform/rbx/RbxValueCodec.h"
#include "platform/units/Units.h"

#include <algorithm>
#include <cmath>
#include <cstring>

namespace converter {

namespace {
// A block holds at most this many values, whatever the number of items.
constexpr size_t kValuesPerBlock = 64 * 1024;

// The reader's messages may already name the file; the problem names it once.
// std::llround without the library call where the fraction is exact (below 2^52 the integer part
// of a double and what remains are exact); the same result everywhere.
long long RoundHalfAway(double x)
{
    if (!(std::fabs(x) < 4503599627370496.0))
        return std::llround(x);
    const auto whole = static_cast<long long>(x);
    const double rest = x - static_cast<double>(whole);
    return whole + (rest >= 0.5) - (rest <= -0.5);
}

// Axis time in whole seconds; false beyond 10^17 s (three billion years, far outside any calendar),
// where a stamp would overflow.
bool ToSeconds(double time, double secondsPerUnit, Stamp& seconds)
{
    const double value = time * secondsPerUnit;
    if (!(std::fabs(value) <= 1e17))
        return false;
    seconds = RoundHalfAway(value);
    return true;
}
} // namespace

RbxSeriesReader::RbxSeriesReader() : m_reader(std::make_unique<rbx::CRbxReader>()) {}
RbxSeriesReader::~RbxSeriesReader() = default;

sys::Status RbxSeriesReader::Open(const std::string& path)
{
    m_path = path;
    if (const sys::Status opened = m_reader->Open(path); !opened)
        return m_status = sys::Status::Fail(path, 0, opened.problem().message);
    const rbx::FileHeader& header = m_reader->Header();
    const rbx::TimeAxis& axis = header.axis;
    if (!rbx::IsCalendarAxis(axis.type))
        return m_status = sys::Status::Fail(path, 0, "the file has a relative time axis (type " + std::to_string(axis.type) +
                                                    "); only calendar time axes give time stamps");
    sys::DateTimeFields start;
    start.year = 100;
    sys::DateFormat("YYYY-MM-DD", sys::DateFormat::Reads::Date).Read(axis.startDate, start);
    std::optional<Stamp> base;
    if (sys::DateFormat("HH:mm:ss", sys::DateFormat::Reads::Time).Read(axis.startTime, start))
        base = StampFromFields(start);
    if (!base)
        return m_status = sys::Status::Fail(path, 0, "the time axis starts at '" + axis.startDate + " " + axis.startTime +
                                                    "', which is not a calendar date and time");
    m_start = *base;
    if (!units::Convert(axis.unitKey, 1.0, units::kUnitSecond, m_secondsPerUnit))
        return m_status = sys::Status::Fail(path, 0, "the time axis unit " + std::to_string(axis.unitKey) +
                                                    " is not a unit of time in the unit catalogue");
    // The start offset counts in the axis unit from the start date and time.
    Stamp startOffset = 0;
    if (!ToSeconds(axis.startOffset, m_secondsPerUnit, startOffset))
        return m_status = sys::Status::Fail(path, 0, "the time axis start offset lies too far from its start date for a time stamp");
    m_start += startOffset;

    m_header = SeriesHeader();
    m_columns.clear();
    size_t offset = 8; // after the step's time
    for (const rbx::ItemInfo& item : header.items) {
        if (item.axisType != rbx::kScalarItem || item.elementCount != 1)
            return m_status = sys::Status::Fail(path, 0, "item '" + item.name +
                                                        "' holds several values per time step; only scalar items convert");
        ItemInfo info;
        info.name = item.name;
        info.type = item.itemTypeText;
        info.unit = item.unitText;
        info.valueType = rbx::ValueTypeName(item.valueType);
        m_header.items.push_back(info);
        const double deleted = header.fileType == rbx::kSharedDeleteValue ? header.deleteValue : item.deleteValue;
        m_columns.push_back({offset, item.dataType, deleted});
        offset += rbx::DataTypeSize(item.dataType);
    }
    m_recordSize = header.recordSize;
    const size_t items = std::max<size_t>(1, header.items.size());
    m_blockSteps = std::max<size_t>(1, kValuesPerBlock / items);
    m_records.resize(m_blockSteps * m_recordSize);

    std::vector<size_t> all(header.items.size());
    for (size_t i = 0; i < all.size(); ++i)
        all[i] = i;
    Select(all);
    return m_status;
}

void RbxSeriesReader::Select(const std::vector<size_t>& items)
{
    SeriesReader::Select(items);
    m_selected.clear();
    for (size_t item : items) {
        if (item >= m_columns.size() || m_columns[item].dataType != rbx::kFloat64) {
            m_selected.clear();
            return;
        }
        m_selected.push_back(m_columns[item]);
    }
}

bool RbxSeriesReader::FillBlock()
{
    size_t got = 0;
    if (!m_reader->ReadRawSteps(m_blockSteps, m_records.data(), got)) {
        m_status = sys::Status::Fail(m_path, 0, m_reader->status().problem().message + " (after " + std::to_string(m_stepIndex) + " time steps)");
        return false;
    }
    m_inBlock = got;
    m_next = 0;
    return got > 0;
}

double RbxSeriesReader::ValueOf(size_t item, const unsigned char* record) const
{
    if (item >= m_columns.size())
        return kMissing;
    const Column& column = m_columns[item];
    const double value = rbx::DecodeValue(column.dataType, record + column.offset);
    // A 32-bit item holds its delete value rounded to float.
    const bool deleted = column.dataType == rbx::kFloat32
                             ? static_cast<float>(value) == static_cast<float>(column.deleted)
                             : value == column.deleted;
    return deleted ? kMissing : value;
}

bool RbxSeriesReader::Next(Row& row)
{
    if (!m_status)
        return false;
    if (m_next == m_inBlock && !FillBlock())
        return false;
    const unsigned char* record = m_records.data() + m_next * m_recordSize;
    Stamp offset = 0;
    if (!ToSeconds(rbx::bytes::Get<double>(record), m_secondsPerUnit, offset))
        return Fail(m_path, 0, "the time of step " + std::to_string(m_stepIndex + 1) +
                                   " lies too far from the start of the time axis for a time stamp");
    row.stamp = m_start + offset;
    row.values.resize(m_selection.size());
    double* out = row.values.data();
    if (!m_selected.empty()) {
        // Every selected item is a 64-bit value: copied, no conversion.
        for (const Column& column : m_selected) {
            double value;
            std::memcpy(&value, record + column.offset, sizeof value);
            *out++ = value == column.deleted ? kMissing : value;
        }
    } else {
        for (size_t item : m_selection)
            *out++ = ValueOf(item, record);
    }
    ++m_next;
    ++m_stepIndex;
    return true;
}

std::uint64_t RbxSeriesReader::BytesConsumed() const { return m_stepIndex * m_recordSize; }

} // namespace converter
