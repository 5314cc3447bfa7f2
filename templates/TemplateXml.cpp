#include "templates/TemplateXml.h"

#include "platform/system/FileSystem.h"
#include "platform/system/Text.h"
#include "templates/WellFormedXml.h"

#include <cerrno>
#include <climits>
#include <cstdio>
#include <cstring>
#include <memory>
#include <new>
#include <sstream>

namespace tmplfile {
namespace {

struct FileCloser {
    void operator()(std::FILE* file) const { std::fclose(file); }
};
using File = std::unique_ptr<std::FILE, FileCloser>;

sys::Status DecodeUtf16(std::string_view bytes, bool bigEndian, std::string& utf8)
{
    if (bytes.size() % 2 != 0)
        return sys::Status::Fail({}, 0, "the UTF-16 text has an odd number of bytes");
    utf8.clear();
    utf8.reserve(bytes.size());
    size_t unpairedAt = 0;
    const size_t used = text::AppendUtf16AsUtf8(bytes, bigEndian, utf8, unpairedAt);
    if (used < bytes.size())
        return sys::Status::Fail({}, 0,
                                 text::Format("the UTF-16 text has an unpaired surrogate at byte %zu",
                                              unpairedAt == std::string_view::npos ? used : unpairedAt));
    return sys::Status::Ok();
}

bool StartsWith(std::string_view bytes, std::string_view prefix)
{
    return bytes.size() >= prefix.size() && bytes.substr(0, prefix.size()) == prefix;
}

// Where a byte offset lies, as "line L, column C" counted from 1.
CString Position(std::string_view text, size_t offset)
{
    offset = std::min(offset, text.size());
    size_t line = 1, lineStart = 0;
    for (size_t i = 0; i < offset; ++i) {
        if (text[i] == '\n') {
            ++line;
            lineStart = i + 1;
        }
    }
    return text::Format("line %zu, column %zu", line, offset - lineStart + 1);
}

// The deepest element nesting, walking without recursion; stops counting past `limit`.
int ElementDepth(const pugi::xml_node& top, int limit)
{
    int depth = 0, deepest = 0;
    pugi::xml_node node = top.first_child();
    while (node) {
        if (node.type() == pugi::node_element) {
            deepest = std::max(deepest, depth + 1);
            if (deepest > limit)
                return deepest;
        }
        if (node.first_child()) {
            node = node.first_child();
            ++depth;
            continue;
        }
        while (node && !node.next_sibling() && node != top) {
            node = node.parent();
            --depth;
        }
        if (!node || node == top)
            break;
        node = node.next_sibling();
    }
    return deepest;
}

bool ParseWholeNumber(std::string_view textValue, int& value)
{
    CString trimmed = text::Trim(textValue);
    size_t i = 0;
    bool negative = false;
    if (i < trimmed.size() && (trimmed[i] == '+' || trimmed[i] == '-'))
        negative = trimmed[i++] == '-';
    if (i == trimmed.size())
        return false;
    long long magnitude = 0;
    for (; i < trimmed.size(); ++i) {
        if (trimmed[i] < '0' || trimmed[i] > '9')
            return false;
        magnitude = magnitude * 10 + (trimmed[i] - '0');
        if (magnitude > static_cast<long long>(INT_MAX) + 1)
            return false;
    }
    long long signedValue = negative ? -magnitude : magnitude;
    if (signedValue > INT_MAX || signedValue < INT_MIN)
        return false;
    value = static_cast<int>(signedValue);
    return true;
}

bool IsTrue(std::string_view value, bool ignoreCase)
{
    return ignoreCase ? text::EqualsNoCase(value, "true") : value == "true";
}

sys::Status ReadAttribute(const pugi::xml_attribute& attribute, const AttributeRule& rule, bool flagIgnoresCase,
                          const CString& name, CSpecification& model)
{
    std::string_view value = attribute.value();
    if (value.size() > kMaxValueBytes)
        return sys::Status::Fail(name, 0, text::Format("the attribute %s is longer than %zu bytes", rule.name, kMaxValueBytes));
    switch (rule.form) {
    case ValueForm::Number:
    case ValueForm::NumberLine:
        if (!ParseWholeNumber(value, *rule.number(model)))
            return sys::Status::Fail(name, 0,
                                     text::Format("the attribute %s must be a whole number from %d to %d, not \"%.40s\"",
                                                  rule.name, INT_MIN, INT_MAX, attribute.value()));
        return sys::Status::Ok();
    case ValueForm::Flag:
    case ValueForm::FlagWhenOne:
        *rule.number(model) = IsTrue(value, flagIgnoresCase) ? 1 : 0;
        return sys::Status::Ok();
    case ValueForm::Text:
        rule.text(model)->assign(value);
        return sys::Status::Ok();
    case ValueForm::SelItems:
        CSpecification::ParseSelItems(CString(value), model.m_arrSelItems);
        return sys::Status::Ok();
    }
    return sys::Status::Ok();
}

// The text of a node and everything below it, as a DOM's text property gives it.
CString NodeText(const pugi::xml_node& node)
{
    if (node.type() == pugi::node_pcdata || node.type() == pugi::node_cdata)
        return node.value();
    CString result;
    pugi::xml_node current = node.first_child();
    while (current) {
        if (current.type() == pugi::node_pcdata || current.type() == pugi::node_cdata)
            result += current.value();
        if (current.first_child()) {
            current = current.first_child();
            continue;
        }
        while (current && !current.next_sibling() && current != node)
            current = current.parent();
        if (!current || current == node)
            break;
        current = current.next_sibling();
    }
    return result;
}

std::vector<pugi::xml_node> Children(const pugi::xml_node& list)
{
    std::vector<pugi::xml_node> children;
    for (pugi::xml_node child : list.children())
        children.push_back(child);
    return children;
}

sys::Status ReadItemDefinitions(const pugi::xml_document& document, const FileLayout& layout, const CString& name,
                                std::vector<CItemDefinition>& items)
{
    static const char* const kLists[] = {"ItemTitles", "ItemTypes", "ItemUnits", "ValueTypes"};
    std::vector<pugi::xml_node> lists[4];
    size_t count = 0;
    for (int i = 0; i < 4; ++i) {
        CString query = CString("//") + layout.extension + "//" + kLists[i];
        pugi::xml_node list = document.select_node(query.c_str()).node();
        lists[i] = Children(list);
        count = std::max(count, lists[i].size());
    }
    if (count > kMaxItemDefinitions)
        return sys::Status::Fail(name, 0, text::Format("more than %zu item definitions", kMaxItemDefinitions));
    items.clear();
    items.reserve(count);
    for (size_t index = 0; index < count; ++index) {
        CString fields[4];
        for (int i = 0; i < 4; ++i) {
            if (index < lists[i].size() && lists[i][index].type() == pugi::node_element)
                fields[i] = NodeText(lists[i][index]);
            if (fields[i].size() > kMaxValueBytes)
                return sys::Status::Fail(name, 0,
                                         text::Format("an entry of %s is longer than %zu bytes", kLists[i], kMaxValueBytes));
        }
        items.push_back({fields[0], fields[1], fields[2], fields[3]});
    }
    return sys::Status::Ok();
}

CString AttributeText(const AttributeRule& rule, CSpecification& spec)
{
    switch (rule.form) {
    case ValueForm::Number: return text::Format("%d", *rule.number(spec));
    case ValueForm::NumberLine: return text::Format("%d\n", *rule.number(spec));
    case ValueForm::Flag: return *rule.number(spec) != 0 ? "true" : "false";
    case ValueForm::FlagWhenOne: return *rule.number(spec) == 1 ? "true" : "false";
    case ValueForm::Text: return *rule.text(spec);
    case ValueForm::SelItems: {
        CString items;
        CSpecification::FormatSelItems(spec.m_arrSelItems, items);
        return items;
    }
    }
    return CString();
}

// pugixml reports a failed allocation by a null node or a false result, never by throwing.
bool AppendList(pugi::xml_node& extension, const char* listName, const char* entryName,
                const std::vector<CItemDefinition>& items, CString CItemDefinition::*field)
{
    pugi::xml_node list = extension.append_child(listName);
    if (!list)
        return false;
    for (const CItemDefinition& item : items) {
        pugi::xml_node entry = list.append_child(entryName);
        if (!entry || !entry.text().set(text::ToUtf8(item.*field).c_str()))
            return false;
    }
    return true;
}

// The first character of `utf8` that an XML 1.0 file cannot hold even as a reference (a control
// character other than tab, line feed and carriage return; U+FFFE; U+FFFF), or 0 when there is none.
char32_t CharacterXmlCannotCarry(std::string_view utf8)
{
    for (size_t i = 0; i < utf8.size(); ++i) {
        const auto c = static_cast<unsigned char>(utf8[i]);
        if (c < 0x20 && c != '\t' && c != '\n' && c != '\r')
            return c;
        const bool nonCharacter = c == 0xEF && i + 2 < utf8.size() && static_cast<unsigned char>(utf8[i + 1]) == 0xBF &&
                                  static_cast<unsigned char>(utf8[i + 2]) >= 0xBE;
        if (nonCharacter)
            return static_cast<unsigned char>(utf8[i + 2]) == 0xBE ? 0xFFFE : 0xFFFF;
    }
    return 0;
}

// Fails, naming the value of `path`, when a text of the template could not be written as XML.
sys::Status CheckWritable(CSpecification& spec, const FileLayout& layout, const CString& path)
{
    auto refuse = [&path](const CString& what, char32_t c) {
        return sys::Status::Fail(path, 0,
                                 text::Format("%s holds the character U+%04X, which an XML file cannot carry",
                                              what.c_str(), static_cast<unsigned>(c)));
    };
    for (const AttributeRule& rule : layout.attributes)
        if (char32_t c = CharacterXmlCannotCarry(text::ToUtf8(AttributeText(rule, spec))))
            return refuse(CString("the value of ") + rule.name, c);
    const auto& items = spec.m_DataDesc.m_vecItemDefs;
    for (size_t i = 0; i < items.size(); ++i) {
        const CItemDefinition& item = items[i];
        for (const CString* field : {&item.m_strTitle, &item.m_strType, &item.m_strUnit, &item.m_strValueType})
            if (char32_t c = CharacterXmlCannotCarry(text::ToUtf8(*field)))
                return refuse(text::Format("item definition %zu", i + 1), c);
    }
    return sys::Status::Ok();
}

bool BuildDocument(CSpecification& spec, const FileLayout& layout, pugi::xml_document& document)
{
    pugi::xml_node declaration = document.append_child(pugi::node_pi);
    if (!declaration || !declaration.set_name("xml") || !declaration.set_value(kDeclarationData))
        return false;
    pugi::xml_node root = document.append_child(layout.root);
    if (!root || !root.append_attribute("xmlns:xsi").set_value(kSchemaInstanceNamespace))
        return false;
    for (const AttributeRule& rule : layout.attributes)
        if (!root.append_attribute(rule.name).set_value(text::ToUtf8(AttributeText(rule, spec)).c_str()))
            return false;
    pugi::xml_node extension = root.append_child(layout.extension);
    if (!extension)
        return false;
    const auto& items = spec.m_DataDesc.m_vecItemDefs;
    if (items.empty())
        return true;
    return AppendList(extension, "ItemTitles", "ItemTitle", items, &CItemDefinition::m_strTitle) &&
           AppendList(extension, "ItemTypes", "ItemType", items, &CItemDefinition::m_strType) &&
           AppendList(extension, "ItemUnits", "ItemUnit", items, &CItemDefinition::m_strUnit) &&
           AppendList(extension, "ValueTypes", "ValueType", items, &CItemDefinition::m_strValueType);
}

} // namespace

sys::Status ReadFileBytes(const CString& path, std::string& bytes)
{
    std::string problem;
    File file(sys::OpenRegularFile(path, problem));
    if (!file)
        return sys::Status::Fail(path, 0, problem);
    try {
        bytes.clear();
        char buffer[65536];
        size_t got = 0;
        while ((got = std::fread(buffer, 1, sizeof(buffer), file.get())) > 0) {
            if (bytes.size() + got > kMaxFileBytes)
                return sys::Status::Fail(path, 0, text::Format("larger than %zu bytes, which no template file is", kMaxFileBytes));
            bytes.append(buffer, got);
        }
    } catch (const std::exception& e) {
        return sys::Status::Fail(path, 0, std::string("cannot be read: ") + e.what());
    }
    if (std::ferror(file.get()))
        return sys::Status::Fail(path, 0, std::string("cannot be read: ") + std::strerror(errno));
    return sys::Status::Ok();
}

sys::Status DecodeToUtf8(std::string_view bytes, std::string& utf8)
{
    using namespace std::string_view_literals;
    if (StartsWith(bytes, "\xFF\xFE\0\0"sv) || StartsWith(bytes, "\0\0\xFE\xFF"sv))
        return sys::Status::Fail({}, 0, "UTF-32 text is not accepted; save the file as UTF-16 or UTF-8");
    if (StartsWith(bytes, "\xFF\xFE"sv))
        return DecodeUtf16(bytes.substr(2), false, utf8);
    if (StartsWith(bytes, "\xFE\xFF"sv))
        return DecodeUtf16(bytes.substr(2), true, utf8);
    if (StartsWith(bytes, "<\0"sv))
        return DecodeUtf16(bytes, false, utf8);
    if (StartsWith(bytes, "\0<"sv))
        return DecodeUtf16(bytes, true, utf8);
    if (StartsWith(bytes, "\xEF\xBB\xBF"sv))
        bytes.remove_prefix(3);
    utf8 = text::ToUtf8(bytes);
    return sys::Status::Ok();
}

sys::Status ParseDocument(std::string_view bytes, const CString& name, pugi::xml_document& document)
{
    std::string utf8;
    if (const sys::Status decoded = DecodeToUtf8(bytes, utf8); !decoded)
        return sys::Status::Fail(name, 0, decoded.problem().message);
    if (const sys::Status wellFormed = CheckWellFormedXml(utf8); !wellFormed)
        return sys::Status::Fail(name, 0, wellFormed.problem().message);
    // Comments and processing instructions are kept because they count as entries of the item
    // lists; literal tabs and line feeds in attribute values are kept as written.
    const unsigned flags = (pugi::parse_default & ~pugi::parse_wconv_attribute) | pugi::parse_comments |
                           pugi::parse_pi | pugi::parse_declaration;
    pugi::xml_parse_result result = document.load_buffer(utf8.data(), utf8.size(), flags, pugi::encoding_utf8);
    if (!result)
        return sys::Status::Fail(name, 0,
                                 std::string("the XML document cannot be stored (") + result.description() + " at " +
                                     Position(utf8, static_cast<size_t>(result.offset)) + ")");
    if (ElementDepth(document, kMaxElementDepth) > kMaxElementDepth)
        return sys::Status::Fail(name, 0, text::Format("elements nested deeper than %d levels", kMaxElementDepth));
    return sys::Status::Ok();
}

pugi::xml_node FindElement(const pugi::xml_document& document, const char* name)
{
    CString query = CString("//") + name;
    return document.select_node(query.c_str()).node();
}

sys::Status ReadTemplate(const pugi::xml_document& document, const FileLayout& layout, const CString& name,
                         CSpecification& spec)
{
    pugi::xml_node root = FindElement(document, layout.root);
    if (!root)
        return sys::Status::Fail(name, 0, std::string("no element ") + layout.root + " in the document");
    for (bool overridesPass : {false, true}) {
        for (const AttributeRule& rule : layout.attributes) {
            if (rule.overrides != overridesPass)
                continue;
            pugi::xml_attribute attribute = root.attribute(rule.name);
            if (!attribute)
                continue;
            if (sys::Status read = ReadAttribute(attribute, rule, layout.flagTrueIgnoresCase, name, spec); !read)
                return read;
        }
    }
    return ReadItemDefinitions(document, layout, name, spec.m_DataDesc.m_vecItemDefs);
}

std::string RenderTemplate(CSpecification& spec, const FileLayout& layout)
{
    pugi::xml_document document;
    if (!BuildDocument(spec, layout, document))
        throw std::bad_alloc();
    std::ostringstream out;
    document.save(out, "\t", pugi::format_indent | pugi::format_write_bom | pugi::format_no_declaration,
                  pugi::encoding_utf16_le);
    return out.str();
}

sys::Status WriteTemplate(CSpecification& spec, const FileLayout& layout, const CString& path)
{
    if (path.empty())
        return sys::Status::Fail({}, 0, "no file name to save the template to");
    if (sys::Status writable = CheckWritable(spec, layout, path); !writable)
        return writable;
    std::string contents;
    try {
        contents = RenderTemplate(spec, layout);
    } catch (const std::exception& e) {
        return sys::Status::Fail(path, 0, std::string("the template cannot be built: ") + e.what());
    }
    File file(std::fopen(path.c_str(), "wb"));
    if (!file)
        return sys::Status::Fail(path, 0, std::string("cannot be written: ") + std::strerror(errno));
    bool written = std::fwrite(contents.data(), 1, contents.size(), file.get()) == contents.size();
    written = std::fflush(file.get()) == 0 && written;
    int closed = std::fclose(file.release());
    if (!written || closed != 0)
        return sys::Status::Fail(path, 0, std::string("cannot be written: ") + std::strerror(errno));
    return sys::Status::Ok();
}

} // namespace tmplfile
