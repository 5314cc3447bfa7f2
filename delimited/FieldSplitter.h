#pragma once
// The one field rule of delimited text, and the readers built on it.
//
// FieldRule is the rule itself, one NextField call at a time: the template's NextField, the
// preview's walk over a line and the general reading of the engine all go through it.
// FieldSplitter gives the calls of a whole line at once, without allocating. PlainFields and
// DelimiterWalk are the fast paths of the engine for the common dialect (one-character delimiter,
// neither flag): they give the same fields as the rule for every line they take and hand every other
// line back. The tests and fuzzers compare each of them with FieldRule.
#include "delimited/Dialect.h"

#include <cstdint>
#include <span>
#include <string>
#include <string_view>
#include <vector>

#if defined(__SSE2__)
#include <emmintrin.h>
#endif

namespace delimited {

class FieldRule {
public:
    // `delimiter` must outlive the rule.
    FieldRule(std::string_view delimiter, bool ignoreConsecutive, bool ignoreLeading)
        : m_delimiter(delimiter), m_ignoreConsecutive(ignoreConsecutive), m_ignoreLeading(ignoreLeading)
    {
    }
    // The rule of `dialect`, which must outlive it.
    explicit FieldRule(const Dialect& dialect)
        : FieldRule(dialect.delimiter, dialect.ignoreConsecutive, dialect.ignoreLeading)
    {
    }

    // The next field of `line` from `pos` (0 for the first call); `pos` becomes -1 after the last
    // field. Where the rule removes delimiters from the start of the line, `line` is moved past them
    // and positions count from there. A quoted field whose closing quote is missing or is not followed
    // by the delimiter gives an empty field and sets `quoteError`. The field is a view into `line`.
    std::string_view Next(std::string_view& line, int& pos, bool& quoteError) const;

private:
    // How a field was taken; only plain fields and accepted quoted fields let a run of delimiters follow.
    enum class Taken { LineEndsInDelimiter, NoField, Plain, QuotedAccepted, QuotedRejected, OnlyQuotes };

    Taken Take(std::string_view line, int& pos, std::string_view& field) const;
    void SkipDelimiters(std::string_view line, int& pos) const;
    void CutLeading(std::string_view& line) const;

    Delimiter m_delimiter;
    bool m_ignoreConsecutive;
    bool m_ignoreLeading;
};

// The first `delimiter` at or after `at` in `line`, or the line's length. Fields are short, so a
// library search call per field costs more than the search: sixteen bytes are compared at once while
// they lie inside the line, the rest one by one.
inline size_t FindDelimiter(std::string_view line, size_t at, char delimiter)
{
    const size_t length = line.size();
#if defined(__SSE2__)
    const __m128i wanted = _mm_set1_epi8(delimiter);
    for (; at + 16 <= length; at += 16) {
        const __m128i bytes = _mm_loadu_si128(reinterpret_cast<const __m128i*>(line.data() + at));
        const int found = _mm_movemask_epi8(_mm_cmpeq_epi8(bytes, wanted));
        if (found != 0)
            return at + static_cast<size_t>(__builtin_ctz(static_cast<unsigned>(found)));
    }
#endif
    while (at < length && line[at] != delimiter)
        ++at;
    return at;
}

// The fields of a line under the plain dialect (one-character delimiter, neither flag), one call at a
// time: the text up to the next delimiter and the position after it; a delimiter at the line's end
// adds an empty field, and the last call ends at -1. A field starting with a quote is the rule's to
// take.
class PlainFields {
public:
    PlainFields(std::string_view line, char delimiter) : m_line(line), m_delimiter(delimiter) {}

    // The next call's field and the position after it. False, with nothing taken, when the field
    // starts with a quote: FieldRule goes on from Position().
    bool Next(std::string_view& text, int& end)
    {
        const size_t length = m_line.size();
        if (m_trailing) {
            m_trailing = false;
            text = {};
            end = -1;
            return true;
        }
        if (m_at == length) {
            text = {};
            m_trailing = length > 0 && m_line[length - 1] == m_delimiter;
            end = m_trailing ? static_cast<int>(length) + 1 : -1;
            return true;
        }
        if (m_line[m_at] == kQuote)
            return false;
        Take(FindDelimiter(m_line, m_at, m_delimiter), text, end);
        return true;
    }

