#include "converter/FieldSplitter.h"

#include "platform/ui/UserInterface.h"
#include "templates/Specification.h"

#include <cstring>

namespace converter {

FieldSplitter::FieldSplitter(const CSpecification& spec)
    : m_spec(spec), m_delimiter(spec.GetDelimiterString()),
      m_consecutive(spec.m_bIgnoreConsecutiveDelimiters != 0), m_leading(spec.m_bIgnoreBegginingOfLineDelimiters != 0)
{
    m_fast = m_delimiter.size() == 1;
    if (m_fast)
        m_delimiterChar = m_delimiter[0];
}

void FieldSplitter::Split(std::string_view line)
{
    m_count = 0;
    m_quoteError = false;
    m_offset = 0;
    if (m_fast)
        SplitFast(line);
    else
        SplitThroughSpecification(line);
}

bool FieldSplitter::DelimiterAt(int pos) const
{
    return pos >= 0 && pos < static_cast<int>(m_line.size()) && m_line[static_cast<size_t>(pos)] == m_delimiterChar;
}


void FieldSplitter::SplitFast(std::string_view line)
{
    m_line = line;
    int pos = 0;
    if (!m_consecutive && !m_leading) {
        // Without the two flags a field that does not start with a quote is the text up to the
        // next delimiter: one pass over the line gives every call; a quote hands over to NextField.
        const size_t length = line.size();
        size_t at = 0;
        while (true) {
            if (at == length) {
                if (length > 0 && line[length - 1] == m_delimiterChar) {
                    Add({}, static_cast<int>(length), static_cast<int>(length) + 1);
                    Add({}, static_cast<int>(length) + 1, -1);
                } else {
                    Add({}, static_cast<int>(length), -1);
                }
                return;
            }
            if (line[at] == '"')
                break;
            const size_t end = FindDelimiter(line, at, m_delimiterChar);
            const size_t next = end < length ? end + 1 : length;
            Add(line.substr(at, end - at), static_cast<int>(at), static_cast<int>(next));
            at = next;
        }
        pos = static_cast<int>(at);
    }
    do {
        const int start = pos;
        std::string_view field = NextField(pos);
        // NextField may have cut the line's start; positions then count from the cut.
        Add(field, start, pos);
    } while (pos != -1);
}

std::string_view FieldSplitter::NextField(int& pos)
{
    if (m_line.empty()) {
        pos = -1;
        return {};
    }
    bool skipAfter = false;
    if (!m_consecutive) {
        if (m_leading && pos == 0) {
            size_t cut = 0;
            while (cut < m_line.size() && m_line[cut] == m_delimiterChar)
                ++cut;
            m_line.remove_prefix(cut);
            m_offset += static_cast<int>(cut);
        }
        return TakeField(pos, skipAfter);
    }
    if (!m_leading && pos == 0 && DelimiterAt(0)) {
        size_t cut = 0;
        while (cut < m_line.size() && m_line[cut] == m_delimiterChar)
            ++cut;
        m_line.remove_prefix(cut);
        m_offset += static_cast<int>(cut);
        return {};
    }
    const int length = static_cast<int>(m_line.size());
    while (pos < length && DelimiterAt(pos))
        ++pos;
    std::string_view field = TakeField(pos, skipAfter);
    if (skipAfter)
        while (pos < length && DelimiterAt(pos))
            ++pos;
    return field;
}

// Steps 5.1 to 5.4; `skipAfter` tells whether a run of delimiters may be passed after the field.
std::string_view FieldSplitter::TakeField(int& pos, bool& skipAfter)
{
    const int length = static_cast<int>(m_line.size());
    if (pos == length && length > 0 && m_line[static_cast<size_t>(length - 1)] == m_delimiterChar) {
        pos = length + 1;
        return {};
    }
    if (pos >= length) {
        pos = -1;
        return {};
    }
    const size_t at = static_cast<size_t>(pos);
    if (m_line[at] != '"') {
        const size_t found = m_line.find(m_delimiterChar, at);
        std::string_view field;
        if (found == std::string_view::npos) {
            field = m_line.substr(at);
            pos = length;
        } else {
            field = m_line.substr(at, found - at);
            pos = static_cast<int>(found) + 1;
        }
        skipAfter = true;
        return field;
    }
    size_t open = at;
    while (open < m_line.size() && m_line[open] == '"')
        ++open;
    if (open >= m_line.size()) {
        pos = -1;
        return {};
    }
    const size_t close = m_line.find('"', open);
    const size_t fieldEnd = close == std::string_view::npos ? m_line.size() : close;
    std::string_view field = m_line.substr(open, fieldEnd - open);
    pos = static_cast<int>(close == std::string_view::npos ? m_line.size() + 1 : close + 1);
    if (close != std::string_view::npos && DelimiterAt(pos)) {
        ++pos;
        skipAfter = true;
        return field;
    }
    if (close != std::string_view::npos && close + 1 == m_line.size()) {
        skipAfter = true;
        return field;
    }
    m_quoteError = true;
    return {};
}

void FieldSplitter::SplitThroughSpecification(std::string_view line)
{
    // NextField reports a malformed quote in a message box; a conversion reports it in its log.
    ui::ScriptedUserInterface recorder;
    ui::ScopedUserInterface scope(recorder);
    m_slowLine.assign(line);
    m_slowFields.clear();
    const size_t originalLength = m_slowLine.size();
    int pos = 0;
    do {
        const int start = pos;
        const size_t before = m_slowLine.size();
        m_slowFields.push_back(m_spec.NextField(m_slowLine, pos));
        if (m_slowLine.size() != before) // the leading delimiters were cut off
            m_offset = static_cast<int>(originalLength - m_slowLine.size());
        Add(m_slowFields.back(), start, pos);
    } while (pos != -1);
    m_line = m_slowLine;
    m_quoteError = !recorder.boxes.empty();
}

} // namespace converter
