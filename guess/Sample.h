#pragma once
// The head of a file as the guesser looks at it: rows of cells, numbered as a template numbers
// rows. A text file's rows are its lines split by the delimiter being tried; a workbook's are the
// rows of a sheet, a cell's place in its row being its column.
#include <string>
#include <vector>

namespace guess {

struct SampleCell {
    std::string text;        // the field, or what the sheet displays
    bool numberCell = false; // a workbook's number or boolean cell
    bool dateCell = false;   // a workbook's number shown as a date or a time
    double number = 0;       // the value of a number cell
};

struct SampleRow {
    long number = 0;               // line or worksheet row, from 1
    std::string line;              // a text file's line as it stands
    std::vector<SampleCell> cells; // fields; for a workbook index = column - 1 (blank cells empty)
};

struct Sample {
    bool excel = false;
    int sheet = 1;               // the worksheet read
    std::vector<SampleRow> rows; // the rows that are not empty
    long rowsRead = 0;           // rows (lines) read, empty ones too
    bool wholeFile = false;      // the file ended within the rows read
};

// One choice of the guess, for --explain: the template key it sets, what it chose, the evidence,
// and where the file could be read another way and what decided.
struct Finding {
    std::string key;
    std::string value;
    std::string evidence;
    std::string ambiguity;
};

// Why a file cannot be read as a time series, and where.
struct Refusal {
    long line = 0; // 0 when no one line is at fault
    std::string reason;
};

} // namespace guess
