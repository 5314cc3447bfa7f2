#include "delimited/Dialect.h"

namespace delimited {

bool UsesOtherDecimalSeparator(std::string_view value, std::string_view decimalSeparator)
{
    if (decimalSeparator != "." && decimalSeparator != ",")
        return false;
    const char other = decimalSeparator == "." ? ',' : '.';
    return value.find(other) != std::string_view::npos && value.find(decimalSeparator) == std::string_view::npos;
}

bool Dialect::UsesOtherDecimalSeparator(std::string_view value) const
{
    return delimited::UsesOtherDecimalSeparator(value, decimalSeparator);
}

int Delimiter::CountPieces(std::string_view text) const
{
    int pieces = 0;
    size_t pos = 0;
    while (pos < text.size()) {
        if (MatchesAt(text, pos)) {
            pos += m_text.size();
            continue;
        }
        ++pieces;
        const size_t next = FindFrom(text, pos);
        pos = next == std::string_view::npos ? text.size() : next;
    }
    return pieces;
}

} // namespace delimited
