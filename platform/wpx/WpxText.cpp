// The text form of a parameter document: writing it, and reading it back with messages that name
// the line and what was expected. Syntax: docs/wpx-format.md.
#include "platform/wpx/WpxModel.h"
#include "platform/system/Text.h"

#include <algorithm>
#include <cstdint>
#include <filesystem>
#include <string_view>

namespace wpx {

namespace {

constexpr int kVersion = 1;
constexpr size_t kMaxDepth = 64; // target plus nested sections

bool IsBareWordChar(char c)
{
    return (c >= 'a' && c <= 'z') || (c >= 'A' && c <= 'Z') || (c >= '0' && c <= '9') || c == '_' || c == '.' ||
           c == '-';
}

// ---------------------------------------------------------------- writing

std::string Quote(std::string_view value)
{
    std::string out = "\"";
    for (size_t i = 0; i < value.size();) {
        unsigned char c = static_cast<unsigned char>(value[i]);
        switch (c) {
        case '\\': out += "\\\\"; break;
        case '"': out += "\\\""; break;
        case '\n': out += "\\n"; break;
        case '\r': out += "\\r"; break;
        case '\t': out += "\\t"; break;
        default: {
            size_t length = c >= 0x20 && c != 0x7f ? text::Utf8SequenceLength(value, i) : 0;
            if (length == 0) {
                out += text::Format("\\x%02X", c);
                ++i;
            } else {
                out.append(value.substr(i, length));
                i += length;
            }
            continue;
        }
        }
        ++i;
    }
    return out + "\"";
}

bool IsReservedWord(std::string_view word)
{
    return word == "target" || word == "section" || word == "end" || word == "wpx" || word == "file";
}

std::string KeyText(const std::string& name)
{
    bool bare = !name.empty() && !IsReservedWord(name) && name[0] != '-' &&
                std::all_of(name.begin(), name.end(), IsBareWordChar);
    return bare ? name : Quote(name);
}

std::string ParamText(const Param& param)
{
    switch (param.type) {
    case wpxInt: return std::to_string(param.intValue);
    case wpxFilename: return "file " + Quote(param.text);
    default: return Quote(param.text);
    }
}

void FormatContainer(const Container& container, int depth, std::string& out)
{
    std::string indent(2 * depth, ' ');
    out += indent + (container.isTarget ? "target " : "section ") + Quote(container.name) + "\n";
    for (const Entry& entry : container.entries) {
        if (entry.section) {
            FormatContainer(*entry.section, depth + 1, out);
            continue;
        }
        out += indent + "  " + KeyText(entry.keyword->name) + " =";
        for (size_t i = 0; i < entry.keyword->params.size(); ++i)
            out += (i ? ", " : " ") + ParamText(*entry.keyword->params[i]);
        out += "\n";
    }
    out += indent + "end\n";
}

// ---------------------------------------------------------------- reading

// One line of the document, read left to right.
class Cursor {
public:
    explicit Cursor(std::string_view line) : m_line(line) {}

