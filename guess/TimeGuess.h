#pragma once
// Where the dates and times of the data rows stand and how they read: the date/time option, its
// column(s), its format (day-first or month-first decided by the values), the global date or time
// for the options that need one, and the row where the data start.
#include "guess/Sample.h"
#include "guess/StampShape.h"
#include "guess/TextAccess.h"

#include <optional>
#include <string>
#include <vector>

namespace guess {

struct TimeContext {
    std::string delimiter;   // a text file's delimiter text; empty for a workbook
    size_t fieldCount = 0;   // a text file's fields per data line; a workbook's last used column
    std::string fileName;    // may name the day of the file
};

struct TimeLayout {
    int option = 0;          // 0 date and time in the rows, 1 one date for all, 2 one time for all
    int column = 1;          // first column of the date/time, from 1
    int width = 1;           // columns it spans
    std::string format;      // the format of the option
    bool useFormat = true;   // workbooks: the cells' texts are read with the format
    std::string globalDate;  // "YYYY-MM-DD" (option 1)
    std::string globalTime;  // "HH:MM:SS" (option 2)
    long startRow = 0;       // the first data row
    std::vector<size_t> dataRows; // the sample rows that read as data, from the start row on
};

// Finds the date/time of the data rows. Nothing, with `refusal` set, when no column holds dates
// or times that a template can read.
std::optional<TimeLayout> GuessTime(const Sample& sample, const TimeContext& context, std::vector<Finding>& findings,
                                    Refusal& refusal);

// The stamp of a row read as the engine reads it with this layout; false when it does not read.
bool RowStamp(const SampleRow& row, const TimeLayout& layout, const TimeContext& context, bool excel, Stamp& stamp);

} // namespace guess
