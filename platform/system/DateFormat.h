#pragma once
// Reading date/time texts by a format such as "YYYY/MM/DD HH:mm:ss": the one date/time reader of
// the preview, the engine and the bridge. Format and text are split alike at any run of the
// separators "/ T:-.|" (and any extra ones given); the k-th format token says by its first letter
// what the k-th text token holds: Y/y year, M month, D/d day, H/h hour, m minute, S/s second. Other
// tokens are passed over. A format is compiled once and applied to any number of texts without
// allocating.
#include <string_view>
#include <vector>

namespace sys {

// The six calendar fields of a date/time.
struct DateTimeFields {
    int year = 1900, month = 1, day = 1, hour = 0, minute = 0, second = 0;
};

class DateFormat {
public:
    // Which fields the format reads; the tokens naming the others are passed over.
    enum class Reads { DateTime, Date, Time };

    // `extraSeparators` also split format and text (the ASCII field delimiter, when a date/time
    // spans several fields that are joined by blanks before reading).
    explicit DateFormat(std::string_view format, Reads reads = Reads::DateTime, std::string_view extraSeparators = {});

    // Reads `text` into `fields`, which hold the starting values on entry: a field whose token the
    // text does not reach keeps its value. False when a token the format names is not a number ("%d"
    // scanning: blanks, a sign, digits) or a field is out of its range (years 100 to 9999, months 1
    // to 12, days 1 to 31, hours 0 to 23, minutes and seconds 0 to 59). A day the calendar does not
    // have (30 February) is not refused here.
    bool Read(std::string_view text, DateTimeFields& fields) const;

    // Read token by token, without the compact shortcut: the reference the shortcut is held to.
    bool ReadTokens(std::string_view text, DateTimeFields& fields) const;

    // How many tokens the format has.
    size_t TokenCount() const { return m_fields.size(); }

    // True for a Y M D H m S format, which reads "dddd?dd?dd?dd?dd?dd" by position (ReadCompact).
    bool IsCompact() const { return m_compact; }
    bool IsSeparator(char c) const { return m_separator[static_cast<unsigned char>(c)]; }
    // "dddd?dd?dd?dd?dd?dd" read by a compact format by the positions of its digits; false for any
    // other text (ReadTokens then reads it) and for fields out of their ranges.
    bool ReadCompact(std::string_view text, DateTimeFields& fields) const;

private:
    enum class Field : unsigned char { None, Year, Month, Day, Hour, Minute, Second };
    std::vector<Field> m_fields; // one per format token
    size_t m_lastUsed = 0;       // one past the last token that reads a field
    bool m_separator[256] = {};
    bool m_compact = false; // the format is Y M D H m S, so ReadCompact may apply
};

// The tokens of a date/time text split as the reader splits it (at any run of "/ T:-.|").
std::vector<std::string_view> DateTimeTokens(std::string_view text);

} // namespace sys
