#include "formats/xlsx/XmlScanner.h"

#include "platform/system/Text.h"

#include <algorithm>

namespace sheet {

namespace {

bool IsSpace(int c) { return c == ' ' || c == '\t' || c == '\r' || c == '\n'; }

bool IsNameStart(int c)
{
    return (c >= 'A' && c <= 'Z') || (c >= 'a' && c <= 'z') || c == '_' || c == ':' || c >= 0x80;
}

bool IsNameChar(int c) { return IsNameStart(c) || (c >= '0' && c <= '9') || c == '-' || c == '.'; }

std::string Describe(int c)
{
    if (c < 0)
        return "the end of the part";
    if (c >= 0x21 && c < 0x7F)
        return std::string("'") + static_cast<char>(c) + "'";
    static const char hex[] = "0123456789ABCDEF";
    return std::string("byte 0x") + hex[(c >> 4) & 15] + hex[c & 15];
}

} // namespace

XmlScanner::XmlScanner(Source source, std::string partName, std::size_t bufferBytes, std::size_t maxTokenBytes)
    : m_source(std::move(source)), m_part(std::move(partName)), m_maxToken(maxTokenBytes),
      m_buffer(std::max<std::size_t>(bufferBytes, 1))
{
}

bool XmlScanner::Fill()
{
    if (m_sourceEnded)
        return false;
    m_base += m_end;
    m_pos = 0;
    m_end = 0;
    const std::size_t got = m_source(m_buffer.data(), m_buffer.size());
    if (got > m_buffer.size())
        Malformed("its source gave more bytes than asked for");
    m_end = got;
    m_sourceEnded = got == 0;
    return m_end > 0;
}

int XmlScanner::Peek()
{
    if (m_pos == m_end && !Fill())
        return kEndOfInput;
    return static_cast<unsigned char>(m_buffer[m_pos]);
}

int XmlScanner::Get()
{
    const int c = Peek();
    if (c != kEndOfInput)
        ++m_pos;
    return c;
}

void XmlScanner::Fail(const std::string& why) const
{
    Fail(why, m_tokenStart);
}

void XmlScanner::Fail(const std::string& why, std::uint64_t offset) const
{
    throw Error(m_part + ", byte " + std::to_string(offset) + ": " + why);
}

void XmlScanner::Malformed(const std::string& why) const
{
    throw Error(m_part + ", byte " + std::to_string(Offset()) + ": the XML is damaged (" + why + ")");
}

void XmlScanner::Append(std::string& to, const char* bytes, std::size_t count)
{
    m_tokenBytes += count;
    if (m_tokenBytes > m_maxToken)
        Malformed("a tag or text run longer than " + std::to_string(m_maxToken) + " bytes");
    to.append(bytes, count);
}

void XmlScanner::AppendCodePoint(std::string& to, std::uint32_t cp)
{
    std::string bytes;
    text::AppendUtf8(bytes, cp);
    Append(to, bytes.data(), bytes.size());
}

XmlScanner::Token XmlScanner::Next()
{
    if (!m_started) {
        m_started = true;
        // A UTF-8 byte order mark may open the part.
        if (Peek() == 0xEF) {
            Get();
            Expect('\xBB', "a byte order mark");
            Expect('\xBF', "a byte order mark");
        }
    }
    if (m_pendingEnd) {
        m_pendingEnd = false;
        Pop();
        return Token::EndTag;
    }
    for (;;) {
        m_tokenStart = Offset();
        m_tokenBytes = 0;
        const int c = Peek();
        if (c == kEndOfInput) {
            if (m_depth > 0)
                Malformed("the part ends inside the element <" + m_open[m_depth - 1] + ">");
            if (!m_sawRoot)
                Malformed("the part holds no element");
            return Token::End;
        }
        if (c != '<') {
            ScanText();
            if (m_depth > 0)
                return Token::Text;
            if (std::any_of(m_text.begin(), m_text.end(), [](char t) { return !IsSpace(t); }))
                Malformed("text outside the root element");
            continue;
        }
        Get();
        Token token;
        if (ScanMarkup(token))
            return token;
    }
}

// After '<': a tag, or markup that gives no token (comments, declarations, DOCTYPE).
bool XmlScanner::ScanMarkup(Token& token)
{
    const int c = Peek();
    if (c == '/') {
        Get();
        ScanEndTag();
        token = Token::EndTag;
        return true;
    }
    if (c == '?') {
        SkipPast("?>", "a processing instruction");
        return false;
    }
    if (c == '!') {
        Get();
        if (Peek() == '-') {
            Get();
            Expect('-', "a comment's opening");
            SkipPast("-->", "a comment");
            return false;
        }
        if (Peek() == '[') {
            for (char wanted : std::string_view("[CDATA["))
                Expect(wanted, "a CDATA section's opening");
            if (m_depth == 0)
                Malformed("a CDATA section outside the root element");
            ScanCData();
            token = Token::Text;
            return true;
        }
        for (char wanted : std::string_view("DOCTYPE"))
            Expect(wanted, "a declaration");
        SkipDoctype();
        return false;
    }
    ScanStartTag();
    token = Token::StartTag;
    return true;
}

void XmlScanner::Expect(char wanted, const char* where)
{
    const int c = Get();
    if (c != static_cast<unsigned char>(wanted))
        Malformed(Describe(c) + " in " + where + " where '" + std::string(1, wanted) + "' belongs");
}

void XmlScanner::SkipWhitespace()
{
    while (IsSpace(Peek()))
        Get();
}

void XmlScanner::SkipPast(std::string_view terminator, const char* what)
{
    std::size_t matched = 0;
    while (matched < terminator.size()) {
        const int c = Get();
        if (c == kEndOfInput)
            Malformed(std::string(what) + " that never ends");
        if (c == static_cast<unsigned char>(terminator[matched]))
            ++matched;
        else
            matched = c == static_cast<unsigned char>(terminator[0]) ? 1 : 0;
    }
}

// The internal subset in brackets may hold '>' of its own declarations.
void XmlScanner::SkipDoctype()
{
    int brackets = 0;
    int quote = 0;
    for (;;) {
        const int c = Get();
        if (c == kEndOfInput)
            Malformed("a DOCTYPE that never ends");
        if (quote != 0) {
            if (c == quote)
                quote = 0;
        } else if (c == '"' || c == '\'') {
            quote = c;
        } else if (c == '[') {
            ++brackets;
        } else if (c == ']') {
            brackets = std::max(brackets - 1, 0);
        } else if (c == '>' && brackets == 0) {
            return;
        }
    }
}

void XmlScanner::ScanName(std::string& to)
{
    to.clear();
    if (!IsNameStart(Peek()))
        Malformed(Describe(Peek()) + " where a name belongs");
    while (IsNameChar(Peek())) {
        const char c = static_cast<char>(Get());
        Append(to, &c, 1);
    }
}

void XmlScanner::ScanStartTag()
{
    ScanName(m_name);
    if (m_depth == 0 && m_sawRoot)
        Malformed("a second root element <" + m_name + ">");
    m_attributeChars.clear();
    m_attributes.clear();
    m_selfClosed = false;
    for (;;) {
        const bool spaced = IsSpace(Peek());
        SkipWhitespace();
        const int c = Peek();
        if (c == '>') {
            Get();
            break;
        }
        if (c == '/') {
            Get();
            Expect('>', "a self-closing tag");
            m_selfClosed = true;
            break;
        }
        if (!spaced)
            Malformed(Describe(c) + " inside the tag <" + m_name + ">");
        AttributeSpan span{};
        span.nameBegin = m_attributeChars.size();
        std::string name;
        ScanName(name);
        Append(m_attributeChars, name.data(), name.size());
        span.nameLength = name.size();
        SkipWhitespace();
        Expect('=', "an attribute");
        SkipWhitespace();
        const int quote = Get();
        if (quote != '"' && quote != '\'')
            Malformed(Describe(quote) + " where the quoted value of the attribute " + name + " belongs");
        span.valueBegin = m_attributeChars.size();
        ScanAttributeValue(quote);
        span.valueLength = m_attributeChars.size() - span.valueBegin;
        // Namespace declarations would shadow attributes of the same local name (xmlns:r, r).
        if (name != "xmlns" && name.rfind("xmlns:", 0) != 0)
            m_attributes.push_back(span);
    }
    Push();
    m_sawRoot = true;
    m_pendingEnd = m_selfClosed;
}

void XmlScanner::ScanAttributeValue(int quote)
{
    for (;;) {
        const int c = Get();
        if (c == quote)
            return;
        if (c == kEndOfInput || c == '<')
            Malformed(Describe(c) + " inside an attribute value of the tag <" + m_name + ">");
        if (c == '&') {
            DecodeReference(m_attributeChars);
        } else {
            const char byte = static_cast<char>(c);
            Append(m_attributeChars, &byte, 1);
        }
    }
}

void XmlScanner::ScanEndTag()
{
    ScanName(m_name);
    SkipWhitespace();
    Expect('>', "an end tag");
    if (m_depth == 0)
        Malformed("the end tag </" + m_name + "> closes no element");
    if (m_open[m_depth - 1] != m_name)
        Malformed("the end tag </" + m_name + "> where <" + m_open[m_depth - 1] + "> is open");
    Pop();
}

void XmlScanner::Push()
{
    if (m_depth == kMaxDepth)
        Malformed("elements nested deeper than " + std::to_string(kMaxDepth));
    if (m_depth == m_open.size())
        m_open.emplace_back();
    m_open[m_depth++] = m_name;
}

void XmlScanner::Pop()
{
    m_name = m_open[--m_depth];
}

void XmlScanner::ScanText()
{
    m_text.clear();
    for (;;) {
        if (m_pos == m_end && !Fill())
            return;
        const char* start = m_buffer.data() + m_pos;
        const char* stop = m_buffer.data() + m_end;
        const char* at = start;
        while (at != stop && *at != '<' && *at != '&')
            ++at;
        Append(m_text, start, static_cast<std::size_t>(at - start));
        m_pos += static_cast<std::size_t>(at - start);
        if (at == stop)
            continue;
        if (*at == '<')
            return;
        Get();
        DecodeReference(m_text);
    }
}

void XmlScanner::ScanCData()
{
    m_text.clear();
    std::size_t brackets = 0; // ']' seen just before
    for (;;) {
        const int c = Get();
        if (c == kEndOfInput)
            Malformed("a CDATA section that never ends");
        if (c == '>' && brackets >= 2) {
            m_text.resize(m_text.size() - 2);
            return;
        }
        brackets = c == ']' ? brackets + 1 : 0;
        const char byte = static_cast<char>(c);
        Append(m_text, &byte, 1);
    }
}

// After '&': an entity or character reference up to ';'.
void XmlScanner::DecodeReference(std::string& to)
{
    char name[12];
    std::size_t length = 0;
    for (;;) {
        const int c = Get();
        if (c == ';')
            break;
        if (c == kEndOfInput || length == sizeof name || IsSpace(c) || c == '<' || c == '&')
            Malformed("an '&' that starts no entity or character reference");
        name[length++] = static_cast<char>(c);
    }
    const std::string_view entity(name, length);
    static constexpr std::pair<std::string_view, char> kEntities[] = {
        {"amp", '&'}, {"lt", '<'}, {"gt", '>'}, {"quot", '"'}, {"apos", '\''}};
    for (const auto& [known, decoded] : kEntities)
        if (entity == known) {
            Append(to, &decoded, 1);
            return;
        }
    if (entity.size() < 2 || entity[0] != '#')
        Malformed("the unknown entity &" + std::string(entity) + ";");
    const bool hex = entity[1] == 'x';
    const std::string_view digits = entity.substr(hex ? 2 : 1);
    std::uint32_t cp = 0;
    bool valid = !digits.empty() && digits.size() <= 8;
    for (char d : digits) {
        int value = -1;
        if (d >= '0' && d <= '9')
            value = d - '0';
        else if (hex && d >= 'a' && d <= 'f')
            value = d - 'a' + 10;
        else if (hex && d >= 'A' && d <= 'F')
            value = d - 'A' + 10;
        valid = valid && value >= 0;
        cp = cp * (hex ? 16 : 10) + static_cast<std::uint32_t>(std::max(value, 0));
    }
    if (!valid || cp == 0 || cp > 0x10FFFF || (cp >= 0xD800 && cp <= 0xDFFF))
        Malformed("the character reference &" + std::string(entity) + "; names no character");
    AppendCodePoint(to, cp);
}

std::string_view XmlScanner::LocalName(std::string_view qualified) const
{
    const std::size_t colon = qualified.rfind(':');
    return colon == std::string_view::npos ? qualified : qualified.substr(colon + 1);
}

std::string_view XmlScanner::Name() const
{
    return LocalName(m_name);
}

std::optional<std::string_view> XmlScanner::Attribute(std::string_view name) const
{
    const std::string_view chars = m_attributeChars;
    for (const AttributeSpan& span : m_attributes)
        if (LocalName(chars.substr(span.nameBegin, span.nameLength)) == name)
            return chars.substr(span.valueBegin, span.valueLength);
    return std::nullopt;
}

void XmlScanner::SkipElement()
{
    const std::size_t depth = m_depth;
    while (m_depth >= depth) {
        if (Next() == Token::End)
            return;
    }
}

} // namespace sheet
