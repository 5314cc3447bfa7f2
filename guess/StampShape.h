#pragma once
// What a cell's text looks like as a date, a time or both: its runs of digits and what stands
// between them. A shape is judged without a format; the formats a shape allows are then tried with
// the engine's own date/time reading.
#include <string>
#include <string_view>
#include <vector>

namespace guess {

enum class StampKind { None, Date, Time, DateTime };

// Why a text that looks like a date or time cannot be read by any format.
enum class StampFlaw { None, TwoDigitYear, NoSeparators, AmPm };

// The order of day, month and year in a date.
enum class DateOrder { YearMonthDay, DayMonthYear, MonthDayYear };

struct StampShape {
    StampKind kind = StampKind::None;
    StampFlaw flaw = StampFlaw::None;
    bool yearFirst = false;  // the four-digit year leads the date
    int firstNumber = 0;     // the first and second number of a date whose year stands last
    int secondNumber = 0;
    int timeNumbers = 0;     // 2 (hours and minutes) or 3 (and seconds) numbers of the clock read

    struct Run {
        size_t start = 0;
        size_t length = 0;
    };
    std::vector<Run> runs; // the digit runs that carry fields, in text order
};

// The shape of `text` (blanks around it are passed over).
StampShape ShapeOf(std::string_view text);

// The format that reads a text of this shape with the date order given ("DD.MM.YYYY HH:mm"): the
// text's own separators between letters, the letters of each field.
std::string FormatOf(std::string_view text, const StampShape& shape, DateOrder order);

// A text with a four-digit year somewhere in it as "YYYY-MM-DD" (header lines and file names that
// name the day of a file); empty when there is none or its order cannot be told.
std::string FindDateIn(std::string_view text);
// A clock time ("08:00", "8:00:00") somewhere in `text` as "HH:MM:SS"; empty when there is none.
std::string FindTimeIn(std::string_view text);

} // namespace guess
