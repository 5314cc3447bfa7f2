#include "converter/NumberText.h"

#include <algorithm>
#include <bit>
#include <charconv>
#include <cmath>
#include <cstdint>
#include <cstring>

namespace converter {

namespace {
// Sixteen ASCII digits, the first in the lowest byte (__extension__: a 128-bit integer is a GNU one).
__extension__ typedef unsigned __int128 Digits16;

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

Digits16 SixteenDigits(std::uint64_t value)
{
    return static_cast<Digits16>(EightDigits(static_cast<std::uint32_t>(value / 100000000))) |
           static_cast<Digits16>(EightDigits(static_cast<std::uint32_t>(value % 100000000))) << 64;
}

// How many of the sixteen digits lead with '0' (at least one digit is not '0').
int LeadingZeros(Digits16 text)
{
    const Digits16 values = text - ((static_cast<Digits16>(kAsciiZeros) << 64) | kAsciiZeros);
    const auto low = static_cast<std::uint64_t>(values);
    return low ? std::countr_zero(low) / 8 : 8 + std::countr_zero(static_cast<std::uint64_t>(values >> 64)) / 8;
}

// How many of the sixteen digits end with '0' (at least one digit is not '0').
int TrailingZeros(Digits16 text)
{
    const Digits16 values = text - ((static_cast<Digits16>(kAsciiZeros) << 64) | kAsciiZeros);
    const auto high = static_cast<std::uint64_t>(values >> 64);
    return high ? std::countl_zero(high) / 8 : 8 + std::countl_zero(static_cast<std::uint64_t>(values)) / 8;
}

void Store(Digits16 text, char* out) { std::memcpy(out, &text, sizeof text); }

// Writes the sixteen digits `text` with a point before their last `decimals` digits, without the
// leading zeros before the integer digit(s) and without the last `decimals - kept` digits (zeros).
// Built in registers and stored whole; `out` has room for 32 characters.
char* WriteDigits(Digits16 text, int decimals, int kept, bool negative, char* out)
{
    const int first = std::min(LeadingZeros(text), 15 - decimals);
    *out = '-';
    out += negative;
    const Digits16 shown = text >> (8 * first);
    const int integerDigits = 16 - decimals - first;
    if (decimals == 0) {
        Store(shown, out);
        return out + integerDigits;
    }
    // The fraction moves up one place for the point; shifted in two steps as a shift by the full
    // width is undefined. Sixteen digits and a point are one more than a store: the last digit
    // follows on its own (past the end when there are fewer).
    const Digits16 integer = shown & ((static_cast<Digits16>(1) << (8 * integerDigits)) - 1);
    const Digits16 fraction = ((shown >> (8 * integerDigits)) << 8) << (8 * integerDigits);
    Store(integer | static_cast<Digits16>('.') << (8 * integerDigits) | fraction, out);
    out[16] = static_cast<char>(text >> 120);
    return out + integerDigits + (kept > 0 ? 1 + kept : 0);
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

// The value at `decimals` decimals, exactly, from the digits of the fifteen-place scaling: the
// trailing zeros are counted in the text itself. Beside the common case, and apart from it so that
// it keeps few registers.
[[gnu::noinline]] char* WriteFifteenPlaces(std::uint64_t digits, int decimals, bool negative, char* out)
{
    const Digits16 text = SixteenDigits(digits);
    return WriteDigits(text, decimals, decimals - std::min(TrailingZeros(text), decimals), negative, out);
}

// NaN, values outside [1e-6, 1e15), and those whose fifteen-place scaling does not divide back.
[[gnu::noinline]] char* FormatOtherwise(double value, int decimals, char* out)
{
    std::uint64_t digits = 0;
    if (!std::isnan(value) && decimals < 15 && ExactAt(std::fabs(value), ++decimals, digits))
        return WriteDigits(SixteenDigits(digits), decimals, decimals, std::signbit(value), out);
    if (std::isnan(value))
        return out;
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
    // The common case: eight significant digits or fewer, all in one word. The digits fill
    // fifteen places, from the first integer digit or from the point.
    constexpr std::uint64_t kSevenPlaces = 10000000;
    if (digits % kSevenPlaces == 0 && integerDigits <= 8)
        return WriteEightOrFewer(EightDigits(static_cast<std::uint32_t>(digits / kSevenPlaces)), integerDigits,
                                 std::signbit(value), out);
    return WriteFifteenPlaces(digits, decimals, std::signbit(value), out);
}

} // namespace converter
