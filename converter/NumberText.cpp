#include "converter/NumberText.h"

#include "delimited/Dialect.h"

#include <charconv>
#include <cmath>
#include <cstdint>
#include <cstring>
#include <vector>

#if defined(__SSE2__)
#include <immintrin.h>
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

#if defined(__SSE2__)
namespace {

// A field checked to be a plain decimal: its 16 bytes from the first digit or point, and where the
// point falls among them.
struct PlainShape {
    __m128i bytes;
    const char* text = nullptr;
    unsigned integerDigits = 0;
    unsigned decimals = 0;
    bool negative = false;
};

inline bool TakePlainShape(const char* field, size_t length, PlainShape& shape)
{
    shape.negative = length > 0 && field[0] == '-';
    shape.text = field + (shape.negative ? 1 : 0);
    const size_t count = length - (shape.negative ? 1 : 0);
    if (count == 0 || count > 16)
        return false;
    shape.bytes = _mm_loadu_si128(reinterpret_cast<const __m128i*>(shape.text));
    const __m128i digit = _mm_and_si128(_mm_cmpgt_epi8(shape.bytes, _mm_set1_epi8('0' - 1)),
                                        _mm_cmplt_epi8(shape.bytes, _mm_set1_epi8('9' + 1)));
    const unsigned inField = (1u << count) - 1;
    const unsigned digits = static_cast<unsigned>(_mm_movemask_epi8(digit)) & inField;
    const unsigned points =
        static_cast<unsigned>(_mm_movemask_epi8(_mm_cmpeq_epi8(shape.bytes, _mm_set1_epi8('.')))) & inField;
    // Every byte a digit or the one point.
    if ((digits | points) != inField || (points & (points - 1)) != 0)
        return false;
    shape.integerDigits = points != 0 ? static_cast<unsigned>(__builtin_ctz(points)) : static_cast<unsigned>(count);
    shape.decimals = points != 0 ? static_cast<unsigned>(count) - shape.integerDigits - 1 : 0;
    const unsigned all = shape.integerDigits + shape.decimals;
    return all != 0 && all <= 15;
}

// The value of the `count` (0 to 8) decimal digits at `digits`; the 8 bytes from there are read.
inline std::uint32_t EightDigitsValue(const char* digits, unsigned count)
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

constexpr std::uint64_t kIntegerPowersOfTen[] = {1, 10, 100, 1000, 10000, 100000, 1000000, 10000000, 100000000};

// The digits as one integer by word arithmetic, at most 8 on either side of the point.
struct DigitsByWords {
    bool operator()(const PlainShape& shape, std::uint64_t& mantissa) const
    {
        if (shape.integerDigits > 8 || shape.decimals > 8)
            return false;
        mantissa = EightDigitsValue(shape.text, shape.integerDigits) * kIntegerPowersOfTen[shape.decimals] +
                   EightDigitsValue(shape.text + shape.integerDigits + 1, shape.decimals);
        return true;
    }
};

// Byte shuffles that drop the point and move the digits to the end of sixteen bytes, leading
// zeros before them, by the digits before and after the point.
struct DigitAlignments {
    alignas(16) unsigned char masks[16][16][16];
};

constexpr DigitAlignments MakeDigitAlignments()
{
    DigitAlignments table{};
    for (int integerDigits = 0; integerDigits < 16; ++integerDigits)
        for (int decimals = 0; integerDigits + decimals < 16; ++decimals)
            for (int at = 0; at < 16; ++at) {
                const int digit = at - (16 - integerDigits - decimals);
                const int from = digit < integerDigits ? digit : digit + 1;
                table.masks[integerDigits][decimals][at] = digit < 0 ? 0x80 : static_cast<unsigned char>(from);
            }
    return table;
}

constexpr DigitAlignments kDigitAlignments = MakeDigitAlignments();

// The digits as one integer by byte shuffles and multiply-adds.
struct DigitsByShuffles {
    __attribute__((target("ssse3,sse4.1"))) bool operator()(const PlainShape& shape, std::uint64_t& mantissa) const
    {
        const __m128i digits = _mm_sub_epi8(shape.bytes, _mm_set1_epi8('0'));
        const __m128i order =
            _mm_load_si128(reinterpret_cast<const __m128i*>(kDigitAlignments.masks[shape.integerDigits][shape.decimals]));
        const __m128i aligned = _mm_shuffle_epi8(digits, order);
        // Pairs, fours and eights of digits, the first of each the more significant.
        const __m128i pairs =
            _mm_maddubs_epi16(aligned, _mm_setr_epi8(10, 1, 10, 1, 10, 1, 10, 1, 10, 1, 10, 1, 10, 1, 10, 1));
        const __m128i fours = _mm_madd_epi16(pairs, _mm_setr_epi16(100, 1, 100, 1, 100, 1, 100, 1));
        const __m128i eights =
            _mm_madd_epi16(_mm_packus_epi32(fours, fours), _mm_setr_epi16(10000, 1, 10000, 1, 10000, 1, 10000, 1));
        const auto both = static_cast<std::uint64_t>(_mm_cvtsi128_si64(eights));
        mantissa = (both & 0xFFFFFFFFu) * 100000000u + (both >> 32);
        return true;
    }
};

// Every value is the exact integer of its digits divided by an exact power of ten, as in
// ScanPlainDecimal; the divisions are made two at a time once a run of fields has been read.
template <class Digits>
__attribute__((always_inline)) inline size_t ReadPlainFieldsWith(const char* text, const FieldSpan* spans, size_t count,
                                                                 double* values, Digits digits)
{
    constexpr size_t kRun = 32;
    alignas(16) double numerators[kRun];
    alignas(16) double divisors[kRun];
    size_t done = 0;
    while (done < count) {
        const size_t run = count - done < kRun ? count - done : kRun;
        size_t read = 0;
        for (; read < run; ++read) {
            const FieldSpan span = spans[done + read];
            PlainShape shape;
            std::uint64_t mantissa = 0;
            if (!TakePlainShape(text + span.start, span.length, shape) || !digits(shape, mantissa))
                break;
            // A minus before the division gives the same value as after it: rounding is symmetric.
            // Below 2^53, so the signed conversion is exact and spares the unsigned one's checks.
            const double magnitude = static_cast<double>(static_cast<std::int64_t>(mantissa));
            numerators[read] = shape.negative ? -magnitude : magnitude;
            divisors[read] = kPowersOfTen[shape.decimals];
        }
        size_t i = 0;
        for (; i + 2 <= read; i += 2)
            _mm_storeu_pd(values + done + i, _mm_div_pd(_mm_load_pd(numerators + i), _mm_load_pd(divisors + i)));
        if (i < read)
            values[done + i] = numerators[i] / divisors[i];
        done += read;
        if (read < run)
            break;
    }
    return done;
}

size_t ReadPlainFieldsByWords(const char* text, const FieldSpan* spans, size_t count, double* values)
{
    return ReadPlainFieldsWith(text, spans, count, values, DigitsByWords());
}

__attribute__((target("ssse3,sse4.1"))) size_t ReadPlainFieldsByShuffles(const char* text, const FieldSpan* spans,
                                                                         size_t count, double* values)
{
    return ReadPlainFieldsWith(text, spans, count, values, DigitsByShuffles());
}

} // namespace
#endif

