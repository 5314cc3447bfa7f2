#include "converter/NumberText.h"

#include <charconv>
#include <cmath>
#include <cstdint>
#include <cstring>

#if defined(__SSE2__)
#include <emmintrin.h>
#endif

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

constexpr std::uint64_t kIntegerPowersOfTen[] = {1, 10, 100, 1000, 10000, 100000, 1000000, 10000000, 100000000};

// The value of the `count` (0 to 8) decimal digits at `digits`; the 8 bytes from there are read.
std::uint32_t EightDigitsValue(const char* digits, unsigned count)
{
    std::uint64_t word;
    std::memcpy(&word, digits, sizeof word);
    // Bytes after the digits may borrow from the ones above them only, which the shift drops; the
    // digits move to the top, below them come zeros that read as leading zeros.
    word -= 0x3030303030303030ull;
    word = count == 0 ? 0 : word << (8 * (8 - count));
    // Neighbouring digits joined into pairs, pairs into fours, fours into the eight.
    word = ((word * (10 * 256 + 1)) >> 8) & 0x00FF00FF00FF00FFull;
    word = ((word * (100 * 65536 + 1)) >> 16) & 0x0000FFFF0000FFFFull;
    return static_cast<std::uint32_t>((word * (10000 * (1ull << 32) + 1)) >> 32);
}

} // namespace

bool ReadPlainField(const char* field, size_t length, double& value)
{
#if defined(__SSE2__)
    const bool negative = length > 0 && field[0] == '-';
    const char* const text = field + (negative ? 1 : 0);
    const size_t count = length - (negative ? 1 : 0);
    if (count == 0 || count > 16)
        return false;
    const __m128i bytes = _mm_loadu_si128(reinterpret_cast<const __m128i*>(text));
    const __m128i digit = _mm_and_si128(_mm_cmpgt_epi8(bytes, _mm_set1_epi8('0' - 1)),
                                        _mm_cmplt_epi8(bytes, _mm_set1_epi8('9' + 1)));
    const unsigned inField = (1u << count) - 1;
    const unsigned digits = static_cast<unsigned>(_mm_movemask_epi8(digit)) & inField;
    const unsigned points = static_cast<unsigned>(_mm_movemask_epi8(_mm_cmpeq_epi8(bytes, _mm_set1_epi8('.')))) & inField;
    // Every byte a digit or the one point.
    if ((digits | points) != inField || (points & (points - 1)) != 0)
        return false;
    const unsigned integerDigits = points != 0 ? static_cast<unsigned>(__builtin_ctz(points)) : static_cast<unsigned>(count);
    const unsigned decimals = points != 0 ? static_cast<unsigned>(count) - integerDigits - 1 : 0;
    if (integerDigits > 8 || decimals > 8 || integerDigits + decimals == 0 || integerDigits + decimals > 15)
        return false;
    const std::uint64_t mantissa = EightDigitsValue(text, integerDigits) * kIntegerPowersOfTen[decimals] +
                                   EightDigitsValue(text + integerDigits + 1, decimals);
    // The same exact division as ScanPlainDecimal.
    value = static_cast<double>(mantissa) / kPowersOfTen[decimals];
    if (negative)
        value = -value;
    return true;
#else
    const char* const end = field + length;
    return ScanPlainDecimal(field, end, value) == end && length > 0;
#endif
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
