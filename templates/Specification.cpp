#include "templates/Specification.h"

#include "platform/system/FileSystem.h"
#include "platform/system/Text.h"
#include "platform/ui/UserInterface.h"
#include "resources/StringTable.h"

#include <ctime>
#include <string_view>

namespace {

CString FormatLocalClock(const char* format)
{
    std::time_t now = std::time(nullptr);
    std::tm local {};
    if (!localtime_r(&now, &local))
        return CString();
    char buffer[64];
    size_t length = std::strftime(buffer, sizeof(buffer), format, &local);
    return CString(buffer, length);
}

// The first `count` characters of UTF-8 text, never splitting a character.
CString FirstCharacters(const CString& text, size_t count)
{
    size_t end = 0;
    for (size_t seen = 0; end < text.size() && seen < count; ++seen) {
        ++end;
        while (end < text.size() && (static_cast<unsigned char>(text[end]) & 0xC0) == 0x80)
            ++end;
    }
    return text.substr(0, end);
}

// A delimiter is one separator text. A single character is the usual case; a longer user delimiter
// separates only where the whole text occurs, so "||" never splits at a lone "|".
class Delimiter {
public:
    explicit Delimiter(std::string_view text) : m_text(text) {}

    bool MatchesAt(const CString& line, size_t pos) const
    {
        if (m_text.empty() || pos >= line.size())
            return false;
        if (m_text.size() == 1)
            return line[pos] == m_text[0];
        return line.compare(pos, m_text.size(), m_text) == 0;
    }
    bool EndsLine(const CString& line) const
    {
        return !m_text.empty() && line.size() >= m_text.size() && MatchesAt(line, line.size() - m_text.size());
    }
    size_t FindFrom(const CString& line, size_t pos) const
    {
        if (m_text.empty())
            return CString::npos;
        return m_text.size() == 1 ? line.find(m_text[0], pos) : line.find(m_text, pos);
    }
    size_t Length() const { return m_text.size(); }
    // Removes every delimiter at the start of `line`.
    void TrimLeading(CString& line) const
    {
        size_t start = 0;
        while (MatchesAt(line, start))
            start += m_text.size();
        if (start)
            line.erase(0, start);
    }

private:
    std::string_view m_text;
};

// How a field was taken; only plain fields and accepted quoted fields let a run of delimiters follow.
enum class FieldEnd { LineEndsInDelimiter, NoField, Plain, QuotedAccepted, QuotedRejected, OnlyQuotes };

FieldEnd TakeField(CString& line, int& pos, const Delimiter& delimiter, CString& field)
{
    field.clear();
    const size_t length = line.size();
    const size_t at = static_cast<size_t>(pos);
    if (at == length && delimiter.EndsLine(line)) {
        pos = static_cast<int>(length) + 1;
        return FieldEnd::LineEndsInDelimiter;
    }
    if (at >= length) {
        pos = -1;
        return FieldEnd::NoField;
    }
    if (line[at] != '"') {
        size_t found = delimiter.FindFrom(line, at);
        if (found == CString::npos) {
            field.assign(line, at, length - at);
            pos = static_cast<int>(length);
        } else {
            field.assign(line, at, found - at);
            pos = static_cast<int>(found + delimiter.Length());
        }
        return FieldEnd::Plain;
    }
    size_t start = at;
    while (start < length && line[start] == '"')
        ++start;
    if (start == length) {
        pos = -1;
        return FieldEnd::OnlyQuotes;
    }
    size_t closing = line.find('"', start);
    if (closing == CString::npos)
        closing = length;
    size_t behind = closing + 1;
    if (delimiter.MatchesAt(line, behind)) {
        field.assign(line, start, closing - start);
        pos = static_cast<int>(behind + delimiter.Length());
        return FieldEnd::QuotedAccepted;
    }
    if (closing + 1 == length) {
        field.assign(line, start, closing - start);
        pos = static_cast<int>(behind);
        return FieldEnd::QuotedAccepted;
    }
    pos = static_cast<int>(behind);
    ui::MessageBox(res::LoadString(res::IDS_QUOTE_OR_DELIMITER_MISSING), CString(), ui::MB_OK);
    return FieldEnd::QuotedRejected;
}

void SkipDelimiters(const CString& line, int& pos, const Delimiter& delimiter)
{
    while (pos >= 0 && static_cast<size_t>(pos) < line.size() && delimiter.MatchesAt(line, static_cast<size_t>(pos)))
        pos += static_cast<int>(delimiter.Length());
}

// The number of non-empty pieces of `format` between separators.
int CountTokens(const CString& format, const Delimiter& separator)
{
    int tokens = 0;
    size_t pos = 0;
    while (pos < format.size()) {
        if (separator.MatchesAt(format, pos)) {
            pos += separator.Length();
            continue;
        }
        ++tokens;
        size_t next = separator.FindFrom(format, pos);
        pos = next == CString::npos ? format.size() : next;
    }
    return tokens;
}

bool IsFormatSeparator(char c)
{
    return CString("/ T:-.|").find(c) != CString::npos;
}

bool IsFormatLetter(char c)
{
    return CString("DHMSYdhmsy").find(c) != CString::npos;
}

} // namespace

CTimeDescription::CTimeDescription()
    : m_strGlobalDate(FormatLocalClock("%Y-%m-%d")), m_strGlobalTime(FormatLocalClock("%H:%M:%S"))
{
}

