#include "platform/system/OleDateTime.h"

#include "platform/system/Text.h"

#include <cmath>
#include <ctime>

namespace {

constexpr double kMinOleDate = -657434.0;        // 0100-01-01
constexpr double kMaxOleDate = 2958465.99999999; // 9999-12-31 23:59:59
constexpr long long kDaysFrom1970To1899 = -25569; // 1899-12-30 relative to 1970-01-01

int DaysInMonth(int year, int month)
{
    static const int days[] = {31, 28, 31, 30, 31, 30, 31, 31, 30, 31, 30, 31};
    bool leap = (year % 4 == 0 && year % 100 != 0) || year % 400 == 0;
    return month == 2 && leap ? 29 : days[month - 1];
}

// Whole seconds into the calendar day `day` (since 1899-12-30), from the OLE value.
void SplitOle(double dt, long long& day, long long& seconds)
{
    double whole = std::trunc(dt);
    double fraction = std::fabs(dt - whole);
    day = static_cast<long long>(whole);
    seconds = std::llround(fraction * 86400.0);
    if (seconds >= 86400) {
        seconds -= 86400;
        day += 1;
    }
}

} // namespace

long long DaysFromCivil(int year, int month, int day)
{
    // Howard Hinnant's days_from_civil, shifted so that 1899-12-30 is day 0.
    long long y = year - (month <= 2 ? 1 : 0);
    long long era = (y >= 0 ? y : y - 399) / 400;
    long long yoe = y - era * 400;
    long long mp = (month + 9) % 12;
    long long doy = (153 * mp + 2) / 5 + day - 1;
    long long doe = yoe * 365 + yoe / 4 - yoe / 100 + doy;
    return era * 146097 + doe - 719468 - kDaysFrom1970To1899;
}

void CivilFromDays(long long days, int& year, int& month, int& day)
{
    long long z = days + kDaysFrom1970To1899 + 719468;
    long long era = (z >= 0 ? z : z - 146096) / 146097;
    long long doe = z - era * 146097;
    long long yoe = (doe - doe / 1460 + doe / 36524 - doe / 146096) / 365;
    long long y = yoe + era * 400;
    long long doy = doe - (365 * yoe + yoe / 4 - yoe / 100);
    long long mp = (5 * doy + 2) / 153;
    day = static_cast<int>(doy - (153 * mp + 2) / 5 + 1);
    month = static_cast<int>(mp < 10 ? mp + 3 : mp - 9);
    year = static_cast<int>(y + (month <= 2 ? 1 : 0));
}

bool IsValidCalendarDate(int year, int month, int day)
{
    return year >= 100 && year <= 9999 && month >= 1 && month <= 12 && day >= 1 &&
           day <= DaysInMonth(year, month);
}

COleDateTime::COleDateTime(double oleDate) : m_dt(oleDate)
{
    if (!(oleDate >= kMinOleDate && oleDate <= kMaxOleDate)) // also rejects NaN
        m_status = invalid;
}

COleDateTime::COleDateTime(int year, int month, int day, int hour, int minute, int second)
{
    SetDateTime(year, month, day, hour, minute, second);
}

int COleDateTime::SetDateTime(int year, int month, int day, int hour, int minute, int second)
{
    if (!IsValidCalendarDate(year, month, day) || hour < 0 || hour > 23 || minute < 0 || minute > 59 ||
        second < 0 || second > 59) {
        m_dt = 0.0;
        m_status = invalid;
        return 1;
    }
    long long days = DaysFromCivil(year, month, day);
    double fraction = (hour * 3600.0 + minute * 60.0 + second) / 86400.0;
    m_dt = days >= 0 ? static_cast<double>(days) + fraction : static_cast<double>(days) - fraction;
    m_status = valid;
    return 0;
}

COleDateTime COleDateTime::GetCurrentTime()
{
    std::time_t now = std::time(nullptr);
    std::tm local {};
    localtime_r(&now, &local);
    return COleDateTime(local.tm_year + 1900, local.tm_mon + 1, local.tm_mday, local.tm_hour, local.tm_min,
                        local.tm_sec);
}

