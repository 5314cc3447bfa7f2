#pragma once
// Time stamps as text, on the hot path of every conversion: stamps of the fields the date/time
// reader (sys::DateFormat) gives, a reader for runs of stamps that share their day, and the fixed
// output form "YYYY/MM/DD HH:mm:ss".
#include "converter/TimeSeries.h"
#include "platform/system/DateFormat.h"

#include <array>
#include <cstring>
#include <optional>
#include <string>
#include <string_view>

namespace converter {

inline constexpr long long kSecondsPerDay = 86400;

// The stamp of calendar fields; nothing when the calendar has no such day (30 February).
std::optional<Stamp> StampFromFields(const sys::DateTimeFields& fields);

// Reads the stamps of a run of rows with one format. Most rows share the date of the row before:
// when a compact stamp's ten date characters are the previous compact stamp's, only its clock is
// read. The stamps are those Read and StampFromFields give.
class StampReader {
public:
    // `format` must outlive the reader; `start` holds the fields the format does not read.
    StampReader(const sys::DateFormat& format, const sys::DateTimeFields& start) : m_format(format), m_start(start) {}

    // False when the text does not read or names a day the calendar does not have.
    bool Read(std::string_view text, Stamp& stamp)
    {
        if (m_known && text.size() == kCompactLength && std::memcmp(text.data(), m_date.data(), m_date.size()) == 0 &&
            ReadClock(text, stamp))
            return true;
        return ReadWhole(text, stamp);
    }

private:
    static constexpr size_t kCompactLength = 19; // "YYYY/MM/DD HH:mm:ss"
    bool ReadClock(std::string_view text, Stamp& stamp) const;
    bool ReadWhole(std::string_view text, Stamp& stamp);

    const sys::DateFormat& m_format;
    sys::DateTimeFields m_start;
    bool m_known = false;
    std::array<char, 10> m_date{}; // the date characters of the last compact stamp
    Stamp m_dayStart = 0;          // its midnight
};
sys::DateTimeFields FieldsFromStamp(Stamp stamp);

// The spreadsheet's day numbers (serials), to the second. The sheet's calendar has a 29 February
// 1900 (serial 60), so serial 1 is 1 January 1900 and serials from 61 on count the days since
// 30 December 1899, as automation dates do. Below 1 (a time of day; a date before 1900 as other
// tools write it) a serial counts from 30 December 1899 too. Serial 60 is no stamp.
std::optional<Stamp> StampFromSheetSerial(double serial);
// Nothing for stamps before 1 January 1900, which a sheet cannot show as dates.
std::optional<double> SheetSerialFromStamp(Stamp stamp);

// Writes "YYYY/MM/DD HH:mm:ss" (19 characters) at `out`; returns the position after it.
char* FormatStamp(Stamp stamp, char* out);
std::string FormatStamp(Stamp stamp);

// FormatStamp for a run of stamps of which most share the day of the one before: the date text
// is kept from row to row and only the clock is written anew.
class StampPrinter {
public:
    char* Write(Stamp stamp, char* out);

private:
    long long m_day = 0;
    bool m_known = false;
    std::array<char, 11> m_date{}; // "YYYY/MM/DD "
};

} // namespace converter
