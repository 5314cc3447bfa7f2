#include "converter/StampText.h"

#include "platform/system/OleDateTime.h"

#include <cmath>
#include <cstring>

namespace converter {

namespace {

// DaysFromCivil counts from 1899-12-30; stamps count from 1970-01-01.
const long long kEpochDays = DaysFromCivil(1970, 1, 1);

} // namespace

bool StampReader::ReadClock(std::string_view text, Stamp& stamp) const
{
    const char* t = text.data();
    if (!m_format.IsSeparator(t[10]) || !m_format.IsSeparator(t[13]) || !m_format.IsSeparator(t[16]))
        return false;
    auto digit = [t](size_t at) { return static_cast<unsigned>(static_cast<unsigned char>(t[at])) - unsigned{'0'}; };
    const unsigned d[6] = {digit(11), digit(12), digit(14), digit(15), digit(17), digit(18)};
    const bool allDigits = (d[0] <= 9) & (d[1] <= 9) & (d[2] <= 9) & (d[3] <= 9) & (d[4] <= 9) & (d[5] <= 9);
    const unsigned hour = d[0] * 10 + d[1], minute = d[2] * 10 + d[3], second = d[4] * 10 + d[5];
    if (!allDigits || hour > 23 || minute > 59 || second > 59)
        return false;
    stamp = m_dayStart + hour * 3600LL + minute * 60LL + second;
    return true;
}

bool StampReader::ReadWhole(std::string_view text, Stamp& stamp)
{
    sys::DateTimeFields fields = m_start;
    const bool compact = m_format.IsCompact() && m_format.ReadCompact(text, fields);
    if (!compact && !m_format.Read(text, fields))
        return false;
    const std::optional<Stamp> value = StampFromFields(fields);
    if (!value)
        return false;
    stamp = *value;
    if (compact) {
        std::memcpy(m_date.data(), text.data(), m_date.size());
        m_dayStart = stamp - (fields.hour * 3600LL + fields.minute * 60LL + fields.second);
        m_known = true;
    }
    return true;
}

std::optional<Stamp> StampFromFields(const sys::DateTimeFields& f)
{
    if (!IsValidCalendarDate(f.year, f.month, f.day) || f.hour < 0 || f.hour > 23 || f.minute < 0 ||
        f.minute > 59 || f.second < 0 || f.second > 59)
        return std::nullopt;
    const long long days = DaysFromCivil(f.year, f.month, f.day) - kEpochDays;
    return days * kSecondsPerDay + f.hour * 3600LL + f.minute * 60LL + f.second;
}

sys::DateTimeFields FieldsFromStamp(Stamp stamp)
{
    long long days = stamp / kSecondsPerDay;
    long long rest = stamp % kSecondsPerDay;
    if (rest < 0) {
        rest += kSecondsPerDay;
        --days;
    }
    sys::DateTimeFields f;
    CivilFromDays(days + kEpochDays, f.year, f.month, f.day);
    f.hour = static_cast<int>(rest / 3600);
    f.minute = static_cast<int>(rest / 60 % 60);
    f.second = static_cast<int>(rest % 60);
    return f;
}

namespace {

// OLE (automation) day numbers of the first day the sheet numbers as serial 1 (1 January 1900)
// and of the first day after its 29 February 1900 (1 March 1900, serial 61).
constexpr double kOleFirstSheetDay = 2;
constexpr double kOleMarch1900 = 61;

} // namespace

std::optional<double> SheetSerialFromStamp(Stamp stamp)
{
    const double ole = static_cast<double>(stamp) / kSecondsPerDay + static_cast<double>(kEpochDays);
    if (ole < kOleFirstSheetDay)
        return std::nullopt;
    return ole < kOleMarch1900 ? ole - 1 : ole;
}

std::optional<Stamp> StampFromSheetSerial(double serial)
{
    // Years 100 to 9999, as the date type allows.
    if (!std::isfinite(serial) || serial < -657434.0 || serial >= 2958466.0)
        return std::nullopt;
    double ole = serial;
    if (serial >= kOleMarch1900 - 1 && serial < kOleMarch1900)
        return std::nullopt; // 29 February 1900
    if (serial >= 1 && serial < kOleMarch1900 - 1)
        ole = serial + 1;
    return static_cast<Stamp>(std::llround((ole - static_cast<double>(kEpochDays)) * kSecondsPerDay));
}

} // namespace converter