double COleDateTime::LinearDays() const
{
    long long day = 0, seconds = 0;
    SplitOle(m_dt, day, seconds);
    return static_cast<double>(day) + static_cast<double>(seconds) / 86400.0;
}

COleDateTime COleDateTime::FromLinearDays(double days)
{
    COleDateTime result;
    if (!std::isfinite(days) || days < kMinOleDate || days >= kMaxOleDate + 1.0) {
        result.m_status = invalid;
        return result;
    }
    double whole = std::floor(days);
    double fraction = days - whole;
    result.m_dt = whole >= 0 ? whole + fraction : whole - fraction;
    if (whole < 0 && fraction == 0.0)
        result.m_dt = whole;
    return result;
}

bool COleDateTime::GetFields(int& year, int& month, int& day, int& hour, int& minute, int& second) const
{
    if (m_status != valid) {
        year = month = day = hour = minute = second = 0;
        return false;
    }
    long long dayIndex = 0, seconds = 0;
    SplitOle(m_dt, dayIndex, seconds);
    CivilFromDays(dayIndex, year, month, day);
    hour = static_cast<int>(seconds / 3600);
    minute = static_cast<int>(seconds / 60 % 60);
    second = static_cast<int>(seconds % 60);
    return true;
}

int COleDateTime::GetYear() const { int y, mo, d, h, mi, s; GetFields(y, mo, d, h, mi, s); return y; }
int COleDateTime::GetMonth() const { int y, mo, d, h, mi, s; GetFields(y, mo, d, h, mi, s); return mo; }
int COleDateTime::GetDay() const { int y, mo, d, h, mi, s; GetFields(y, mo, d, h, mi, s); return d; }
int COleDateTime::GetHour() const { int y, mo, d, h, mi, s; GetFields(y, mo, d, h, mi, s); return h; }
int COleDateTime::GetMinute() const { int y, mo, d, h, mi, s; GetFields(y, mo, d, h, mi, s); return mi; }
int COleDateTime::GetSecond() const { int y, mo, d, h, mi, s; GetFields(y, mo, d, h, mi, s); return s; }

long long COleDateTime::ToUnixSeconds() const
{
    long long day = 0, seconds = 0;
    SplitOle(m_dt, day, seconds);
    return (day + kDaysFrom1970To1899) * 86400 + seconds;
}

COleDateTime COleDateTime::FromUnixSeconds(long long seconds)
{
    long long day = seconds >= 0 ? seconds / 86400 : -((-seconds + 86399) / 86400);
    long long rest = seconds - day * 86400;
    return FromLinearDays(static_cast<double>(day - kDaysFrom1970To1899) + static_cast<double>(rest) / 86400.0);
}

COleDateTime COleDateTime::AddDays(double days) const
{
    if (m_status != valid)
        return *this;
    return FromLinearDays(LinearDays() + days);
}

std::string COleDateTime::Format(const char* format) const
{
    int year, month, day, hour, minute, second;
    if (!GetFields(year, month, day, hour, minute, second))
        return "Invalid DateTime";
    std::tm tm {};
    tm.tm_year = year - 1900;
    tm.tm_mon = month - 1;
    tm.tm_mday = day;
    tm.tm_hour = hour;
    tm.tm_min = minute;
    tm.tm_sec = second;
    long long days = DaysFromCivil(year, month, day);
    tm.tm_wday = static_cast<int>(((days + 6) % 7 + 7) % 7); // 1899-12-30 was a Saturday
    tm.tm_yday = static_cast<int>(days - DaysFromCivil(year, 1, 1));
    // strftime writes the years 100 to 999 with three digits; a date's year always has four.
    std::string pattern;
    for (const char* p = format; *p != '\0'; ++p) {
        if (p[0] == '%' && p[1] == 'Y') {
            pattern += text::Format("%04d", year);
            ++p;
        } else {
            pattern += *p;
            if (p[0] == '%' && p[1] != '\0')
                pattern += *++p;
        }
    }
    char buffer[256];
    size_t n = std::strftime(buffer, sizeof(buffer), pattern.c_str(), &tm);
    return std::string(buffer, n);
}
