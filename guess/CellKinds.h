#pragma once
// What one cell holds, judged without a template: a number (with a point or a comma), something
// shaped like a date or a time, a text; and whether a value looks like a missing-value marker.
#include "guess/Sample.h"

#include <string>
#include <string_view>

namespace guess {

enum class ValueKind { Empty, Number, Text };

// A value cell read with the decimal separator text ("." or ","); `value` holds a number.
ValueKind ValueOf(const SampleCell& cell, std::string_view decimalSeparator, double& value);

// True for a blank field, a number with either decimal separator, or a date/time shape: what the
// data lines of a time series are made of.
bool LooksTyped(std::string_view text);

// "1,5" or "-0,25": a number with a comma as its decimal separator (one comma, digits on both sides).
bool IsCommaDecimal(std::string_view text);
// "1.5" or "-2.5e3": a number with a decimal point.
bool IsPointDecimal(std::string_view text);

// A number that files use for "no value": nines (-999, -99.9, 9999), a huge or tiny power of ten
// (-1e-35, 1.0E+30), or the 16-bit extremes -32768 and -32767.
bool IsSentinelNumber(std::string_view text);

// A blank-trimmed copy of `text`, as the readers compare it.
std::string Trimmed(std::string_view text);

} // namespace guess