    // Takes the field from Position() to `stop` as the next call when the field really ends there
    // (at a delimiter or the line's end); false, with nothing taken, otherwise. For callers that found
    // the field's end on their own, reading its value on the way.
    bool TakeEndingAt(size_t stop, std::string_view& text, int& end)
    {
        if (m_trailing || m_at >= m_line.size() || (stop < m_line.size() && m_line[stop] != m_delimiter))
            return false;
        Take(stop, text, end);
        return true;
    }

    // Where the next field starts.
    size_t Position() const { return m_at; }

private:
    void Take(size_t found, std::string_view& text, int& end)
    {
        text = m_line.substr(m_at, found - m_at);
        m_at = found < m_line.size() ? found + 1 : m_line.size();
        end = static_cast<int>(m_at);
    }

    std::string_view m_line;
    char m_delimiter;
    size_t m_at = 0;
    bool m_trailing = false;
};

// The positions of a line's delimiters in order, found sixty-four bytes at a time. Reads up to 64
// bytes past the line's end (sys::TextLineReader keeps them readable).
class DelimiterWalk {
public:
    DelimiterWalk(std::string_view line, char delimiter) : m_text(line.data()), m_length(line.size()), m_delimiter(delimiter)
    {
        Load(0);
    }

    // The next delimiter's position, or the line's length when none is left.
    size_t Next()
    {
        while (m_bits == 0) {
            if (m_block + kBlock >= m_length)
                return m_length;
            Load(m_block + kBlock);
        }
        const size_t at = m_block + static_cast<size_t>(__builtin_ctzll(m_bits));
        m_bits &= m_bits - 1;
        return at;
    }

private:
    static constexpr size_t kBlock = 64;

    void Load(size_t block)
    {
        m_block = block;
        const char* const bytes = m_text + block;
        std::uint64_t bits = 0;
#if defined(__SSE2__)
        const __m128i delimiter = _mm_set1_epi8(m_delimiter);
        for (size_t k = 0; k < kBlock; k += 16) {
            const __m128i chunk = _mm_loadu_si128(reinterpret_cast<const __m128i*>(bytes + k));
            bits |= static_cast<std::uint64_t>(static_cast<unsigned>(_mm_movemask_epi8(_mm_cmpeq_epi8(chunk, delimiter))))
                    << k;
        }
#else
        for (size_t k = 0; k < kBlock; ++k)
            bits |= static_cast<std::uint64_t>(bytes[k] == m_delimiter) << k;
#endif
        const size_t left = m_length - block;
        if (left < kBlock)
            bits &= (std::uint64_t{1} << left) - 1;
        m_bits = bits;
    }

    const char* m_text;
    size_t m_length;
    char m_delimiter;
    size_t m_block = 0;
    std::uint64_t m_bits = 0;
};

// A whole line split at once: each NextField call becomes one Call record (where it started, where
// it left the position, the field text). Plain lines take PlainFields; the rest, and a plain line
// from its first quoted field on, take FieldRule.
class FieldSplitter {
public:
    struct Call {
        std::string_view text; // the field this call returned, a view into the line
        int start = 0;         // the position before the call
        int end = 0;           // the position after it; -1 after the last field
    };

    explicit FieldSplitter(Dialect dialect);
    // The rule holds a view of the dialect's delimiter: the splitter stays where it was made.
    FieldSplitter(const FieldSplitter&) = delete;
    FieldSplitter& operator=(const FieldSplitter&) = delete;

    // Splits `line`. The calls stay valid until the next Split and as long as the line does.
    void Split(std::string_view line);

    std::span<const Call> Calls() const { return {m_calls.data(), m_count}; }
    // The line as the calls index it: a leading-delimiter rule may have cut delimiters off its start.
    std::string_view Line() const { return m_line; }
    // True when a quoted field was malformed (NextField shows message 2305 for it).
    bool QuoteError() const { return m_quoteError; }
    // The position in the original line where Line() begins.
    int Offset() const { return m_offset; }
    const Dialect& dialect() const { return m_dialect; }

private:
    void Add(std::string_view text, int start, int end)
    {
        if (m_count == m_calls.size())
            m_calls.resize(m_calls.size() * 2 + 16);
        m_calls[m_count++] = Call{text, start, end};
    }

    Dialect m_dialect;
    FieldRule m_rule;
    bool m_plain;

    std::string_view m_line;
    int m_offset = 0;
    bool m_quoteError = false;
    std::vector<Call> m_calls; // grows only; the first m_count are this line's
    size_t m_count = 0;
};

} // namespace delimited
