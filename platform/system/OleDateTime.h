#pragma once
// A date-time as an OLE automation date: days since 30 December 1899 as a double, the fraction
// being the time of day, with a valid/invalid status. Years 100 to 9999.
#include <string>

class COleDateTime {
public:
    enum DateTimeStatus { valid = 0, invalid = 1 };

    COleDateTime() = default; // 30 December 1899 00:00:00, valid
    explicit COleDateTime(double oleDate);
    COleDateTime(int year, int month, int day, int hour, int minute, int second);

    // Sets the value from calendar fields; returns 0 on success, 1 (and the invalid status) for a
    // combination the calendar does not have or a field outside its range.
    int SetDateTime(int year, int month, int day, int hour, int minute, int second);
    int SetDate(int year, int month, int day) { return SetDateTime(year, month, day, 0, 0, 0); }

    static COleDateTime GetCurrentTime();
    // Days from the calendar-linear count (calendar day since 1899-12-30 plus fraction of the day).
    static COleDateTime FromLinearDays(double days);

    DateTimeStatus GetStatus() const { return m_status; }
    bool IsValid() const { return m_status == valid; }
    void SetStatus(DateTimeStatus status) { m_status = status; }
    double GetOleDate() const { return m_dt; }
    // The calendar-linear day count: unlike the OLE value, the time of day always adds.
    double LinearDays() const;

    // Calendar fields, rounded to the nearest second; all 0 when invalid.
    int GetYear() const;
    int GetMonth() const;
    int GetDay() const;
    int GetHour() const;
    int GetMinute() const;
    int GetSecond() const;
    // All six at once; false when invalid.
    bool GetFields(int& year, int& month, int& day, int& hour, int& minute, int& second) const;
    // Seconds since 1970-01-01 00:00:00 (the value taken as UTC), rounded to the second.
    long long ToUnixSeconds() const;
    static COleDateTime FromUnixSeconds(long long seconds);

    // Adds `days` (a time span; may be fractional or negative). An invalid value stays invalid.
    COleDateTime AddDays(double days) const;

    // strftime-style formatting; "Invalid DateTime" when the value is invalid.
    std::string Format(const char* format) const;

private:
    double m_dt = 0.0;
    DateTimeStatus m_status = valid;
};

// Days since 1899-12-30 of a proleptic Gregorian date (no range check).
long long DaysFromCivil(int year, int month, int day);
void CivilFromDays(long long days, int& year, int& month, int& day);
bool IsValidCalendarDate(int year, int month, int day);
