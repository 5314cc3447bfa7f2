#include "converter/NumberText.h"

#include <charconv>
#include <cmath>

namespace converter {

namespace {
bool IsBlank(char c) { return c == ' ' || c == '\t' || c == '\r' || c == '\n'; }
constexpr size_t kLongestNumber = 128;
} // namespace

NumberReader::NumberReader(std::string_view decimalSeparator) : m_separator(decimalSeparator)
{
    if (m_separator == ".")
        m_other = ',';
    else if (m_separator == ",")
        m_other = '.';
}

ValueText NumberReader::Read(std::string_view field, double& value) const
{
    size_t b = 0, e = field.size();
    while (b < e && IsBlank(field[b]))
        ++b;
    while (e > b && IsBlank(field[e - 1]))
        --e;
    if (b == e)
        return ValueText::Empty;
    std::string_view text = field.substr(b, e - b);
    if (m_other != 0 && text.find(m_separator) == std::string_view::npos &&
        text.find(m_other) != std::string_view::npos)
        return ValueText::WrongSeparator;
    if (text.front() == '+')
        text.remove_prefix(1);

    char buffer[kLongestNumber];
    if (!m_separator.empty() && m_separator != "." && text.find(m_separator) != std::string_view::npos) {
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

char* FormatValue(double value, char* out)
{
    if (std::isnan(value))
        return out;
    return std::to_chars(out, out + 32, value).ptr;
}

} // namespace converter