    void SkipBlanks()
    {
        while (m_pos < m_line.size() && (m_line[m_pos] == ' ' || m_line[m_pos] == '\t'))
            ++m_pos;
    }
    bool AtEnd()
    {
        SkipBlanks();
        return m_pos >= m_line.size();
    }
    char Peek()
    {
        SkipBlanks();
        return m_pos < m_line.size() ? m_line[m_pos] : '\0';
    }
    bool Take(char c)
    {
        if (Peek() != c)
            return false;
        ++m_pos;
        return true;
    }
    std::string Word()
    {
        SkipBlanks();
        size_t start = m_pos;
        while (m_pos < m_line.size() && IsBareWordChar(m_line[m_pos]))
            ++m_pos;
        return std::string(m_line.substr(start, m_pos - start));
    }
    // The word at the cursor without consuming it.
    std::string PeekWord()
    {
        size_t saved = m_pos;
        std::string word = Word();
        m_pos = saved;
        return word;
    }
    // A quoted text; false with `error` set when it is malformed.
    bool Quoted(std::string& value, std::string& error);
    // A decimal int; false with `error` set when it is out of range.
    bool Integer(int& value, std::string& error);

private:
    std::string_view m_line;
    size_t m_pos = 0;
};

int HexDigit(char c)
{
    if (c >= '0' && c <= '9')
        return c - '0';
    if (c >= 'a' && c <= 'f')
        return c - 'a' + 10;
    if (c >= 'A' && c <= 'F')
        return c - 'A' + 10;
    return -1;
}

bool Cursor::Quoted(std::string& value, std::string& error)
{
    if (!Take('"')) {
        error = "expected a quoted text";
        return false;
    }
    value.clear();
    while (m_pos < m_line.size()) {
        char c = m_line[m_pos++];
        if (c == '"')
            return true;
        if (c != '\\') {
            value += c;
            continue;
        }
        if (m_pos >= m_line.size())
            break;
        char escape = m_line[m_pos++];
        switch (escape) {
        case '\\': value += '\\'; break;
        case '"': value += '"'; break;
        case 'n': value += '\n'; break;
        case 'r': value += '\r'; break;
        case 't': value += '\t'; break;
        case 'x': {
            int high = m_pos < m_line.size() ? HexDigit(m_line[m_pos]) : -1;
            int low = m_pos + 1 < m_line.size() ? HexDigit(m_line[m_pos + 1]) : -1;
            if (high < 0 || low < 0) {
                error = "expected two hex digits after \\x";
                return false;
            }
            value += static_cast<char>(high * 16 + low);
            m_pos += 2;
            break;
        }
        default:
            error = std::string("unknown escape \\") + escape + "; expected one of \\\\ \\\" \\n \\r \\t \\xHH";
            return false;
        }
    }
    error = "the text is not closed; expected a closing quote before the end of the line";
    return false;
}

bool Cursor::Integer(int& value, std::string& error)
{
    SkipBlanks();
    bool negative = m_pos < m_line.size() && m_line[m_pos] == '-';
    if (negative)
        ++m_pos;
    std::int64_t magnitude = 0;
    size_t digits = 0;
    while (m_pos < m_line.size() && m_line[m_pos] >= '0' && m_line[m_pos] <= '9') {
        magnitude = magnitude * 10 + (m_line[m_pos++] - '0');
        if (magnitude > 2147483648LL) {
            error = "the number is out of range; expected -2147483648 to 2147483647";
            return false;
        }
        ++digits;
    }
    if (digits == 0) {
        error = "expected a number";
        return false;
    }
    if (!negative && magnitude > 2147483647LL) {
        error = "the number is out of range; expected -2147483648 to 2147483647";
        return false;
    }
    value = static_cast<int>(negative ? -magnitude : magnitude);
    return true;
}

struct OpenContainer {
    Container* container;
    int line;
};

class Reader {
public:
    Reader(const std::string& sourceName, const std::string& baseFolder, Document& document)
        : m_source(sourceName), m_base(baseFolder), m_doc(document)
    {
    }

    bool Run(std::string_view text, std::string& error);

private:
    bool Fail(const std::string& message)
    {
        m_error = text::Format("%s:%d: %s", m_source.c_str(), m_lineNumber, message.c_str());
        return false;
    }
    bool CheckCharacters(std::string_view line);
    bool Line(std::string_view line);
    bool Header(Cursor& cursor);
    bool Open(Cursor& cursor, bool target);
    bool Close(Cursor& cursor);
    bool KeywordLine(Cursor& cursor);
    bool Parameter(Cursor& cursor, Keyword& keyword);
    bool Finish();
    std::string Resolve(const std::string& fileName) const;

