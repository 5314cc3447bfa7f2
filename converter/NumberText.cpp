#include "converter/NumberText.h"

#include <charconv>
#include <cmath>
#include <cstdint>
#include <cstring>

namespace converter {

namespace {
// Powers of ten a double holds exactly.
constexpr double kPowersOfTen[] = {1e0,  1e1,  1e2,  1e3,  1e4,  1e5,  1e6,  1e7,  1e8,  1e9,  1e10, 1e11,
                                   1e12, 1e13, 1e14, 1e15, 1e16, 1e17, 1e18, 1e19, 1e20, 1e21, 1e22};
} // namespace

// Plain decimals ("-12.345", at most 15 digits, no exponent) as one exact integer divided by an
// exact power of ten: IEEE division rounds correctly, so this is the value from_chars gives.
const char* ScanPlainDecimal(const char* p, const char* end, double& value)
{
    const bool negative = p < end && *p == '-';
    if (negative)
        ++p;
    // Unsigned arithmetic may wrap on long texts; those are refused by the digit count below.
    std::uint64_t mantissa = 0;
    const char* const integerStart = p;
    while (p < end && static_cast<unsigned>(*p - '0') < 10)
        mantissa = mantissa * 10 + static_cast<unsigned>(*p++ - '0');
    size_t digits = static_cast<size_t>(p - integerStart);
    size_t decimals = 0;
    if (p < end && *p == '.') {
        const char* const fractionStart = ++p;
        while (p < end && static_cast<unsigned>(*p - '0') < 10)
            mantissa = mantissa * 10 + static_cast<unsigned>(*p++ - '0');
        decimals = static_cast<size_t>(p - fractionStart);
        digits += decimals;
    }
    if (digits == 0 || digits > 15)
        return nullptr;
    value = static_cast<double>(mantissa) / kPowersOfTen[decimals];
    if (negative)
        value = -value;
    return p;
}

namespace {
bool IsBlank(char c) { return c == ' ' || c == '\t' || c == '\r' || c == '\n'; }
constexpr size_t kLongestNumber = 128;

constexpr std::uint64_t kExactMantissa = 1ull << 53;

bool ReadPlainDecimal(std::string_view text, double& value)
{
    const char* const end = text.data() + text.size();
    double read = 0;
    if (ScanPlainDecimal(text.data(), end, read) != end)
        return false;
    value = read;
    return true;
}
} // namespace

NumberReader::NumberReader(std::string_view decimalSeparator)
    : m_separator(decimalSeparator), m_pointSeparator(decimalSeparator == ".")
{
    if (m_separator == ".")
        m_other = ',';
    else if (m_separator == ",")
        m_other = '.';
}

ValueText NumberReader::Read(std::string_view field, double& value) const
{
    // Most fields are plain decimals without blanks around them.
    if (m_pointSeparator && !field.empty() && field.front() != ' ' && ReadPlainDecimal(field, value))
        return ValueText::Number;
    size_t b = 0, e = field.size();
    while (b < e && IsBlank(field[b]))
        ++b;
    while (e > b && IsBlank(field[e - 1]))
        --e;
    if (b == e)
        return ValueText::Empty;
    std::string_view text = field.substr(b, e - b);
    if (m_pointSeparator) {
        if (ReadPlainDecimal(text, value))
            return ValueText::Number;
        if (text.find('.') == std::string_view::npos && text.find(',') != std::string_view::npos)
            return ValueText::WrongSeparator;
    } else if (m_other != 0 && text.find(m_separator) == std::string_view::npos &&
               text.find(m_other) != std::string_view::npos) {
        return ValueText::WrongSeparator;
    }
    if (text.front() == '+')
        text.remove_prefix(1);

    char buffer[kLongestNumber];
    if (!m_separator.empty() && !m_pointSeparator && text.find(m_separator) != std::string_view::npos) {
        // Rewrite the separator as a point; a number longer than any double needs is not a number.
        size_t n = 0;
        for (size_t i = 0; i < text.size();) {
            if (n == sizeof buffer)
                return ValueText::NotANumber;
            if (text.compare(i, m_separator.size(), m_separator) == 0) {
                buffer[n++] = '.';
                i += m_separator.size();
            } else {
                buffer[n++] = text[i++];
            }
        }
        text = std::string_view(buffer, n);
    }
    const char* end = text.data() + text.size();
    auto [ptr, ec] = std::from_chars(text.data(), end, value);
    if (ptr != end || (ec != std::errc() && ec != std::errc::result_out_of_range))
        return ValueText::NotANumber;
    if (ec == std::errc::result_out_of_range)
        return ValueText::NotANumber;
    return ValueText::Number;
}

namespace {

constexpr char kDigitPairs[] = "00010203040506070809101112131415161718192021222324252627282930313233343536373839"
                               "40414243444546474849505152535455565758596061626364656667686970717273747576777879"
                               "8081828384858687888990919293949596979899";

// Writes `value` (below 10^8) as eight digits; the four pairs do not wait on each other.
void WriteEightDigits(std::uint32_t value, char* out)
{
    const std::uint32_t high = value / 10000, low = value % 10000;
    std::memcpy(out, kDigitPairs + 2 * (high / 100), 2);
    std::memcpy(out + 2, kDigitPairs + 2 * (high % 100), 2);
    std::memcpy(out + 4, kDigitPairs + 2 * (low / 100), 2);
    std::memcpy(out + 6, kDigitPairs + 2 * (low % 100), 2);
}

// Writes the integer `digits` (below 10^16) with a point before its last `decimals` digits. All
// copies have a fixed length, so none becomes a library call; `out` has room for 32 characters.
char* WriteScaled(std::uint64_t digits, int decimals, bool negative, char* out)
{
    char buffer[32] = {};
    WriteEightDigits(static_cast<std::uint32_t>(digits / 100000000), buffer);
    WriteEightDigits(static_cast<std::uint32_t>(digits % 100000000), buffer + 8);
    int first = 0;
    while (first < 15 - decimals && buffer[first] == '0')
        ++first;
    char text[48];
    char* p = text;
    *p = '-';
    p += negative;
    std::memcpy(p, buffer + first, 16);
    p += 16 - decimals - first;
    if (decimals > 0) {
        *p++ = '.';
        std::memcpy(p, buffer + 16 - decimals, 16);
        p += decimals;
    }
    std::memcpy(out, text, 32);
    return out + (p - text);
}

// The digits of `magnitude` at `decimals` decimals when they divide back to it exactly.
bool ExactAt(double magnitude, int decimals, std::uint64_t& digits)
{
    const double scaled = magnitude * kPowersOfTen[decimals];
    if (scaled >= static_cast<double>(kExactMantissa))
        return false;
    digits = static_cast<std::uint64_t>(scaled + 0.5);
    return static_cast<double>(digits) / kPowersOfTen[decimals] == magnitude;
}

} // namespace

char* FormatValue(double value, char* out)
{
    if (std::isnan(value))
        return out;
    // Most measured values have a few decimals. Scaled to below 10^15 the product is within a
    // quarter of the integer a short decimal gives, so one rounding finds it (an exact integer
    // over an exact power of ten divides back to the value), and its trailing zeros give the
    // fewest decimals. One place further can still hold an exact integer below 2^53.
    const double magnitude = std::fabs(value);
    if (magnitude < 1e15 && magnitude >= 1e-6) {
        int integerDigits = 0;
        while (integerDigits < 15 && magnitude >= kPowersOfTen[integerDigits])
            ++integerDigits;
        int decimals = 15 - integerDigits;
        std::uint64_t digits = 0;
        bool exact = ExactAt(magnitude, decimals, digits);
        if (exact) {
            for (int zeros : {8, 4, 2, 1}) {
                const auto power = static_cast<std::uint64_t>(kPowersOfTen[zeros]);
                if (decimals >= zeros && digits % power == 0) {
                    digits /= power;
                    decimals -= zeros;
                }
            }
        } else if (decimals < 15) {
            exact = ExactAt(magnitude, ++decimals, digits);
        }
        if (exact)
            return WriteScaled(digits, decimals, std::signbit(value), out);
    }
    return std::to_chars(out, out + 32, value).ptr;
}

} // namespace converter
