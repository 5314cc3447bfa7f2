#pragma once
// The delimited-text dialect: how a line of a delimited ASCII file is cut into fields and how its
// values write the decimal separator. The preview parser (through the template's NextField), the
// engine's reader and the bridge all read lines with these rules; a template gives its dialect with
// CSpecification::GetDialect.
#include <string>
#include <string_view>

namespace delimited {

// A quoted field starts and ends with this; a doubled quote is not an escape.
inline constexpr char kQuote = '"';

struct Dialect {
    // The separator text: one character for every built-in name; a user delimiter may be longer and
    // then separates only where its whole text stands ("||" never splits at a lone "|"). Never empty.
    std::string delimiter = "\t";
    // Runs of delimiters count as one ("IgnoreConsecutiveDelimiters"); with Space, runs of blanks.
    bool ignoreConsecutive = false;
    // Delimiters at the start of a line are removed before its first field
    // ("IgnoreBegginingOfLineDelimiters").
    bool ignoreLeading = false;
    // "." or "," or the locale's text.
    std::string decimalSeparator = ".";

    // True for a one-character delimiter with neither flag: the lines the fast passes read.
    bool IsPlain() const { return delimiter.size() == 1 && !ignoreConsecutive && !ignoreLeading; }
    bool UsesOtherDecimalSeparator(std::string_view value) const;
};

// True when `value` uses the other of "." and "," than `decimalSeparator`: it holds that one and not
// the separator. Values are not checked against other separators.
bool UsesOtherDecimalSeparator(std::string_view value, std::string_view decimalSeparator);

// A delimiter of one or more characters, matched as a whole.
class Delimiter {
public:
    explicit Delimiter(std::string_view text) : m_text(text) {}

    bool MatchesAt(std::string_view line, size_t pos) const
    {
        if (m_text.empty() || pos >= line.size())
            return false;
        if (m_text.size() == 1)
            return line[pos] == m_text[0];
        return line.substr(pos, m_text.size()) == m_text;
    }
    bool EndsLine(std::string_view line) const
    {
        return !m_text.empty() && line.size() >= m_text.size() && MatchesAt(line, line.size() - m_text.size());
    }
    // The first place at or after `pos` where the whole delimiter stands; npos when there is none.
    size_t FindFrom(std::string_view line, size_t pos) const
    {
        if (m_text.empty())
            return std::string_view::npos;
        return m_text.size() == 1 ? line.find(m_text[0], pos) : line.find(m_text, pos);
    }
    bool FoundIn(std::string_view line) const { return FindFrom(line, 0) != std::string_view::npos; }
    size_t Length() const { return m_text.size(); }
    // The number of non-empty pieces of `text` between delimiters.
    int CountPieces(std::string_view text) const;

private:
    std::string_view m_text;
};

} // namespace delimited