int CSpecification::Load(const CString& path)
{
    m_bLoaded = 1;
    if (!text::EqualsNoCase(path, m_strTemplateFile)) {
        m_strTemplateFile = path;
        m_bLoaded = 0;
    }
    return 1;
}

void CSpecification::SetTemplateFile(const CString& path)
{
    if (text::EqualsNoCase(path, m_strTemplateFile))
        return;
    m_strTemplateFile = path;
    m_bLoaded = 0;
}

int CSpecification::MapSeparatorName(const CString& name, CString& separator)
{
    if (name == "Dot")
        separator = ".";
    else if (name == "Comma")
        separator = ",";
    else if (name == "Tab")
        separator = "\t";
    else if (name == "Semi Colon")
        separator = ";";
    else if (name == "Space")
        separator = " ";
    else if (name == "User Locale") {
        separator = FirstCharacters(sys::LocaleDecimalSeparator(), 4);
        if (separator.empty())
            separator = ".";
    } else {
        separator = " ";
        return 0;
    }
    return 1;
}

CString CSpecification::GetDelimiterString() const
{
    if (text::EqualsNoCase(m_strDelimiter, "User Defined"))
        return m_strDefDelimiter.empty() ? CString("\t") : m_strDefDelimiter;
    CString separator;
    MapSeparatorName(m_strDelimiter, separator);
    return separator;
}

CString CSpecification::GetDecimalSeparatorString() const
{
    CString separator;
    MapSeparatorName(m_strDecimalSeparator, separator);
    return separator;
}

CString CSpecification::NextField(CString& line, int& pos) const
{
    CString field;
    if (line.empty() || pos < 0) {
        pos = -1;
        return field;
    }
    const CString delimiterText = GetDelimiterString();
    const Delimiter delimiter(delimiterText);

    if (!m_bIgnoreConsecutiveDelimiters) {
        if (m_bIgnoreBegginingOfLineDelimiters && pos == 0)
            delimiter.TrimLeading(line);
        TakeField(line, pos, delimiter, field);
        return field;
    }
    if (!m_bIgnoreBegginingOfLineDelimiters && pos == 0 && delimiter.MatchesAt(line, 0)) {
        // The leading run stands for one empty first field; the next call starts at the first value.
        delimiter.TrimLeading(line);
        return field;
    }
    SkipDelimiters(line, pos, delimiter);
    FieldEnd end = TakeField(line, pos, delimiter, field);
    if (end == FieldEnd::Plain || end == FieldEnd::QuotedAccepted)
        SkipDelimiters(line, pos, delimiter);
    return field;
}

int CSpecification::CountFormatColumns(int byOption) const
{
    const CString* format = &m_TimeDesc.m_strDateTimeFormat;
    if (byOption != 0) {
        switch (m_TimeDesc.m_nDateTimeOption) {
        case 0: format = &m_TimeDesc.m_strDateTimeFormat; break;
        case 1: format = &m_TimeDesc.m_strTimeFormat; break;
        case 2: format = &m_TimeDesc.m_strDateFormat; break;
        default: return 0;
        }
    }
    return CountFormatTokens(*format, GetDelimiterString());
}

int CSpecification::CountFormatTokens(const CString& format, const CString& separator)
{
    return CountTokens(format, Delimiter(separator));
}

int CSpecification::GetDateTimeColumn() const
{
    switch (m_TimeDesc.m_nDateTimeOption) {
    case 0: return m_TimeDesc.m_nDateTimeCol;
    case 1: return m_TimeDesc.m_nTimeCol;
    case 2: return m_TimeDesc.m_nDateCol;
    default: return -1;
    }
}

int CSpecification::GetValueTypeCode(const CString& name, int& code)
{
    for (int i = 1; i < static_cast<int>(kValueTypeNames.size()); ++i) {
        if (text::EqualsNoCase(name, kValueTypeNames[static_cast<size_t>(i)])) {
            code = i;
            return 1;
        }
    }
    return 0;
}

int CSpecification::IsValidDateTimeFormat(const CString& format, CString& message)
{
    for (char c : format) {
        if (!IsFormatSeparator(c) && !IsFormatLetter(c)) {
            message = res::LoadString(res::IDS_DATETIME_FORMAT_LETTERS);
            return 0;
        }
    }
    return 1;
}

int CSpecification::FormatSelItems(const CUIntArray& items, CString& itemText)
{
    itemText.clear();
    if (items.empty())
        return 0;
    for (size_t i = 0; i < items.size(); ++i)
        itemText += text::Format(i ? ",%d" : "%d", static_cast<int>(items[i]));
    return 1;
}

void CSpecification::ParseSelItems(const CString& itemText, CUIntArray& items)
{
    items.clear();
    CString compact;
    compact.reserve(itemText.size());
    for (char c : itemText)
        if (c != ' ' && c != '\t')
            compact += c;
    size_t start = 0;
    while (start <= compact.size()) {
        size_t comma = compact.find(',', start);
        size_t end = comma == CString::npos ? compact.size() : comma;
        if (end > start)
            items.push_back(static_cast<unsigned>(text::AtoI(std::string_view(compact).substr(start, end - start))));
        if (comma == CString::npos)
            break;
        start = comma + 1;
    }
}