std::vector<PlainFieldsReader> PlainFieldsReadersOfThisProcessor()
{
#if defined(__SSE2__)
    std::vector<PlainFieldsReader> readers{ReadPlainFieldsByWords};
    __builtin_cpu_init();
    if (__builtin_cpu_supports("ssse3") && __builtin_cpu_supports("sse4.1"))
        readers.push_back(ReadPlainFieldsByShuffles);
    return readers;
#else
    return {[](const char* text, const FieldSpan* spans, size_t count, double* values) {
        size_t done = 0;
        for (; done < count; ++done) {
            const char* const field = text + spans[done].start;
            const char* const end = field + spans[done].length;
            if (field == end || ScanPlainDecimal(field, end, values[done]) != end)
                break;
        }
        return done;
    }};
#endif
}

PlainFieldsReader FastestPlainFieldsReader()
{
    static const PlainFieldsReader fastest = PlainFieldsReadersOfThisProcessor().back();
    return fastest;
}

bool ReadPlainField(const char* field, size_t length, double& value)
{
    const FieldSpan span{0, static_cast<std::uint32_t>(length)};
    return length <= kPlainFieldReach && FastestPlainFieldsReader()(field, &span, 1, &value) == 1;
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
    if (m_pointSeparator && ReadPlainDecimal(text, value))
        return ValueText::Number;
    if (delimited::UsesOtherDecimalSeparator(text, m_separator))
        return ValueText::WrongSeparator;
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
