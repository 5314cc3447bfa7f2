#include "templates/TemplateReport.h"

#include "templates/AsciiSpecification.h"
#include "templates/ExcelSpecification.h"
#include "templates/TemplateXml.h"

#include "platform/system/Text.h"

#include <cstring>
#include <vector>

namespace tmplfile {
namespace {

const char* const kExcelOnlyKeys[] = {"ExcelSheet", "UseDTFormat", "UseTFormat", "UseDFormat"};

// The rules that name every template value once: all ASCII keys, then the Excel-only ones.
std::vector<const AttributeRule*> ReportedValues()
{
    std::vector<const AttributeRule*> rules;
    for (const AttributeRule& rule : AsciiFileLayout().attributes)
        rules.push_back(&rule);
    for (const char* key : kExcelOnlyKeys)
        for (const AttributeRule& rule : ExcelFileLayout().attributes)
            if (std::strcmp(rule.name, key) == 0)
                rules.push_back(&rule);
    return rules;
}

// A JSON string literal; text that is not UTF-8 is read as Windows-1252 (text::ToUtf8).
CString JsonString(const CString& value)
{
    CString out;
    text::AppendJsonString(out, value);
    return out;
}

// Text shown to a person: control characters written as C escapes, so a tab delimiter is visible.
CString QuotedText(const CString& value)
{
    CString out = "\"";
    for (char ch : value) {
        unsigned char c = static_cast<unsigned char>(ch);
        if (c == '\t')
            out += "\\t";
        else if (c == '\n')
            out += "\\n";
        else if (c == '\r')
            out += "\\r";
        else if (c < 0x20)
            out += text::Format("\\x%02x", c);
        else
            out += ch;
    }
    return out + "\"";
}

CString SelectedItemsJson(const CUIntArray& items)
{
    CString out = "[";
    for (size_t i = 0; i < items.size(); ++i)
        out += text::Format(i ? ",%d" : "%d", static_cast<int>(items[i]));
    return out + "]";
}

template <class Spec>
OpenedTemplate Make(const FileLayout& layout)
{
    OpenedTemplate opened;
    opened.spec = std::make_unique<Spec>();
    opened.layout = &layout;
    return opened;
}

template <class Spec>
sys::Status LoadKind(OpenedTemplate& opened, std::string_view bytes, const CString& path)
{
    auto& spec = static_cast<Spec&>(*opened.spec);
    spec.LoadFromMemory(bytes, path);
    return spec.LastStatus();
}

} // namespace

OpenedTemplate NewTemplate(const CString& kind)
{
    if (kind == AsciiFileLayout().kind)
        return Make<CAsciiSpecification>(AsciiFileLayout());
    if (kind == ExcelFileLayout().kind)
        return Make<CExcelSpecification>(ExcelFileLayout());
    return {};
}

sys::Status OpenTemplateFile(const CString& path, OpenedTemplate& opened)
{
    opened = {};
    try {
        std::string bytes;
        if (sys::Status read = ReadFileBytes(path, bytes); !read)
            return read;
        pugi::xml_document document;
        if (sys::Status parsed = ParseDocument(bytes, path, document); !parsed)
            return parsed;
        CString query = CString("//") + AsciiFileLayout().root + " | //" + ExcelFileLayout().root;
        pugi::xml_node root = document.select_node(query.c_str()).node();
        if (!root)
            return sys::Status::Fail(path, 0,
                                     std::string("not a template file: no element ") + AsciiFileLayout().root + " or " +
                                         ExcelFileLayout().root);
        const bool ascii = std::strcmp(root.name(), AsciiFileLayout().root) == 0;
        OpenedTemplate made = NewTemplate(ascii ? AsciiFileLayout().kind : ExcelFileLayout().kind);
        sys::Status loaded = ascii ? LoadKind<CAsciiSpecification>(made, bytes, path)
                                   : LoadKind<CExcelSpecification>(made, bytes, path);
        if (loaded)
            opened = std::move(made);
        return loaded;
    } catch (const std::exception& e) {
        opened = {};
        return sys::Status::Fail(path, 0, std::string("cannot be read: ") + e.what());
    }
}

void WriteTemplateText(CSpecification& spec, const FileLayout& layout, std::ostream& out)
{
    out << "Kind: " << layout.kind << "\n";
    for (const AttributeRule* rule : ReportedValues()) {
        out << rule->name << ": ";
        switch (rule->form) {
        case ValueForm::Text: out << QuotedText(*rule->text(spec)); break;
        case ValueForm::SelItems: {
            CString items;
            CSpecification::FormatSelItems(spec.m_arrSelItems, items);
            out << items;
            break;
        }
        default: out << *rule->number(spec); break;
        }
        out << "\n";
    }
    const auto& items = spec.m_DataDesc.m_vecItemDefs;
    out << "Items: " << items.size() << "\n";
    for (size_t i = 0; i < items.size(); ++i)
        out << "  " << i + 1 << ": title " << QuotedText(items[i].m_strTitle) << ", type "
            << QuotedText(items[i].m_strType) << ", unit " << QuotedText(items[i].m_strUnit) << ", value type "
            << QuotedText(items[i].m_strValueType) << "\n";
}

void WriteTemplateJson(CSpecification& spec, const FileLayout& layout, std::ostream& out)
{
    out << "{\"kind\":" << JsonString(layout.kind) << ",\"values\":{";
    bool first = true;
    for (const AttributeRule* rule : ReportedValues()) {
        out << (first ? "" : ",") << JsonString(rule->name) << ":";
        first = false;
        switch (rule->form) {
        case ValueForm::Text: out << JsonString(*rule->text(spec)); break;
        case ValueForm::SelItems: out << SelectedItemsJson(spec.m_arrSelItems); break;
        default: out << *rule->number(spec); break;
        }
    }
    out << "},\"items\":[";
    const auto& items = spec.m_DataDesc.m_vecItemDefs;
    for (size_t i = 0; i < items.size(); ++i)
        out << (i ? "," : "") << "{\"title\":" << JsonString(items[i].m_strTitle)
            << ",\"type\":" << JsonString(items[i].m_strType) << ",\"unit\":" << JsonString(items[i].m_strUnit)
            << ",\"valueType\":" << JsonString(items[i].m_strValueType) << "}";
    out << "]}\n";
}

} // namespace tmplfile
