#include "converter/StampText.h"

#include <cstring>

namespace converter {

namespace {
char* TwoDigits(int v, char* out)
{
    out[0] = static_cast<char>('0' + v / 10);
    out[1] = static_cast<char>('0' + v % 10);
    return out + 2;
}
} // namespace

char* FormatStamp(Stamp stamp, char* out)
{
    const StampFields f = FieldsFromStamp(stamp);
    const int year = f.year < 0 ? 0 : (f.year > 9999 ? 9999 : f.year);
    out = TwoDigits(year / 100, out);
    out = TwoDigits(year % 100, out);
    *out++ = '/';
    out = TwoDigits(f.month, out);
    *out++ = '/';
    out = TwoDigits(f.day, out);
    *out++ = ' ';
    out = TwoDigits(f.hour, out);
    *out++ = ':';
    out = TwoDigits(f.minute, out);
    *out++ = ':';
    return TwoDigits(f.second, out);
}

char* StampPrinter::Write(Stamp stamp, char* out)
{
    long long day = stamp / kSecondsPerDay;
    long long rest = stamp % kSecondsPerDay;
    if (rest < 0) {
        rest += kSecondsPerDay;
        --day;
    }
    if (!m_known || day != m_day) {
        char full[20];
        FormatStamp(stamp, full);
        std::memcpy(m_date.data(), full, m_date.size());
        m_day = day;
        m_known = true;
    }
    std::memcpy(out, m_date.data(), m_date.size());
    out += m_date.size();
    const int seconds = static_cast<int>(rest);
    out = TwoDigits(seconds / 3600, out);
    *out++ = ':';
    out = TwoDigits(seconds / 60 % 60, out);
    *out++ = ':';
    return TwoDigits(seconds % 60, out);
}

std::string FormatStamp(Stamp stamp)
{
    char buffer[20];
    char* end = FormatStamp(stamp, buffer);
    return std::string(buffer, end);
}

} // namespace converter
