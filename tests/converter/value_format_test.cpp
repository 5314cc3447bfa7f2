// The shortest text of a value: fixed texts at the edges of each way of writing it (powers of ten
// and their neighbours among them), and random values of every kind read back bit for bit with as
// few significant digits as the library's shortest form.
#include "converter/NumberText.h"

#include <gtest/gtest.h>

#include <bit>
#include <charconv>
#include <cmath>
#include <cstring>
#include <limits>
#include <random>
#include <string>

using namespace converter;

namespace {

std::string Format(double value)
{
    char buffer[64];
    return std::string(buffer, FormatValue(value, buffer));
}

// The significant digits of a number's text: no sign, exponent, point, or leading and trailing zeros.
std::string SignificantDigits(const std::string& text)
{
    std::string digits;
    for (char c : text.substr(0, text.find('e')))
        if (c >= '0' && c <= '9')
            digits += c;
    digits.erase(0, digits.find_first_not_of('0'));
    const size_t last = digits.find_last_not_of('0');
    digits.erase(last == std::string::npos ? 0 : last + 1);
    return digits;
}

TEST(FormatValue, WritesTheseTexts)
{
    const std::pair<double, const char*> cases[] = {
        // Fixed notation from 1e-6 up to below 1e15, the library's form outside.
        {1e-7, "1e-07"},
        {9.999999999999997e-07, "9.999999999999997e-07"},
        {1e-6, "0.000001"},
        {0.0000015, "0.0000015"},
        {0.00000123, "0.00000123"},
        {9.999999999999999e-06, "9.999999999999999e-06"},
        {0.000021403520751, "0.000021403520751"}, // fifteen decimals
        {2.14035207510568e-05, "2.14035207510568e-05"}, // sixteen
        {1e14, "100000000000000"},
        {999999999999999.0, "999999999999999"},
        {999999999999999.9, "999999999999999.9"},
        {99999999999999.98, "99999999999999.98"},
        {1e15, "1e+15"},
        {1000000000000000.1, "1000000000000000.1"},
        {1e21, "1e+21"},
        {1e22, "1e+22"},
        // At most four decimals below 10^4, and just outside.
        {1.0, "1"},
        {-0.5, "-0.5"},
        {0.0625, "0.0625"},
        {0.0001, "0.0001"},
        {0.00005, "0.00005"},
        {0.0001234, "0.0001234"},
        {1000.5, "1000.5"},
        {9999.0, "9999"},
        {9999.9999, "9999.9999"},
        {9999.99995, "9999.99995"},
        {10000.0, "10000"},
        // Around eight significant digits and eight integer digits.
        {0.0012, "0.0012"},
        {0.12345678, "0.12345678"},
        {0.123456789, "0.123456789"},
        {7.000001, "7.000001"},
        {1234.5678, "1234.5678"},
        {1234.56789, "1234.56789"},
        {-999.9999, "-999.9999"},
        {10000000.0, "10000000"},
        {12345678.0, "12345678"},
        {99999999.0, "99999999"},
        {100000000.0, "100000000"},
        {123456789.0, "123456789"},
        {12345678.5, "12345678.5"},
        // Sixteen and seventeen digits, integers at the end of the exact ones.
        {0.1234567890123456, "0.1234567890123456"},
        {123456789012345.6, "123456789012345.6"},
        {0.30000000000000004, "0.30000000000000004"},
        {1234.5678901234567, "1234.5678901234567"},
        {9007199254740991.0, "9007199254740991"},
        {9007199254740992.0, "9007199254740992"},
        {4503599627370497.0, "4503599627370497"},
        // Zeros, the smallest and largest doubles.
        {0.0, "0"},
        {-0.0, "-0"},
        {5e-324, "5e-324"},
        {-2.2250738585072014e-308, "-2.2250738585072014e-308"},
        {1.7976931348623157e308, "1.7976931348623157e+308"},
        {std::numeric_limits<double>::infinity(), "inf"},
    };
    for (const auto& [value, text] : cases)
        EXPECT_EQ(Format(value), text) << std::hexfloat << value;
}

// Every kind of value: the text reads back to the same bits, has as many significant digits as
// the shortest form (the same digits up to fifteen), uses fixed notation where it promises to,
// and never writes past the 32 characters it may use.
TEST(FormatValue, RandomValuesReadBackWithTheShortestDigits)
{
    std::mt19937_64 random(2026);
    for (int n = 0; n < 400000; ++n) {
        double value = 0;
        switch (n % 6) {
        case 0: value = std::bit_cast<double>(random()); break;
        case 1: // one to fifteen decimals
            value = static_cast<double>(static_cast<std::int64_t>(random() % 2000000000) - 1000000000) /
                    kPowersOfTen[1 + random() % 15];
            break;
        case 2: value = static_cast<double>(random() >> (11 + random() % 53)); break; // integers up to 2^53
        case 3: value = std::bit_cast<double>(random() >> 12); break;                // subnormals
        case 4: // nine to sixteen significant digits
            value = static_cast<double>(random() % 10000000000000000ull) / kPowersOfTen[random() % 23];
            break;
        default: value = std::ldexp(static_cast<double>(random() >> 11), static_cast<int>(random() % 140) - 90); break;
        }
        if (std::isnan(value) || std::isinf(value))
            continue;
        char buffer[64];
        std::memset(buffer, '#', sizeof buffer);
        const char* end = FormatValue(value, buffer);
        ASSERT_LE(end - buffer, 32);
        ASSERT_EQ(std::string(buffer + 32, 32), std::string(32, '#')) << std::hexfloat << value;
        const std::string text(static_cast<const char*>(buffer), end);

        double back = 0;
        const auto [stop, error] = std::from_chars(text.data(), text.data() + text.size(), back);
        ASSERT_TRUE(error == std::errc() && stop == text.data() + text.size()) << text;
        ASSERT_EQ(std::bit_cast<std::uint64_t>(back), std::bit_cast<std::uint64_t>(value)) << text;

        char reference[64];
        const std::string shortest(reference, std::to_chars(reference, reference + 64, value).ptr);
        const std::string digits = SignificantDigits(text);
        ASSERT_EQ(digits.size(), SignificantDigits(shortest).size()) << text << " against " << shortest;
        if (digits.size() <= 15) {
            ASSERT_EQ(digits, SignificantDigits(shortest)) << text << " against " << shortest;
            // Below 1 the digits must also fit in fifteen decimals (see the fixed texts).
            const double magnitude = std::fabs(value);
            if (magnitude >= 1 && magnitude < 1e15) {
                ASSERT_EQ(text.find('e'), std::string::npos) << text;
            }
        }
    }
}

} // namespace
