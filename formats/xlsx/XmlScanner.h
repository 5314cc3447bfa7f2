#pragma once
// A pull tokenizer for the XML parts of a workbook package. It reads its source through a
// fixed-size buffer, so a part of any size streams through in constant memory: only the current
// token (one tag with its attributes, or one text run) is held, and a token longer than the
// limit fails the part. Element and attribute names come without their namespace prefix
// (<x:c> is "c"; xmlns declarations are dropped); entities and character references are decoded
// to UTF-8; comments, processing instructions and the DOCTYPE are skipped; CDATA is text.
// Malformed XML throws Error naming the part and the byte offset (from 0) where it went wrong.
#include <cstddef>
#include <cstdint>
#include <functional>
#include <optional>
#include <stdexcept>
#include <string>
#include <string_view>
#include <vector>

namespace sheet {

class XmlScanner {
public:
    // Gives up to `capacity` more bytes of the part, 0 at its end.
    using Source = std::function<std::size_t(char* out, std::size_t capacity)>;

    enum class Token { StartTag, EndTag, Text, End };

    // "<part>, byte <offset>: <why>"
    class Error : public std::runtime_error {
    public:
        using std::runtime_error::runtime_error;
    };

    static constexpr std::size_t kBufferBytes = 64 * 1024;
    // Excel keeps a cell's text to 32,767 characters, so a run this long is damage, not data.
    static constexpr std::size_t kMaxTokenBytes = 16u << 20;
    static constexpr std::size_t kMaxDepth = 256;

    XmlScanner(Source source, std::string partName, std::size_t bufferBytes = kBufferBytes,
               std::size_t maxTokenBytes = kMaxTokenBytes);

    // The next token. A self-closing tag gives a StartTag and then its EndTag.
    Token Next();

    // The tag's name without prefix (StartTag, EndTag).
    std::string_view Name() const;
    // The value of the start tag's attribute of that name (without prefix), if it has one.
    std::optional<std::string_view> Attribute(std::string_view name) const;
    // The decoded text of a Text token.
    std::string_view Text() const { return m_text; }
    // Elements open after the last token (a StartTag counts its own element).
    std::size_t Depth() const { return m_depth; }
    // Where the last token started.
    std::uint64_t TokenOffset() const { return m_tokenStart; }
    const std::string& PartName() const { return m_part; }

    // After a StartTag: passes over everything up to and including its EndTag.
    void SkipElement();

    // Throw Error locating the last token, or the byte at `offset`.
    [[noreturn]] void Fail(const std::string& why) const;
    [[noreturn]] void Fail(const std::string& why, std::uint64_t offset) const;

private:
    static constexpr int kEndOfInput = -1;

    struct AttributeSpan {
        std::size_t nameBegin, nameLength, valueBegin, valueLength;
    };

    int Peek();
    int Get();
    bool Fill();
    std::uint64_t Offset() const { return m_base + m_pos; }
    [[noreturn]] void Malformed(const std::string& why) const;
    void Append(std::string& to, const char* bytes, std::size_t count);
    void AppendCodePoint(std::string& to, std::uint32_t codePoint);

    bool ScanMarkup(Token& token);
    void ScanText();
    void ScanCData();
    void ScanStartTag();
    void ScanEndTag();
    void ScanName(std::string& to);
    void ScanAttributeValue(int quote);
    void DecodeReference(std::string& to);
    void SkipWhitespace();
    void SkipPast(std::string_view terminator, const char* what);
    void SkipDoctype();
    void Expect(char wanted, const char* where);
    void Push();
    void Pop();
    std::string_view LocalName(std::string_view qualified) const;

    Source m_source;
    std::string m_part;
    std::size_t m_maxToken;
    std::vector<char> m_buffer;
    std::size_t m_pos = 0;
    std::size_t m_end = 0;
    std::uint64_t m_base = 0; // offset of m_buffer[0] in the part
    bool m_sourceEnded = false;
    bool m_started = false;

    std::uint64_t m_tokenStart = 0;
    std::size_t m_tokenBytes = 0;
    std::string m_name; // qualified
    std::string m_attributeChars;
    std::vector<AttributeSpan> m_attributes;
    std::string m_text;
    bool m_selfClosed = false;
    bool m_pendingEnd = false;
    bool m_sawRoot = false;
    std::vector<std::string> m_open; // qualified names of the open elements; m_depth are in use
    std::size_t m_depth = 0;
};

} // namespace sheet
