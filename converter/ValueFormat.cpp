#include "converter/NumberText.h"

#include <algorithm>
#include <bit>
#include <charconv>
#include <cmath>
#include <cstdint>
#include <cstring>

namespace converter {

namespace {
constexpr std::uint64_t kAsciiZeros = 0x3030303030303030ull;

// The four-digit texts of 0 to 9999, the first digit in the lowest byte (40 KB: looking up two
// of them was measured faster than splitting the digits arithmetically, even with the table
// mostly outside the first-level cache).
struct FourDigitTexts {
    std::uint32_t text[10000];
    constexpr FourDigitTexts() : text()
    {
        for (std::uint32_t n = 0; n < 10000; ++n)
            text[n] = (0x30u + n / 1000) | (0x30u + n / 100 % 10) << 8 | (0x30u + n / 10 % 10) << 16 | (0x30u + n % 10) << 24;
    }
};
constexpr FourDigitTexts kFourDigits;

// The eight decimal digits of `value` (below 10^8) as ASCII in one word, the first digit in the
// lowest byte.
[[gnu::always_inline]] inline std::uint64_t EightDigits(std::uint32_t value)
{
    return kFourDigits.text[value / 10000] | static_cast<std::uint64_t>(kFourDigits.text[value % 10000]) << 32;
}

// Writes a value of at most eight significant digits: `text` holds them (ASCII, the first in the
// lowest byte, zeros after them), `integerDigits` (0 to 8) of them before the point; with none
// before the point `text` is the fraction and "0" leads. `out` has room for 32 characters.
char* WriteEightOrFewer(std::uint64_t text, int integerDigits, bool negative, char* out)
{
    *out = '-';
    out += negative;
    *out = '0';
    out += integerDigits == 0;
    const int fractionDigits = 8 - integerDigits - std::countl_zero(text - kAsciiZeros) / 8;
    std::memcpy(out, &text, 8);
    if (fractionDigits <= 0)
        return out + integerDigits;
    out[integerDigits] = '.';
    const std::uint64_t fraction = text >> (8 * integerDigits);
    std::memcpy(out + integerDigits + 1, &fraction, 8);
    return out + integerDigits + 1 + fractionDigits;
}

// Writes "iiii.ffff" from its eight digits without the leading zeros of the integer part (one
// digit stays) and the trailing zeros of the fraction (the point goes with the last of them).
char* WriteFourDecimals(std::uint64_t text, bool negative, char* out)
{
    *out = '-';
    out += negative;
    const std::uint64_t values = text - kAsciiZeros; // not 0: the value is not
    const int leading = std::min(std::countr_zero(values) / 8, 3);
    const int fractionDigits = 4 - std::min(std::countl_zero(values) / 8, 4);
    const std::uint64_t integer = text >> (8 * leading);
    std::memcpy(out, &integer, 8);
    const int integerDigits = 4 - leading;
    if (fractionDigits == 0)
        return out + integerDigits;
    out[integerDigits] = '.';
    const std::uint64_t fraction = text >> 32;
    std::memcpy(out + integerDigits + 1, &fraction, 8);
    return out + integerDigits + 1 + fractionDigits;
}

// Digits before the point of `magnitude` in [1e-6, 1e15): 0 below 1. A loop of comparisons: its
// branches are predicted where the count of a column varies little, which computing the count from
// the binary exponent (a longer chain of dependent steps) was measured to lose to.
int IntegerDigits(double magnitude)
{
    int integerDigits = 0;
    while (integerDigits < 15 && magnitude >= kPowersOfTen[integerDigits])
        ++integerDigits;
    return integerDigits;
}

// The digits of `magnitude` at `decimals` decimals when they divide back to it exactly.
bool ExactAt(double magnitude, int decimals, std::uint64_t& digits)
{
    const double scaled = magnitude * kPowersOfTen[decimals];
    if (scaled >= static_cast<double>(kExactMantissa))
        return false;
    // Signed conversions: below 2^53 they agree with unsigned ones and need no range test.
    const auto rounded = static_cast<std::int64_t>(scaled + 0.5);
    digits = static_cast<std::uint64_t>(rounded);
    return static_cast<double>(rounded) / kPowersOfTen[decimals] == magnitude;
}

// Writes fifteen or sixteen places of digits, in two words (the first eight, then the rest), with
// `integerDigits` (0 to 15) of them before the point and `fractionDigits` after it; with none
// before the point "0" leads. Each word is stored where it belongs around the point; `out` has
// room for 32 characters. Apart from the common case, so that the common case keeps few registers.
[[gnu::noinline]] char* WritePlaces(std::uint64_t first, std::uint64_t rest, int integerDigits, int fractionDigits,
                                    bool negative, char* out)
{
    *out = '-';
    out += negative;
    *out = '0';
    out += integerDigits == 0;
    std::memcpy(out, &first, 8);
    if (integerDigits <= 8) {
        out[integerDigits] = '.';
        const std::uint64_t tail = integerDigits < 8 ? first >> (8 * integerDigits) : 0;
        std::memcpy(out + integerDigits + 1, &tail, 8);
        std::memcpy(out + 9, &rest, 8);
    } else {
        std::memcpy(out + 8, &rest, 8);
        out[integerDigits] = '.';
        const std::uint64_t tail = rest >> (8 * (integerDigits - 8));
        std::memcpy(out + integerDigits + 1, &tail, 8);
    }
    return out + integerDigits + (fractionDigits > 0 ? 1 + fractionDigits : 0);
}

// The digits of the fifteen-place scaling (below 10^15), `integerDigits` of them before the
// point, without the trailing zeros of the fraction.
char* WriteFifteenPlaces(std::uint64_t digits, int integerDigits, bool negative, char* out)
{
    constexpr std::uint64_t kSevenPlaces = 10000000;
    const std::uint64_t low = digits % kSevenPlaces;
    const std::uint64_t first = EightDigits(static_cast<std::uint32_t>(digits / kSevenPlaces));
    const std::uint64_t lowDigits = EightDigits(static_cast<std::uint32_t>(low)); // '0' and seven places
    const int trailingZeros = low != 0 ? std::countl_zero(lowDigits - kAsciiZeros) / 8
                                       : 7 + std::countl_zero(first - kAsciiZeros) / 8;
    return WritePlaces(first, lowDigits >> 8, integerDigits, std::max(0, 15 - integerDigits - trailingZeros), negative,
                       out);
}

// NaN, values outside [1e-6, 1e15), and those whose fifteen-place scaling does not divide back.
[[gnu::noinline]] char* FormatOtherwise(double value, int decimals, char* out)
{
    if (std::isnan(value))
        return out;
    // Sixteen places, all of them written: no fifteen-place decimal reads back, so none ends in 0.
    std::uint64_t digits = 0;
    if (decimals < 15 && ExactAt(std::fabs(value), ++decimals, digits))
        return WritePlaces(EightDigits(static_cast<std::uint32_t>(digits / 100000000)),
                           EightDigits(static_cast<std::uint32_t>(digits % 100000000)), 16 - decimals, decimals,
                           std::signbit(value), out);
    return std::to_chars(out, out + 32, value).ptr;
}

} // namespace

char* FormatValue(double value, char* out)
{
    // Most measured values have a few decimals. Scaled to below 10^15 the product is within a
    // quarter of the integer a short decimal gives, so one rounding finds it (an exact integer
    // over an exact power of ten divides back to the value), and its trailing zeros give the
    // fewest decimals. One place further can still hold an exact integer below 2^53.
    const double magnitude = std::fabs(value);
    if (!(magnitude < 1e15 && magnitude >= 1e-6))
        return FormatOtherwise(value, 15, out);
    std::uint64_t digits = 0;
    // Below 10^4 with at most four decimals, the commonest measured values: exact at four places,
    // these are the one decimal of at most fifteen places that reads back, the same the scaling
    // below finds, so their eight digits are written without counting integer digits first.
    if (magnitude < 1e4 && ExactAt(magnitude, 4, digits))
        return WriteFourDecimals(EightDigits(static_cast<std::uint32_t>(digits)), std::signbit(value), out);
    const int integerDigits = IntegerDigits(magnitude);
    const int decimals = 15 - integerDigits;
    if (!ExactAt(magnitude, decimals, digits))
        return FormatOtherwise(value, decimals, out);
    // Eight significant digits or fewer: all in one word. The digits fill fifteen places, from the
    // first integer digit or from the point.
    constexpr std::uint64_t kSevenPlaces = 10000000;
    if (digits % kSevenPlaces == 0 && integerDigits <= 8)
        return WriteEightOrFewer(EightDigits(static_cast<std::uint32_t>(digits / kSevenPlaces)), integerDigits,
                                 std::signbit(value), out);
    return WriteFifteenPlaces(digits, integerDigits, std::signbit(value), out);
}

} // namespace converter
