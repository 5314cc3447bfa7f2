#pragma once
// Time stamps as text, on the hot path of every conversion: a date/time format compiled once and
// applied to millions of texts without allocating, and the fixed output form "YYYY/MM/DD HH:mm:ss".
// Reading gives the same fields as ParseDateTimeText / ParseDateText / ParseTimeText for the same
// texts (tests/converter compares them).
#include "converter/TimeSeries.h"

#include <array>
#include <cstring>
#include <optional>
#include <string>
#include <string_view>

namespace converter {

inline constexpr long long kSecondsPerDay = 86400;

// The six calendar fields of a stamp.
struct StampFields {
    int year = 1900, month = 1, day = 1, hour = 0, minute = 0, second = 0;
};

class DateFormat {
public:
    enum class Reads { DateTime, Date, Time };

    // `format` such as "YYYY/MM/DD HH:mm:ss"; `extraSeparators` also split it (the ASCII field
    // delimiter, when a stamp spans several fields that are joined by blanks before reading).
    explicit DateFormat(std::string_view format, Reads reads = Reads::DateTime,
                        std::string_view extraSeparators = {});

    // Reads `text` into `fields`, which hold the starting values on entry. False when a token the
    // format names is not a number or a field is out of its range.
    bool Read(std::string_view text, StampFields& fields) const;

    // How many tokens the format has.
    size_t TokenCount() const { return m_count; }

    // True for a Y M D H m S format, which reads "dddd?dd?dd?dd?dd?dd" by position (ReadCompact).
    bool IsCompact() const { return m_compact; }
    bool IsSeparator(char c) const { return m_separator[static_cast<unsigned char>(c)]; }
    // "dddd?dd?dd?dd?dd?dd" read by a compact format without tokenizing; false for any other text
    // (Read then reads it in general) and for fields out of their ranges.
    bool ReadCompact(std::string_view text, StampFields& fields) const;

private:
    enum class Field : unsigned char { None, Year, Month, Day, Hour, Minute, Second };
    static constexpr size_t kMaxTokens = 32; // tokens past this read nothing, as "other" tokens do
    std::array<Field, kMaxTokens> m_fields{};
    size_t m_count = 0;
    size_t m_lastUsed = 0; // one past the last token that reads a field
    std::array<bool, 256> m_separator{};
    bool m_compact = false; // the format is Y M D H m S, so ReadCompact may apply
};

// The stamp of calendar fields; nothing when the calendar has no such day (30 February).
std::optional<Stamp> StampFromFields(const StampFields& fields);

// Reads the stamps of a run of rows with one format. Most rows share the date of the row before:
// when a compact stamp's ten date characters are the previous compact stamp's, only its clock is
// read. The stamps are those Read and StampFromFields give.
class StampReader {
public:
    // `format` must outlive the reader; `start` holds the fields the format does not read.
    StampReader(const DateFormat& format, const StampFields& start) : m_format(format), m_start(start) {}

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

    const DateFormat& m_format;
    StampFields m_start;
    bool m_known = false;
    std::array<char, 10> m_date{}; // the date characters of the last compact stamp
    Stamp m_dayStart = 0;          // its midnight
};
StampFields FieldsFromStamp(Stamp stamp);

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