    std::string m_source;
    std::string m_base;
    Document& m_doc;
    std::vector<OpenContainer> m_open;
    int m_lineNumber = 0;
    bool m_headerSeen = false;
    bool m_trailerSeen = false;
    std::string m_error;
};

bool Reader::Run(std::string_view text, std::string& error)
{
    if (text.substr(0, 3) == "\xEF\xBB\xBF")
        text.remove_prefix(3);
    size_t start = 0;
    while (start < text.size()) {
        size_t end = text.find('\n', start);
        if (end == std::string_view::npos)
            end = text.size();
        std::string_view line = text.substr(start, end - start);
        if (!line.empty() && line.back() == '\r')
            line.remove_suffix(1);
        ++m_lineNumber;
        if (!Line(line)) {
            error = m_error;
            return false;
        }
        start = end + 1;
    }
    if (!Finish()) {
        error = m_error;
        return false;
    }
    return true;
}

bool Reader::CheckCharacters(std::string_view line)
{
    for (size_t i = 0; i < line.size();) {
        unsigned char c = static_cast<unsigned char>(line[i]);
        if ((c < 0x20 && c != '\t') || c == 0x7f)
            return Fail(text::Format("control character 0x%02X in column %zu; write it as \\x%02X inside quotes", c,
                                     i + 1, c));
        size_t length = text::Utf8SequenceLength(line, i);
        if (length == 0)
            return Fail(text::Format("invalid UTF-8 in column %zu; expected UTF-8 text (write other bytes as \\xHH "
                                     "inside quotes)",
                                     i + 1));
        i += length;
    }
    return true;
}

bool Reader::Line(std::string_view line)
{
    if (!CheckCharacters(line))
        return false;
    Cursor cursor(line);
    if (cursor.AtEnd() || cursor.Peek() == '#')
        return true;
    if (m_trailerSeen)
        return Fail("text after the last line \"wpx end\"; expected nothing more");
    if (!m_headerSeen)
        return Header(cursor);
    std::string word = cursor.PeekWord();
    if (word == "wpx") {
        cursor.Word();
        if (cursor.Word() != "end" || !cursor.AtEnd())
            return Fail("expected \"wpx end\"");
        if (!m_open.empty())
            return Fail(text::Format("\"wpx end\" inside %s \"%s\" opened on line %d; expected \"end\" first",
                                     m_open.back().container->isTarget ? "target" : "section",
                                     m_open.back().container->name.c_str(), m_open.back().line));
        m_trailerSeen = true;
        return true;
    }
    if (word == "target" || word == "section" || word == "end") {
        Cursor probe = cursor;
        probe.Word();
        if (probe.Peek() != '=') {
            cursor.Word();
            return word == "end" ? Close(cursor) : Open(cursor, word == "target");
        }
    }
    return KeywordLine(cursor);
}

bool Reader::Header(Cursor& cursor)
{
    int version = 0;
    std::string ignored;
    if (cursor.Word() != "wpx" || !cursor.Integer(version, ignored) || !cursor.AtEnd())
        return Fail(text::Format("expected the first line \"wpx %d\"; this is not a parameter document", kVersion));
    if (version != kVersion)
        return Fail(text::Format("unsupported version %d; expected \"wpx %d\"", version, kVersion));
    m_headerSeen = true;
    return true;
}

bool Reader::Open(Cursor& cursor, bool target)
{
    const char* what = target ? "target" : "section";
    std::string name, error;
    if (cursor.Peek() != '"')
        return Fail(text::Format("expected a quoted name after \"%s\"", what));
    if (!cursor.Quoted(name, error))
        return Fail(error);
    if (!cursor.AtEnd())
        return Fail(text::Format("expected the end of the line after the %s name", what));
    if (target && !m_open.empty())
        return Fail(text::Format("\"target\" inside %s \"%s\" opened on line %d; expected \"end\" first",
                                 m_open.back().container->isTarget ? "target" : "section",
                                 m_open.back().container->name.c_str(), m_open.back().line));
    if (!target && m_open.empty())
        return Fail("\"section\" outside any target; expected \"target\" first");
    if (m_open.size() >= kMaxDepth)
        return Fail(text::Format("sections nested deeper than %zu levels", kMaxDepth));
    Container& container = target ? m_doc.AddTarget(name) : m_open.back().container->AddSection(name);
    m_open.push_back({&container, m_lineNumber});
    return true;
}

bool Reader::Close(Cursor& cursor)
{
    if (!cursor.AtEnd())
        return Fail("expected nothing after \"end\"");
    if (m_open.empty())
        return Fail("\"end\" without an open target or section");
    m_open.pop_back();
    return true;
}

bool Reader::KeywordLine(Cursor& cursor)
{
    std::string key, error;
    if (cursor.Peek() == '"') {
        if (!cursor.Quoted(key, error))
            return Fail(error);
    } else {
        key = cursor.Word();
        if (key.empty())
            return Fail("expected \"target\", \"section\", \"end\" or a keyword line \"name = values\"");
    }
    if (!cursor.Take('='))
        return Fail(text::Format("expected \"=\" after keyword \"%s\"", key.c_str()));
    if (m_open.empty())
        return Fail(text::Format("keyword \"%s\" outside any target; expected \"target\" first", key.c_str()));
    Keyword& keyword = m_open.back().container->AddKeyword(key);
    if (cursor.AtEnd())
        return true;
    while (true) {
        if (!Parameter(cursor, keyword))
            return false;
        if (cursor.AtEnd())
            return true;
        if (!cursor.Take(','))
            return Fail(text::Format("expected \",\" or the end of the line after parameter %zu of \"%s\"",
                                     keyword.params.size(), key.c_str()));
    }
}

bool Reader::Parameter(Cursor& cursor, Keyword& keyword)
{
    std::string error;
    char next = cursor.Peek();
    if (next == '"') {
        std::string value;
        if (!cursor.Quoted(value, error))
            return Fail(error);
        keyword.AddParam(wpxText).text = value;
        return true;
    }
    if (next == '-' || (next >= '0' && next <= '9')) {
        int value = 0;
        if (!cursor.Integer(value, error))
            return Fail(error);
        keyword.AddParam(wpxInt).intValue = value;
        return true;
    }
    if (cursor.PeekWord() == "file") {
        cursor.Word();
        std::string value;
        if (cursor.Peek() != '"')
            return Fail("expected a quoted file name after \"file\"");
        if (!cursor.Quoted(value, error))
            return Fail(error);
        keyword.AddParam(wpxFilename).text = Resolve(value);
        return true;
    }
    return Fail(text::Format("expected a parameter of \"%s\": a number, a \"text\" or file \"name\"",
                             keyword.name.c_str()));
}

bool Reader::Finish()
{
    ++m_lineNumber; // the position just after the last line
    if (!m_headerSeen)
        return Fail(text::Format("the document is empty; expected the first line \"wpx %d\"", kVersion));
    if (!m_open.empty())
        return Fail(text::Format("the document ends inside %s \"%s\" opened on line %d; expected \"end\"",
                                 m_open.back().container->isTarget ? "target" : "section",
                                 m_open.back().container->name.c_str(), m_open.back().line));
    if (!m_trailerSeen)
        return Fail("the document ends without its last line \"wpx end\"; it may be truncated");
    return true;
}

std::string Reader::Resolve(const std::string& fileName) const
{
    if (m_base.empty() || fileName.empty() || fileName[0] == '/')
        return fileName;
    return (std::filesystem::path(m_base) / fileName).lexically_normal().string();
}

} // namespace

std::string Format(const Document& document)
{
    std::string out = text::Format("wpx %d\n", kVersion);
    for (const auto& target : document.targets)
        FormatContainer(*target, 0, out);
    return out + "wpx end\n";
}

bool Parse(const std::string& text, const std::string& sourceName, const std::string& baseFolder,
           Document& document, std::string& error)
{
    Reader reader(sourceName, baseFolder, document);
    return reader.Run(text, error);
}

} // namespace wpx
