#include "delimited/FieldSplitter.h"

#include <utility>

namespace delimited {

// The steps of a call, in the order NextField's description gives them.
std::string_view FieldRule::Next(std::string_view& line, int& pos, bool& quoteError) const
{
    std::string_view field;
    if (line.empty() || pos < 0) {
        pos = -1;
        return field;
    }
    if (!m_ignoreConsecutive) {
        if (m_ignoreLeading && pos == 0)
            CutLeading(line);
        quoteError = Take(line, pos, field) == Taken::QuotedRejected || quoteError;
        return field;
    }
    if (!m_ignoreLeading && pos == 0 && m_delimiter.MatchesAt(line, 0)) {
        // The leading run stands for one empty first field; the next call starts at the first value.
        CutLeading(line);
        return field;
    }
    SkipDelimiters(line, pos);
    const Taken taken = Take(line, pos, field);
    if (taken == Taken::Plain || taken == Taken::QuotedAccepted)
        SkipDelimiters(line, pos);
    quoteError = taken == Taken::QuotedRejected || quoteError;
    return field;
}

FieldRule::Taken FieldRule::Take(std::string_view line, int& pos, std::string_view& field) const
{
    field = {};
    const size_t length = line.size();
    const size_t at = static_cast<size_t>(pos);
    if (at == length && m_delimiter.EndsLine(line)) {
        pos = static_cast<int>(length) + 1;
        return Taken::LineEndsInDelimiter;
    }
    if (at >= length) {
        pos = -1;
        return Taken::NoField;
    }
    if (line[at] != kQuote) {
        const size_t found = m_delimiter.FindFrom(line, at);
        if (found == std::string_view::npos) {
            field = line.substr(at);
            pos = static_cast<int>(length);
        } else {
            field = line.substr(at, found - at);
            pos = static_cast<int>(found + m_delimiter.Length());
        }
        return Taken::Plain;
    }
    size_t start = at;
    while (start < length && line[start] == kQuote)
        ++start;
    if (start == length) {
        pos = -1;
        return Taken::OnlyQuotes;
    }
    size_t closing = line.find(kQuote, start);
    if (closing == std::string_view::npos)
        closing = length;
    const size_t behind = closing + 1;
    if (m_delimiter.MatchesAt(line, behind)) {
        field = line.substr(start, closing - start);
        pos = static_cast<int>(behind + m_delimiter.Length());
        return Taken::QuotedAccepted;
    }
    if (closing + 1 == length) {
        field = line.substr(start, closing - start);
        pos = static_cast<int>(behind);
        return Taken::QuotedAccepted;
    }
    pos = static_cast<int>(behind);
    return Taken::QuotedRejected;
}

void FieldRule::SkipDelimiters(std::string_view line, int& pos) const
{
    while (pos >= 0 && static_cast<size_t>(pos) < line.size() && m_delimiter.MatchesAt(line, static_cast<size_t>(pos)))
        pos += static_cast<int>(m_delimiter.Length());
}

void FieldRule::CutLeading(std::string_view& line) const
{
    size_t start = 0;
    while (m_delimiter.MatchesAt(line, start))
        start += m_delimiter.Length();
    line.remove_prefix(start);
}

FieldSplitter::FieldSplitter(Dialect dialect)
    : m_dialect(std::move(dialect)), m_rule(m_dialect), m_plain(m_dialect.IsPlain())
{
}

void FieldSplitter::Split(std::string_view line)
{
    m_count = 0;
    m_quoteError = false;
    m_line = line;
    int pos = 0;
    if (m_plain) {
        // Plain fields up to the first one that starts with a quote, which the rule takes on.
        PlainFields fields(line, m_dialect.delimiter[0]);
        std::string_view text;
        int end = 0;
        while (fields.Next(text, end)) {
            Add(text, pos, end);
            if (end == -1) {
                m_offset = 0;
                return;
            }
            pos = end;
        }
        pos = static_cast<int>(fields.Position());
    }
    do {
        const int start = pos;
        std::string_view field = m_rule.Next(m_line, pos, m_quoteError);
        // The rule may have cut the line's start; positions then count from the cut.
        Add(field, start, pos);
    } while (pos != -1);
    m_offset = static_cast<int>(line.size() - m_line.size());
}

} // namespace delimited
