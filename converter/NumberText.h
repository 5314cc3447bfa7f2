#pragma once
// Values as text on the hot path: reading a field with the template's decimal separator, and
// writing a double in the shortest text that reads back to the same double.
#include <string>
#include <string_view>

namespace converter {

enum class ValueText {
    Number,          // `value` holds it
    Empty,           // blank field: a missing value
    WrongSeparator,  // uses the other of "." and "," than the template's separator
    NotANumber,
};

class NumberReader {
public:
    // `decimalSeparator` as the template gives it ("." or "," or a locale's text).
    explicit NumberReader(std::string_view decimalSeparator);
    ValueText Read(std::string_view field, double& value) const;

private:
    std::string m_separator;
    bool m_pointSeparator = false;
    char m_other = 0; // the separator that must not appear when "." or "," is in force; 0 for none
};

// Writes the shortest round-trip text of `value` at `out` (at most 32 characters; `out` must have
// room for all 32, which may be overwritten); returns the end.
char* FormatValue(double value, char* out);

} // namespace converter
