#pragma once
// Splitting a text line into fields the way CSpecification::NextField does, call for call, without
// allocating: each call NextField would make becomes one Call record (where it started, where it
// left the position, the field text). Single-character delimiters take the fast path; any other
// delimiter goes through NextField itself.
#include <deque>
#include <span>
#include <string>
#include <string_view>
#include <vector>

#if defined(__SSE2__)
#include <emmintrin.h>
#endif

class CSpecification;

namespace converter {

// The first `delimiterChar` at or after `at` in `line`, or the line's length. Fields are short, so
// a library search call per field costs more than the search: sixteen bytes are compared at once
// while they lie inside the line, the rest one by one.
inline size_t FindDelimiter(std::string_view line, size_t at, char delimiterChar)
{
    const size_t length = line.size();
#if defined(__SSE2__)
    const __m128i delimiter = _mm_set1_epi8(delimiterChar);
    for (; at + 16 <= length; at += 16) {
        const __m128i bytes = _mm_loadu_si128(reinterpret_cast<const __m128i*>(line.data() + at));
        const int found = _mm_movemask_epi8(_mm_cmpeq_epi8(bytes, delimiter));
        if (found != 0)
            return at + static_cast<size_t>(__builtin_ctz(static_cast<unsigned>(found)));
    }
#endif
    while (at < length && line[at] != delimiterChar)
        ++at;
    return at;
}

class FieldSplitter {
public:
    struct Call {
        std::string_view text; // the field this call returned
        int start = 0;         // the position before the call
        int end = 0;           // the position after it; -1 after the last field
    };

    // Takes the delimiter and the two delimiter flags from the template (which must outlive the splitter).
    explicit FieldSplitter(const CSpecification& spec);

    // Splits `line`. The calls and the line they index stay valid until the next Split.
    void Split(std::string_view line);

    std::span<const Call> Calls() const { return {m_calls.data(), m_count}; }
    // The line as the calls index it: a leading-delimiter flag may have cut delimiters off its start.
    std::string_view Line() const { return m_line; }
    // True when a quoted field was malformed (NextField would have shown its message).
    bool QuoteError() const { return m_quoteError; }
    // The position in the original line where Line() begins.
    int Offset() const { return m_offset; }

private:
    void SplitFast(std::string_view line);
    void SplitThroughSpecification(std::string_view line);
    // One NextField call on the fast path; the same steps, numbered as NextField documents them.
    std::string_view NextField(int& pos);
    std::string_view TakeField(int& pos, bool& skipAfter);
    bool DelimiterAt(int pos) const;
    void Add(std::string_view text, int start, int end)
    {
        if (m_count == m_calls.size())
            m_calls.resize(m_calls.size() * 2 + 16);
        m_calls[m_count++] = Call{text, start, end};
    }

    const CSpecification& m_spec;
    std::string m_delimiter;
    char m_delimiterChar = '\t';
    bool m_fast = true;
    bool m_consecutive = false;
    bool m_leading = false;

    std::string_view m_line;
    int m_offset = 0;
    bool m_quoteError = false;
    std::vector<Call> m_calls; // grows only; the first m_count are this line's
    size_t m_count = 0;
    // Slow path only: the line NextField may change and the fields it returned.
    std::string m_slowLine;
    std::deque<std::string> m_slowFields;
};

} // namespace converter
