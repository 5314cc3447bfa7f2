#include "converter/RbxSeriesReader.h"

#include "converter/StampText.h"
#include "platform/rbx/RbxReader.h"
#include "platform/units/Units.h"

#include <algorithm>
#include <cmath>

namespace converter {

namespace {
// A block holds at most this many values, whatever the number of items.
constexpr size_t kValuesPerBlock = 64 * 1024;

// The reader's messages may already name the file; the problem names it once.
std::string WithoutPath(const std::string& message, const std::string& path)
{
    const std::string prefix = path + ": ";
    return message.compare(0, prefix.size(), prefix) == 0 ? message.substr(prefix.size()) : message;
}
} // namespace

RbxSeriesReader::RbxSeriesReader() : m_reader(std::make_unique<rbx::CRbxReader>()) {}
RbxSeriesReader::~RbxSeriesReader() = default;

Status RbxSeriesReader::Open(const std::string& path)
{
    m_path = path;
    if (!m_reader->Open(path))
        return m_status = Status::Fail(path, 0, WithoutPath(m_reader->Error(), path));
    const rbx::FileHeader& header = m_reader->Header();
    const rbx::TimeAxis& axis = header.axis;
    if (!rbx::IsCalendarAxis(axis.type))
        return m_status = Status::Fail(path, 0, "the file has a relative time axis (type " + std::to_string(axis.type) +
                                                    "); only calendar time axes give time stamps");
    StampFields start;
    start.year = 100;
    DateFormat("YYYY-MM-DD", DateFormat::Reads::Date).Read(axis.startDate, start);
    std::optional<Stamp> base;
    if (DateFormat("HH:mm:ss", DateFormat::Reads::Time).Read(axis.startTime, start))
        base = StampFromFields(start);
    if (!base)
        return m_status = Status::Fail(path, 0, "the time axis starts at '" + axis.startDate + " " + axis.startTime +
                                                    "', which is not a calendar date and time");
    m_start = *base;
    if (!units::Convert(axis.unitKey, 1.0, units::kUnitSecond, m_secondsPerUnit))
        return m_status = Status::Fail(path, 0, "the time axis unit " + std::to_string(axis.unitKey) +
                                                    " is not a unit of time in the unit catalogue");
    // The start offset counts in the axis unit from the start date and time.
    m_start += static_cast<Stamp>(std::llround(axis.startOffset * m_secondsPerUnit));

    m_header = SeriesHeader();
    for (const rbx::ItemInfo& item : header.items) {
        if (item.axisType != rbx::kScalarItem || item.elementCount != 1)
            return m_status = Status::Fail(path, 0, "item '" + item.name +
                                                        "' holds several values per time step; only scalar items convert");
        ItemInfo info;
        info.name = item.name;
        info.type = item.itemTypeText;
        info.unit = item.unitText;
        info.valueType = rbx::ValueTypeName(item.valueType);
        m_header.items.push_back(info);
        m_deleteValues.push_back(header.fileType == rbx::kSharedDeleteValue ? header.deleteValue : item.deleteValue);
        m_singlePrecision.push_back(item.dataType == rbx::kFloat32);
    }
    m_recordSize = header.recordSize;
    const size_t items = std::max<size_t>(1, header.items.size());
    m_blockSteps = std::max<size_t>(1, kValuesPerBlock / items);
    m_times.resize(m_blockSteps);
    m_values.resize(m_blockSteps * header.items.size());

    std::vector<size_t> all(header.items.size());
    for (size_t i = 0; i < all.size(); ++i)
        all[i] = i;
    Select(all);
    return m_status;
}

bool RbxSeriesReader::FillBlock()
{
    size_t got = 0;
    if (!m_reader->ReadSteps(m_blockSteps, m_times.data(), m_values.data(), got)) {
        m_status = Status::Fail(m_path, 0, WithoutPath(m_reader->Error(), m_path) + " (after " + std::to_string(m_stepIndex) + " time steps)");
        return false;
    }
    m_inBlock = got;
    m_next = 0;
    return got > 0;
}

bool RbxSeriesReader::Next(Row& row)
{
    if (!m_status)
        return false;
    if (m_next == m_inBlock && !FillBlock())
        return false;
    const size_t itemCount = m_header.items.size();
    const double* values = m_values.data() + m_next * itemCount;
    row.stamp = m_start + static_cast<Stamp>(std::llround(m_times[m_next] * m_secondsPerUnit));
    row.values.resize(m_selection.size());
    for (size_t slot = 0; slot < m_selection.size(); ++slot) {
        const size_t item = m_selection[slot];
        double value = item < itemCount ? values[item] : kMissing;
        if (item < itemCount) {
            const double deleted = m_deleteValues[item];
            const bool isDeleted = m_singlePrecision[item]
                                       ? static_cast<float>(value) == static_cast<float>(deleted)
                                       : value == deleted;
            if (isDeleted)
                value = kMissing;
        }
        row.values[slot] = value;
    }
    ++m_next;
    ++m_stepIndex;
    return true;
}

std::uint64_t RbxSeriesReader::BytesConsumed() const { return m_stepIndex * m_recordSize; }

} // namespace converter
