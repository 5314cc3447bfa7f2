#include "platform/system/DateFormat.h"

#include "platform/system/Text.h"

#include <algorithm>
#include <iterator>

namespace sys {

namespace {

constexpr std::string_view kDateTimeSeparators = "/ T:-.|";

} // namespace

std::vector<std::string_view> DateTimeTokens(std::string_view text)
{
    std::vector<std::string_view> tokens;
    size_t pos = 0;
    while ((pos = text.find_first_not_of(kDateTimeSeparators, pos)) != std::string_view::npos) {
        const size_t end = std::min(text.find_first_of(kDateTimeSeparators, pos), text.size());
        tokens.push_back(text.substr(pos, end - pos));
        pos = end;
    }
    return tokens;
}

DateFormat::DateFormat(std::string_view format, Reads reads, std::string_view extraSeparators)
{
    for (char c : kDateTimeSeparators)
        m_separator[static_cast<unsigned char>(c)] = true;
    for (char c : extraSeparators)
        m_separator[static_cast<unsigned char>(c)] = true;

    size_t i = 0;
    while (true) {
        while (i < format.size() && IsSeparator(format[i]))
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
        m_fields.push_back(field);
        if (field != Field::None)
            m_lastUsed = m_fields.size();
        while (i < format.size() && !IsSeparator(format[i]))
            ++i;
    }
    const Field compact[] = {Field::Year, Field::Month, Field::Day, Field::Hour, Field::Minute, Field::Second};
    m_compact = std::equal(std::begin(compact), std::end(compact), m_fields.begin(), m_fields.end());
}

bool DateFormat::ReadCompact(std::string_view text, DateTimeFields& fields) const
{
    if (text.size() != 19)
        return false;
    const char* t = text.data();
    for (size_t separator : {4, 7, 10, 13, 16})
        if (!IsSeparator(t[separator]))
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
    fields = DateTimeFields{values[0], values[1], values[2], values[3], values[4], values[5]};
    return true;
}

bool DateFormat::Read(std::string_view text, DateTimeFields& fields) const
{
    return (m_compact && ReadCompact(text, fields)) || ReadTokens(text, fields);
}

bool DateFormat::ReadTokens(std::string_view text, DateTimeFields& fields) const
{
    size_t i = 0;
    for (size_t k = 0; k < m_lastUsed; ++k) {
        while (i < text.size() && IsSeparator(text[i]))
            ++i;
        const size_t start = i;
        while (i < text.size() && !IsSeparator(text[i]))
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
        if (present && !text::ScanInt(text.substr(start, i - start), *slot))
            return false;
        if (*slot < low || *slot > high)
            return false;
    }
    return true;
}

} // namespace sys
