// The XML tokenizer of the workbook parts: tokens must not depend on how the source is cut into
// reads or on the buffer size, and malformed input must fail with the part and the byte offset.
#include "formats/xlsx/XmlScanner.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cstring>

using sheet::XmlScanner;
using Token = XmlScanner::Token;

namespace {

// A source that hands out `text` at most `step` bytes per read.
XmlScanner::Source SourceOf(std::string text, std::size_t step)
{
    auto at = std::make_shared<std::size_t>(0);
    return [text = std::move(text), step, at](char* out, std::size_t capacity) {
        const std::size_t take = std::min({capacity, step, text.size() - *at});
        std::memcpy(out, text.data() + *at, take);
        *at += take;
        return take;
    };
}

// Each token written out: <name>, </name>, [text].
std::string Tokens(XmlScanner& xml)
{
    std::string out;
    for (Token token = xml.Next(); token != Token::End; token = xml.Next()) {
        if (token == Token::StartTag)
            out += "<" + std::string(xml.Name()) + ">";
        else if (token == Token::EndTag)
            out += "</" + std::string(xml.Name()) + ">";
        else
            out += "[" + std::string(xml.Text()) + "]";
    }
    return out;
}

std::string Tokens(const std::string& text, std::size_t step = 1 << 20, std::size_t buffer = XmlScanner::kBufferBytes)
{
    XmlScanner xml(SourceOf(text, step), "part.xml", buffer);
    return Tokens(xml);
}

// The message scanning `text` fails with ("" when it does not fail).
std::string Failure(const std::string& text, std::size_t maxToken = XmlScanner::kMaxTokenBytes)
{
    try {
        XmlScanner xml(SourceOf(text, 1 << 20), "part.xml", 16, maxToken);
        Tokens(xml);
    } catch (const XmlScanner::Error& e) {
        return e.what();
    }
    return "";
}

const std::string kDocument =
    "\xEF\xBB\xBF<?xml version=\"1.0\" encoding=\"UTF-8\"?>\n"
    "<!DOCTYPE x [ <!ENTITY e \"v\"> ]>"
    "<x:sst xmlns:x=\"urn:x\"><!-- a comment with <tags> -->"
    "<x:si><x:t xml:space=\"preserve\">a &amp; b &lt;&gt;&quot;&apos; &#65;&#x42;&#xE9;&#x20AC;&#x1F600;</x:t></x:si>"
    "<si><t><![CDATA[<raw> & ]]]]></t><t/></si>"
    "<?pi inside?></x:sst>\n";

const std::string kTokens = "<sst><si><t>[a & b <>\"' AB\xC3\xA9\xE2\x82\xAC\xF0\x9F\x98\x80]</t></si>"
                            "<si><t>[<raw> & ]]]</t><t></t></si></sst>";

} // namespace

TEST(XmlScanner, TokensDoNotDependOnHowTheInputIsCut)
{
    struct Cut {
        std::size_t step, buffer;
    } cuts[] = {{1 << 20, XmlScanner::kBufferBytes}, {1, XmlScanner::kBufferBytes}, {1, 1}, {7, 3}, {1 << 20, 2}};
    for (const Cut& cut : cuts)
        EXPECT_EQ(Tokens(kDocument, cut.step, cut.buffer), kTokens) << "step " << cut.step << ", buffer " << cut.buffer;
}

TEST(XmlScanner, AttributesByLocalNameWithEntitiesDecoded)
{
    XmlScanner xml(SourceOf("<r:c xmlns:r=\"urn:r\" r:id='rId&amp;1' r=\"B2\" t = \"s\" e=\"\"/>", 1), "part.xml", 1);
    ASSERT_EQ(xml.Next(), Token::StartTag);
    EXPECT_EQ(xml.Name(), "c");
    EXPECT_EQ(xml.Attribute("id"), "rId&1");
    // The namespace declaration xmlns:r does not hide the attribute r.
    EXPECT_EQ(xml.Attribute("r"), "B2");
    EXPECT_EQ(xml.Attribute("t"), "s");
    EXPECT_EQ(xml.Attribute("e"), "");
    EXPECT_FALSE(xml.Attribute("s").has_value());
    EXPECT_EQ(xml.Depth(), 1u);
    ASSERT_EQ(xml.Next(), Token::EndTag);
    EXPECT_EQ(xml.Name(), "c");
    EXPECT_EQ(xml.Depth(), 0u);
    EXPECT_EQ(xml.Next(), Token::End);
}

