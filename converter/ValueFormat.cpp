#include "converter/NumberText.h"

#include <charconv>
#include <cmath>
#include <cstdint>
#include <cstring>

namespace converter {

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
