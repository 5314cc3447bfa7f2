#include "templates/Specification.h"

#include "delimited/FieldSplitter.h"
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

delimited::Dialect CSpecification::GetDialect() const
{
    delimited::Dialect dialect;
    dialect.delimiter = GetDelimiterString();
    dialect.ignoreConsecutive = m_bIgnoreConsecutiveDelimiters != 0;
    dialect.ignoreLeading = m_bIgnoreBegginingOfLineDelimiters != 0;
    dialect.decimalSeparator = GetDecimalSeparatorString();
    return dialect;
}

CString CSpecification::NextField(CString& line, int& pos) const
{
    const CString delimiter = GetDelimiterString();
    const delimited::FieldRule rule(delimiter, m_bIgnoreConsecutiveDelimiters != 0, m_bIgnoreBegginingOfLineDelimiters != 0);
    std::string_view rest = line;
    bool quoteError = false;
    CString field(rule.Next(rest, pos, quoteError));
    // The rule may have removed delimiters from the line's start; the caller's line loses them too.
    if (rest.size() != line.size())
        line.erase(0, line.size() - rest.size());
    if (quoteError)
        ui::MessageBox(res::LoadString(res::IDS_QUOTE_OR_DELIMITER_MISSING), CString(), ui::MB_OK);
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
    return delimited::Delimiter(separator).CountPieces(format);
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