TEST(XmlScanner, SkipElementPassesOverNestedContent)
{
    XmlScanner xml(SourceOf("<a><f><g>x</g><g/></f><v>1</v></a>", 2), "part.xml", 4);
    ASSERT_EQ(xml.Next(), Token::StartTag);
    ASSERT_EQ(xml.Next(), Token::StartTag);
    EXPECT_EQ(xml.Name(), "f");
    xml.SkipElement();
    ASSERT_EQ(xml.Next(), Token::StartTag);
    EXPECT_EQ(xml.Name(), "v");
    EXPECT_EQ(xml.TokenOffset(), 22u);
}

TEST(XmlScanner, MalformedInputFailsWithThePartAndTheOffset)
{
    struct Case {
        const char* xml;
        const char* message;
    } cases[] = {
        {"", "part.xml, byte 0: the XML is damaged (the part holds no element)"},
        {"   <!-- only -->  ", "holds no element"},
        {"<a><b></a>", "byte 10: the XML is damaged (the end tag </a> where <b> is open)"},
        {"<a></a></a>", "the end tag </a> closes no element"},
        {"<a><b>", "byte 6: the XML is damaged (the part ends inside the element <b>)"},
        {"<a></a><b/>", "a second root element <b>"},
        {"text<a/>", "text outside the root element"},
        {"<a x=1/>", "'1' where the quoted value of the attribute x belongs"},
        {"<a x=\"1\"y=\"2\"/>", "'y' inside the tag <a>"},
        {"<a x=\"<\"/>", "'<' inside an attribute value of the tag <a>"},
        {"<a x=\"1", "the end of the part inside an attribute value"},
        {"<a x/>", "'/' in an attribute where '=' belongs"},
        {"<a><row</a>", "'<' inside the tag <row>"},
        {"<1a/>", "'1' where a name belongs"},
        {"<a>&bogus;</a>", "the unknown entity &bogus;"},
        {"\xEF\xBB<a/>", "'<' in a byte order mark where"},
        {"<a>&amp</a>", "an '&' that starts no entity"},
        {"<a>& b</a>", "an '&' that starts no entity"},
        {"<a>&#0;</a>", "&#0; names no character"},
        {"<a>&#xD800;</a>", "&#xD800; names no character"},
        {"<a>&#x110000;</a>", "&#x110000; names no character"},
        {"<a>&#12a;</a>", "&#12a; names no character"},
        {"<a>&#;</a>", "the unknown entity &#;"},
        {"<a><!-- open</a>", "a comment that never ends"},
        {"<a><![CDATA[open</a>", "a CDATA section that never ends"},
        {"<![CDATA[x]]><a/>", "a CDATA section outside the root element"},
        {"<a><!x></a>", "'x' in a declaration where 'D' belongs"},
        {"<?xml version='1.0'", "a processing instruction that never ends"},
        {"<!DOCTYPE a [ <!ENTITY e '>'>", "a DOCTYPE that never ends"},
        {"\xFF\xFE<\0a\0", "text outside the root element"}, // UTF-16 is not read
    };
    for (const Case& c : cases) {
        const std::string message = Failure(c.xml);
        EXPECT_NE(message.find(c.message), std::string::npos) << c.xml << " -> " << message;
        EXPECT_EQ(message.rfind("part.xml, byte ", 0), 0u) << c.xml << " -> " << message;
    }
}

TEST(XmlScanner, NestingAndTokenLengthAreBounded)
{
    std::string deep;
    for (std::size_t i = 0; i <= XmlScanner::kMaxDepth; ++i)
        deep += "<a>";
    EXPECT_NE(Failure(deep).find("elements nested deeper than 256"), std::string::npos);

    const std::string text(100, 'x');
    EXPECT_EQ(Failure("<a>" + text + "</a>", 100), "");
    EXPECT_NE(Failure("<a>" + text + "y</a>", 100).find("a tag or text run longer than 100 bytes"), std::string::npos);
    EXPECT_NE(Failure("<a b=\"" + text + "\"/>", 100).find("longer than 100 bytes"), std::string::npos);
    // Only the current token counts: many short ones pass whatever their sum.
    std::string many = "<a>";
    for (int i = 0; i < 50; ++i)
        many += "<b>" + text + "</b>";
    EXPECT_EQ(Failure(many + "</a>", 100), "");
}

TEST(XmlScanner, ASourceThatOverrunsItsBufferIsRefused)
{
    XmlScanner xml([](char*, std::size_t capacity) { return capacity + 1; }, "part.xml", 8);
    try {
        xml.Next();
        FAIL() << "no error";
    } catch (const XmlScanner::Error& e) {
        EXPECT_NE(std::string(e.what()).find("more bytes than asked for"), std::string::npos);
    }
}
