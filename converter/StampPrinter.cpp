#include "converter/StampText.h"

#include <cstdint>
#include <cstring>

namespace converter {

namespace {
char* TwoDigits(int v, char* out)
{
    out[0] = static_cast<char>('0' + v / 10);
    out[1] = static_cast<char>('0' + v % 10);
    return out + 2;
}

// The texts "00" to "59", the first digit in the lower byte.
struct ClockPairs {
    std::uint16_t text[60];
    constexpr ClockPairs() : text()
    {
        for (int n = 0; n < 60; ++n)
            text[n] = static_cast<std::uint16_t>(('0' + n / 10) | ('0' + n % 10) << 8);
    }
};
constexpr ClockPairs kClockPairs;
} // namespace

char* FormatStamp(Stamp stamp, char* out)
{
    const sys::DateTimeFields f = FieldsFromStamp(stamp);
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
    // "HH:mm:ss" put together in one word and stored at once.
    const auto seconds = static_cast<unsigned>(rest);
    const std::uint64_t clock = kClockPairs.text[seconds / 3600] | std::uint64_t{':'} << 16 |
                                std::uint64_t{kClockPairs.text[seconds / 60 % 60]} << 24 | std::uint64_t{':'} << 40 |
                                std::uint64_t{kClockPairs.text[seconds % 60]} << 48;
    std::memcpy(out, &clock, sizeof clock);
    return out + sizeof clock;
}

std::string FormatStamp(Stamp stamp)
{
    char buffer[20];
    char* end = FormatStamp(stamp, buffer);
    return std::string(buffer, end);
}

} // namespace converter
