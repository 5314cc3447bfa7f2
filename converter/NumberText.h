#pragma once
// Values as text on the hot path: reading a field with the template's decimal separator
// (NumberText.cpp), and writing a double in the shortest text that reads back to the same double
// (ValueFormat.cpp).
#include <cstdint>
#include <string>
#include <string_view>
#include <vector>

namespace converter {

// Powers of ten a double holds exactly.
inline constexpr double kPowersOfTen[] = {1e0,  1e1,  1e2,  1e3,  1e4,  1e5,  1e6,  1e7,  1e8,  1e9,  1e10, 1e11,
                                          1e12, 1e13, 1e14, 1e15, 1e16, 1e17, 1e18, 1e19, 1e20, 1e21, 1e22};
// Integers below this are exact in a double.
inline constexpr unsigned long long kExactMantissa = 1ull << 53;

enum class ValueText {
    Number,          // `value` holds it
    Empty,           // blank field: a missing value
    WrongSeparator,  // uses the other of "." and "," than the template's separator (delimited::Dialect)
    NotANumber,
};

class NumberReader {
public:
    // `decimalSeparator` as the template gives it ("." or "," or a locale's text).
    explicit NumberReader(std::string_view decimalSeparator);
    ValueText Read(std::string_view field, double& value) const;
    // True when a plain decimal read by ScanPlainDecimal is the value Read gives its whole text.
    bool ReadsPlainDecimals() const { return m_pointSeparator; }

private:
    std::string m_separator;
    bool m_pointSeparator = false;
};

// Reads "-12.345" (an optional minus, at most 15 digits, an optional point, no exponent) from the
// start of [p, end); returns where it stopped, or nullptr when there is no such number there.
const char* ScanPlainDecimal(const char* p, const char* end, double& value);

// Bytes from a field's start that the plain field readers read, however short the field.
inline constexpr size_t kPlainFieldReach = 32;

// Reads a whole field of the form "-12.345" (an optional minus, at most 15 digits and an optional
// point) with the value ScanPlainDecimal gives it, looking at its bytes in blocks rather than one by
// one. False for a field of any other form, which the caller then reads in general. Reads
// kPlainFieldReach bytes from `field`, past its end too: the caller's buffer must have them.
bool ReadPlainField(const char* field, size_t length, double& value);

// A field of a line: where it starts and how long it is.
struct FieldSpan {
    std::uint32_t start = 0;
    std::uint32_t length = 0;
};

// Reads the fields `spans` marks in `text` as ReadPlainField does, into values[0], values[1], ...,
// up to the first that is not a plain decimal; returns how many were read.
using PlainFieldsReader = size_t (*)(const char* text, const FieldSpan* spans, size_t count, double* values);
// The readers this processor can run, the fastest last: the same values by different instructions.
// The first (word arithmetic) also stops at a field with more than 8 digits on one side of the point.
std::vector<PlainFieldsReader> PlainFieldsReadersOfThisProcessor();
PlainFieldsReader FastestPlainFieldsReader();

// Writes the shortest round-trip text of `value` at `out` (at most 32 characters; `out` must have
// room for all 32, which may be overwritten); returns the end.
char* FormatValue(double value, char* out);

} // namespace converter
