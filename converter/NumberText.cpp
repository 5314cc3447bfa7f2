#include "converter/NumberText.h"

#include <charconv>
#include <cmath>
#include <cstdint>

namespace converter {

namespace {
bool IsBlank(char c) { return c == ' ' || c == '\t' || c == '\r' || c == '\n'; }
constexpr size_t kLongestNumber = 128;

// Powers of ten a double holds exactly.
constexpr double kPowersOfTen[] = {1e0,  1e1,  1e2,  1e3,  1e4,  1e5,  1e6,  1e7,  1e8,  1e9,  1e10, 1e11,
                                   1e12, 1e13, 1e14, 1e15, 1e16, 1e17, 1e18, 1e19, 1e20, 1e21, 1e22};
constexpr std::uint64_t kExactMantissa = 1ull << 53;

// Plain decimals ("-12.345", at most 15 digits, no exponent) as one exact integer divided by an
// exact power of ten: IEEE division rounds correctly, so this is the value from_chars gives.
bool ReadPlainDecimal(std::string_view text, double& value)
{
    const char* p = text.data();
    const char* const end = p + text.size();
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
    if (p != end || digits == 0 || digits > 15)
        return false;
    value = static_cast<double>(mantissa) / kPowersOfTen[decimals];
    if (negative)
        value = -value;
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

// Writes the integer `digits` with a point before its last `decimals` digits.
char* WriteScaled(std::uint64_t digits, int decimals, bool negative, char* out)
{
    char buffer[24];
    int n = 0;
    do {
        buffer[n++] = static_cast<char>('0' + digits % 10);
        digits /= 10;
    } while (digits > 0 || n <= decimals);
    if (negative)
        *out++ = '-';
    while (n > 0) {
        if (n == decimals)
            *out++ = '.';
        *out++ = buffer[--n];
    }
    return out;
}

} // namespace

char* FormatValue(double value, char* out)
{
    if (std::isnan(value))
        return out;
    // Most measured values have a few decimals: find the fewest that give the value back exactly
    // (an exact integer over an exact power of ten divides back to it), else the general form.
    const double magnitude = std::fabs(value);
    if (magnitude < 1e15 && magnitude >= 1e-6) {
        for (int decimals = 0; decimals <= 15; ++decimals) {
            const double scaled = magnitude * kPowersOfTen[decimals];
            if (scaled >= static_cast<double>(kExactMantissa))
                break;
            const auto digits = static_cast<std::uint64_t>(scaled + 0.5);
            // Only a near-integer can be the one; the division then decides exactly.
            if (std::fabs(scaled - static_cast<double>(digits)) <= scaled * 1e-12 &&
                static_cast<double>(digits) / kPowersOfTen[decimals] == magnitude)
                return WriteScaled(digits, decimals, std::signbit(value), out);
        }
    }
    return std::to_chars(out, out + 32, value).ptr;
}

} // namespace converter
