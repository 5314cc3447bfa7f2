#include "converter/StampText.h"

#include "platform/system/OleDateTime.h"

#include <algorithm>
#include <climits>
#include <cstring>
#include <iterator>
#include <cmath>

namespace converter {

namespace {

constexpr std::string_view kDateTimeSeparators = "/ T:-.|";

// DaysFromCivil counts from 1899-12-30; stamps count from 1970-01-01.
const long long kEpochDays = DaysFromCivil(1970, 1, 1);

bool IsScanSpace(char c) { return c == ' ' || c == '\t' || c == '\n' || c == '\r' || c == '\v' || c == '\f'; }

// "%d" scanning of one token: blanks, a sign, digits; saturates instead of overflowing.
bool ScanToken(std::string_view token, int& value)
{
    size_t i = 0;
    while (i < token.size() && IsScanSpace(token[i]))
        ++i;
    bool negative = false;
    if (i < token.size() && (token[i] == '+' || token[i] == '-')) {
        negative = token[i] == '-';
        ++i;
    }
    if (i >= token.size() || token[i] < '0' || token[i] > '9')
        return false;
    long long v = 0;
    const long long limit = static_cast<long long>(INT_MAX) + 1;
    for (; i < token.size() && token[i] >= '0' && token[i] <= '9'; ++i) {
        v = v * 10 + (token[i] - '0');
        if (v > limit)
            v = limit;
    }
    if (negative)
        v = -v;
    value = v > INT_MAX ? INT_MAX : static_cast<int>(v);
    return true;
}

} // namespace

DateFormat::DateFormat(std::string_view format, Reads reads, std::string_view extraSeparators)
{
    for (char c : kDateTimeSeparators)
        m_separator[static_cast<unsigned char>(c)] = true;
    for (char c : extraSeparators)
        m_separator[static_cast<unsigned char>(c)] = true;

    size_t i = 0;
    while (true) {
        while (i < format.size() && m_separator[static_cast<unsigned char>(format[i])])
            ++i;
        if (i >= format.size())
            break;
        Field field = Field::None;
        switch (format[i]) {
        case 'Y': case 'y': field = Field::Year; break;
        case 'M': field = Field::Month; break;
        case 'D': case 'd': field = Field::Day; break;
        case 'H': case 'h': field = Field::Hour; break;
        case 'm': field = Field::Minute; break;
        case 'S': case 's': field = Field::Second; break;
        default: break;
        }
        const bool isDate = field == Field::Year || field == Field::Month || field == Field::Day;
        const bool isTime = field == Field::Hour || field == Field::Minute || field == Field::Second;
        if ((reads == Reads::Date && !isDate) || (reads == Reads::Time && !isTime))
            field = Field::None;
        if (m_count < kMaxTokens) {
            m_fields[m_count] = field;
            if (field != Field::None)
                m_lastUsed = m_count + 1;
        }
        ++m_count;
        while (i < format.size() && !m_separator[static_cast<unsigned char>(format[i])])
            ++i;
    }
    const Field compact[] = {Field::Year, Field::Month, Field::Day, Field::Hour, Field::Minute, Field::Second};
    m_compact = m_count == 6 && std::equal(std::begin(compact), std::end(compact), m_fields.begin());
}

bool DateFormat::ReadCompact(std::string_view text, StampFields& fields) const
{
    if (text.size() != 19)
        return false;
    const char* t = text.data();
    for (size_t separator : {4, 7, 10, 13, 16})
        if (!m_separator[static_cast<unsigned char>(t[separator])])
            return false;
    int values[6];
    const size_t starts[6] = {0, 5, 8, 11, 14, 17};
    for (int k = 0; k < 6; ++k) {
        const size_t length = k == 0 ? 4 : 2;
        int v = 0;
        for (size_t c = 0; c < length; ++c) {
            const unsigned digit = static_cast<unsigned char>(t[starts[k] + c]) - '0';
            if (digit > 9)
                return false;
            v = v * 10 + static_cast<int>(digit);
        }
        values[k] = v;
    }
    // Out-of-range fields take the general path, which reports them.
    if (values[0] < 100 || values[1] < 1 || values[1] > 12 || values[2] < 1 || values[2] > 31 || values[3] > 23 ||
        values[4] > 59 || values[5] > 59)
        return false;
    fields = StampFields{values[0], values[1], values[2], values[3], values[4], values[5]};
    return true;
}

bool DateFormat::Read(std::string_view text, StampFields& fields) const
{
    if (m_compact && ReadCompact(text, fields))
        return true;
    size_t i = 0;
    for (size_t k = 0; k < m_lastUsed; ++k) {
        while (i < text.size() && m_separator[static_cast<unsigned char>(text[i])])
            ++i;
        const size_t start = i;
        while (i < text.size() && !m_separator[static_cast<unsigned char>(text[i])])
            ++i;
        const bool present = i > start;
        int* slot = nullptr;
        int low = 0, high = 0;
        switch (m_fields[k]) {
        case Field::None: continue;
        case Field::Year: slot = &fields.year; low = 100; high = 9999; break;
        case Field::Month: slot = &fields.month; low = 1; high = 12; break;
        case Field::Day: slot = &fields.day; low = 1; high = 31; break;
        case Field::Hour: slot = &fields.hour; low = 0; high = 23; break;
        case Field::Minute: slot = &fields.minute; low = 0; high = 59; break;
        case Field::Second: slot = &fields.second; low = 0; high = 59; break;
        }
        if (present && !ScanToken(text.substr(start, i - start), *slot))
            return false;
        if (*slot < low || *slot > high)
            return false;
    }
    return true;
}

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
    StampFields fields = m_start;
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

std::optional<Stamp> StampFromFields(const StampFields& f)
{
    if (!IsValidCalendarDate(f.year, f.month, f.day) || f.hour < 0 || f.hour > 23 || f.minute < 0 ||
        f.minute > 59 || f.second < 0 || f.second > 59)
        return std::nullopt;
    const long long days = DaysFromCivil(f.year, f.month, f.day) - kEpochDays;
    return days * kSecondsPerDay + f.hour * 3600LL + f.minute * 60LL + f.second;
}

StampFields FieldsFromStamp(Stamp stamp)
{
    long long days = stamp / kSecondsPerDay;
    long long rest = stamp % kSecondsPerDay;
    if (rest < 0) {
        rest += kSecondsPerDay;
        --days;
    }
    StampFields f;
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
