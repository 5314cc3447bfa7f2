#pragma once
// The guesser's one door to the text readers: the head of a text file read by the line reader,
// lines split by the delimited-text field rule, date/time texts read by the date/time reader and
// numbers as the conversion engine reads them. Everything the guesser decides is tried through
// these calls, so a guess holds for the engine.
#include "converter/NumberText.h"
#include "converter/StampText.h"
#include "platform/system/DateFormat.h"

#include "delimited/Dialect.h"

#include <cstdint>
#include <memory>
#include <string>
#include <string_view>
#include <vector>

namespace delimited {
class FieldSplitter;
}

namespace guess {

using converter::Stamp;
using StampFields = sys::DateTimeFields;
using converter::ValueText;

// One line of a text file, numbered from 1 as a template counts rows.
struct TextLine {
    long number = 0;
    std::string text;
};

// The first lines of a text file.
struct TextHead {
    std::vector<TextLine> lines;
    bool wholeFile = false;     // the file ended within the head
    std::uint64_t bytesRead = 0; // of the text, as UTF-8
    bool utf16 = false;
};

// Reads lines from the start of `path` until `maxLines` lines or `maxBytes` bytes have been taken,
// never more: the time it takes does not depend on the size of the file. False with `error`
// ("file:line: reason") when the file cannot be read as text.
bool ReadTextHead(const std::string& path, size_t maxLines, size_t maxBytes, TextHead& head, std::string& error);

// A template's delimiter values, by the names the template stores; Rules() gives what they mean
// to the field rule.
struct Dialect {
    std::string delimiterName = "Tab"; // "Tab", "Comma", "Semi Colon", "Space" or "User Defined"
    std::string userDelimiter;         // the text of "User Defined"
    bool consecutive = false;          // a run of delimiters counts as one
    bool leading = false;              // delimiters at the start of a line are passed over

    // The delimiter's text.
    std::string Text() const;
    // The dialect the delimited-text reader takes.
    delimited::Dialect Rules() const;
    bool operator==(const Dialect&) const = default;
};

// Splits lines into the fields the engine's reader takes from them.
class LineSplitter {
public:
    explicit LineSplitter(const Dialect& dialect);
    ~LineSplitter();
    LineSplitter(const LineSplitter&) = delete;
    LineSplitter& operator=(const LineSplitter&) = delete;

    // The fields of `line`; `quoteError` (may be null) tells of a malformed quoted field.
    std::vector<std::string> Split(std::string_view line, bool* quoteError = nullptr);

private:
    std::unique_ptr<delimited::FieldSplitter> m_splitter;
};

// What part of a stamp a format reads.
enum class StampPart { DateTime, Date, Time };

// Reads `text` with the date/time `format` into `fields` (which hold the starting values), as the
// engine does; `extraSeparators` also split the format and the text (the ASCII delimiter when the
// date/time spans several fields). False when the text does not read.
bool ReadStampText(std::string_view text, std::string_view format, StampPart part, StampFields& fields,
                   std::string_view extraSeparators = {});
// The stamp of calendar fields; false for a day the calendar does not have.
bool StampOf(const StampFields& fields, Stamp& stamp);
// The calendar fields of a stamp.
StampFields FieldsOf(Stamp stamp);
// The stamp of a worksheet's day number (dates from 1900, as the sheet counts them).
bool StampOfSheetSerial(double serial, Stamp& stamp);
// "YYYY/MM/DD HH:mm:ss"
std::string StampText(Stamp stamp);

// Reads a value field with the decimal separator text ("." or ",").
ValueText ReadNumber(std::string_view field, std::string_view decimalSeparator, double& value);

} // namespace guess
