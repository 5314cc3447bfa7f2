#include "converter/NumberText.h"

#include <charconv>
#include <cmath>
#include <cstdint>
#include <cstring>

namespace converter {

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

} // namespace converter
